// Many texts in one block of memory, like a program's literals or an image's entries.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

template <class Unit>
class PackedTexts {
 public:
  using View = std::basic_string_view<Unit>;

  void Append(View text) {
    block.append(text);
    ends.push_back(block.size());
  }

  size_t Count() const { return ends.size(); }

  View operator[](size_t i) const {
    const size_t start = i == 0 ? 0 : ends[i - 1];
    return View(block).substr(start, ends[i] - start);
  }

  View Block() const { return block; }

 private:
  std::basic_string<Unit> block;
  std::vector<size_t> ends;
};
