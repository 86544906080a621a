// The dictionary once more, written for obviousness alone: lists instead of chains and index, whole
// images instead of streams. Its conversions are the platform's, which have a second opinion of their own.
#pragma once

#include <map>
#include <string>
#include <utility>
#include <vector>

#include "tests/kolvane/lib/Support.h"

class SlowTwin {
 public:
  void Load(const std::string& image);
  std::u16string Translate(const std::string& text, const SlowTwin* fallback = nullptr) const;
  Contents AllContents() const;

  static std::u16string Decode(const std::u16string& value);

 private:
  using Entry = std::pair<std::string, std::u16string>;

  void LoadUTF16(const std::string& image, bool swapped);
  void LoadCodePage(const std::string& image);
  void LoadBinary(const std::string& image);
  void StoreLine(const std::u16string& line);
  void Prepend(uint32_t bucket, const std::vector<Entry>& group);
  const Entry* Find(const std::string& key) const;

  std::map<uint32_t, std::vector<Entry>> buckets;
};
