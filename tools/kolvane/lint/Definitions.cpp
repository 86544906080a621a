#include "tools/kolvane/lint/Definitions.h"

#include <utility>

const Definition* Definitions::Find(const std::string& key) const {
  const auto found = places.find(key);
  return found == places.end() ? nullptr : &definitions[found->second];
}

void Definitions::Put(Definition definition) {
  const auto [place, isNew] = places.try_emplace(definition.key, definitions.size());
  if (isNew) {
    definitions.push_back(std::move(definition));
  } else {
    Definition& earlier = definitions[place->second];
    definition.first = earlier.first ? std::move(earlier.first) : std::move(earlier.place);
    earlier = std::move(definition);
  }
}
