// Interned names.
#pragma once

#include <compare>
#include <cstring>

namespace orvane {

// A pointer to an interned NUL-terminated byte string. Equality compares pointers; order compares
// the bytes of the texts.
class name_t {
 public:
  name_t() noexcept : interned(emptyText) {}

  // Interns the text without a copy: all equal names point at the first text passed. Null gives the
  // empty name. O(log n) in the number of names. Requires: the text stays valid and unchanged until
  // the process ends. Throws: std::bad_alloc.
  explicit name_t(const char* text);

  const char* text() const noexcept { return interned; }

  friend bool operator==(name_t left, name_t right) noexcept {
    return left.interned == right.interned;
  }
  friend std::strong_ordering operator<=>(name_t left, name_t right) noexcept {
    return std::strcmp(left.interned, right.interned) <=> 0;
  }

 private:
  static constexpr char emptyText[1] = "";

  const char* interned;  // never null
};

}  // namespace orvane
