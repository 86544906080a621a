// A flat hash map that parses, decodes and owns nothing: the lower bound for lookups, with the
// map's own string hash and with a faster one.
#include <boost/unordered/unordered_flat_map.hpp>
#include <cstring>

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "bench/kolvane/lib/Subjects.h"

namespace {

struct XXH3 {
  using is_avalanching = void;
  size_t operator()(std::string_view key) const { return XXH3_64bits(key.data(), key.size()); }
};

template <class Hash>
class LimitSubject final : public AskedSubject<LimitSubject<Hash>, uint16_t> {
 public:
  LimitSubject(const char* subjectName, const KeySet& set)
      : AskedSubject<LimitSubject, uint16_t>(subjectName), keys(set.keys), values(set.values) {}

  void Load() override {
    const size_t keyBytes = keys.Block().size();
    const size_t keyRoom = (keyBytes + 1) / 2;  // in units
    block = std::make_unique_for_overwrite<char16_t[]>(keyRoom + values.Block().size());
    char* const keyBlock = reinterpret_cast<char*>(block.get());
    std::memcpy(keyBlock, keys.Block().data(), keyBytes);
    char16_t* const valueBlock = block.get() + keyRoom;
    std::copy(values.Block().begin(), values.Block().end(), valueBlock);
    FillMap({keyBlock, keyBytes}, {valueBlock, values.Block().size()});
  }

  void Unload() override {
    map = {};
    block.reset();
  }

  void Ask(const Query& query, std::vector<uint16_t>& answer) {
    const auto found = map.find(query.Key());
    if (found == map.end()) return AnswerDefault(query, answer);
    const auto* const units = reinterpret_cast<const uint16_t*>(found->second.data());
    answer.assign(units, units + found->second.size());
  }

 private:
  void FillMap(std::string_view keyBlock, std::u16string_view valueBlock) {
    map.reserve(keys.Count());
    for (size_t i = 0; i < keys.Count(); ++i) {
      const size_t keyLength = keys[i].size(), valueLength = values[i].size();
      map.emplace(keyBlock.substr(0, keyLength), valueBlock.substr(0, valueLength));
      keyBlock.remove_prefix(keyLength);
      valueBlock.remove_prefix(valueLength);
    }
  }

  const PackedTexts<char> keys;
  const PackedTexts<char16_t> values;
  std::unique_ptr<char16_t[]> block;
  boost::unordered_flat_map<std::string_view, std::u16string_view, Hash> map;
};

}  // namespace

std::unique_ptr<Subject> MakeLimit(const KeySet& set, const std::filesystem::path&) {
  return std::make_unique<LimitSubject<boost::hash<std::string_view>>>("limit", set);
}

std::unique_ptr<Subject> MakeLimitXXH3(const KeySet& set, const std::filesystem::path&) {
  return std::make_unique<LimitSubject<XXH3>>("limit-xxh3", set);
}
