// What a dictionary that is checked defines, as a translator knows it.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "platform/SeededHash.h"
#include "tools/kolvane/lint/Finding.h"

struct Definition {
  std::string key;              // bytes
  std::vector<uint16_t> value;  // decoded
  Place place;
  std::optional<Place> first{};  // of the first definition that it was put in place of
};

// One definition for each key.
class Definitions {
 public:
  // Null where there is none; valid until the next Put.
  const Definition* Find(const std::string& key) const;

  // Puts it in place of the one that its key had.
  void Put(Definition definition);

  // In the order in which their keys came first.
  const std::vector<Definition>& All() const noexcept { return definitions; }

 private:
  std::vector<Definition> definitions;
  std::unordered_map<std::string, size_t, platform::SeededHash> places;
};
