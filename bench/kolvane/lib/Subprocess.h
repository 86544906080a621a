// Runs work in a child process, so that its caches and memory do not affect later work.
#pragma once

#include <functional>
#include <string>

// Returns the result of `work`, run in a forked child. Throws if the child fails.
std::string RunInChild(const std::function<std::string()>& work);
