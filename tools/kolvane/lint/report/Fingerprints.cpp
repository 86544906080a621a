#include "tools/kolvane/lint/report/Fingerprints.h"

#include <fmt/format.h>

#include <cstdint>
#include <string_view>
#include <unordered_map>

#include "platform/SeededHash.h"
#include "tools/kolvane/lint/report/PlaceText.h"

namespace {

// FNV-1a in 64 bits.
uint64_t Hash(std::string_view text) noexcept {
  uint64_t hash = 0xCBF29CE484222325;
  for (const char byte : text) {
    hash = (hash ^ static_cast<unsigned char>(byte)) * 0x100000001B3;
  }
  return hash;
}

std::string Identity(const Finding& finding) {
  constexpr char kEnd = '\0';
  std::string identity(finding.rule->name);
  return identity + kEnd + finding.key + kEnd + PortableName(finding.place.file) + kEnd;
}

}  // namespace

std::vector<std::string> Fingerprints(std::span<const Finding> findings) {
  std::vector<std::string> fingerprints;
  std::unordered_map<std::string, size_t, platform::SeededHash> counts;
  for (const Finding& finding : findings) {
    const std::string identity = Identity(finding);
    const size_t before = counts[identity]++;
    fingerprints.push_back(fmt::format("{:016x}", Hash(identity + std::to_string(before))));
  }
  return fingerprints;
}
