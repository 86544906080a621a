// What the kernel's operations do, told from their names.
#pragma once

#include <string_view>

inline bool EndsRegistration(std::string_view operation) {
  return operation.ends_with("Remove") || operation.ends_with("Unregister");
}

// Whether the caller has less after it; where it fails, what was to go stays alive.
inline bool GivesUp(std::string_view operation) {
  return operation.ends_with("Release") || operation.ends_with("Deallocate") || EndsRegistration(operation);
}
