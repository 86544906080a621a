#include "bench/kolvane/lib/Queries.h"

#include <initializer_list>
#include <numeric>
#include <random>
#include <utility>

namespace {

void Append(std::vector<char>& block, std::initializer_list<std::string_view> parts) {
  for (const auto part : parts) block.insert(block.end(), part.begin(), part.end());
  block.push_back(0);
}

template <class Items>
void ShuffleAll(Items& items, std::mt19937_64& random) {
  for (size_t i = items.size(); i > 1; --i) std::swap(items[i - 1], items[random() % i]);
}

}  // namespace

Queries::Queries(const PackedTexts<char>& keys, const PackedTexts<char>& defaultTexts,
                 size_t firstNumber)
    : keyCount(keys.Count()) {
  std::mt19937_64 random(1);
  std::vector<uint32_t> order(keyCount);
  std::iota(order.begin(), order.end(), 0u);
  ShuffleAll(order, random);

  // The blocks never move, because queries point into them.
  texts.reserve(keys.Block().size() + defaultTexts.Block().size() + keyCount * 5);
  bareKeys.reserve(keys.Block().size() + keyCount);
  for (const uint32_t i : order) {
    const std::string_view key = keys[i], defaultText = defaultTexts[i];
    queries.push_back({texts.data() + texts.size(), bareKeys.data() + bareKeys.size(),
                       static_cast<uint32_t>(key.size()), static_cast<uint32_t>(defaultText.size()),
                       static_cast<uint32_t>(firstNumber + i)});
    Append(texts, {"$$$", key, "=", defaultText});
    Append(bareKeys, {key});
  }

  std::vector<Query> round = queries;
  while (keyCount != 0 && queries.size() < kLeast) {
    ShuffleAll(round, random);
    queries.insert(queries.end(), round.begin(), round.end());
  }
}
