// Work in a process of its own, so that nothing which it leaves behind is there for the next.
#pragma once

#include <functional>
#include <string>

// Forks, and returns what the work returned. Throws when the other process failed.
std::string RunApart(const std::function<std::string()>& work);
