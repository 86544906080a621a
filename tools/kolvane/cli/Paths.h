// Paths of files by their names in UTF-8.
#pragma once

#include <filesystem>
#include <string>

std::filesystem::path PathOf(const std::string& name);
std::string NameOf(const std::filesystem::path& path);

// Whether both names lead to one regular file, over links too. A name of nothing, and `-`, is none.
bool AreSameFile(const std::string& one, const std::string& other);
