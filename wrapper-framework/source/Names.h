// Interned names.
#pragma once

#include <compare>
#include <cstring>

namespace orvane {

// One pointer to a NUL-terminated byte string of which the process keeps a single one. Names are
// compared for equality as pointers, and ordered by the bytes of their texts.
class name_t {
 public:
  name_t() noexcept : interned(emptyText) {}

  // Takes over no copy of the text: the first text of its kind is the one that all equal names
  // point at, so it must stay as it is until the process ends. Null gives the empty name. Takes
  // time logarithmic in the number of names; throws std::bad_alloc.
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
