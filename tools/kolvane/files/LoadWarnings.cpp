#include "LoadWarnings.h"

#include <fmt/format.h>

#include <cstdint>

#include "Messages.h"
#include "TextLines.h"

namespace {

std::string DamageText(const ImageFile& file, const LoadStatus& status) {
  const uint64_t at = status.damageOffset;
  switch (status.damage) {
    case LoadDamage::kNone:
      return {};
    case LoadDamage::kInterrupted:
      return "could not be loaded to its end";
    case LoadDamage::kTooShort:
      return file.bytes.empty() ? "the file is empty" : "the file is too short for a dictionary";
    case LoadDamage::kZeroCharacter:
      return fmt::format("the text ends at a zero character at the start of line {}",
                         LineCounter(file.bytes, status.encoding).LineAt(at));
    case LoadDamage::kHalfUnit:
      return fmt::format("the text is cut short: byte {} is half a character", at);
    case LoadDamage::kShortRead:
      return fmt::format("the image is cut short: byte {} begins what is not all there", at);
    case LoadDamage::kUnsupportedVersion:
      return fmt::format("byte {}: this version of the binary format is not supported", at);
    case LoadDamage::kNoGroups:
      return fmt::format("byte {}: the image is damaged, its count of groups is 0", at);
    case LoadDamage::kBadCounts:
      return fmt::format("byte {}: the image is damaged, a group's count is odd or decreases", at);
    case LoadDamage::kBadBucket:
      return fmt::format("byte {}: the image is damaged, a group's bucket does not exist", at);
    case LoadDamage::kWrongBucket:
      return fmt::format("byte {}: the image is damaged, a key is filed where it is never found",
                         at);
    case LoadDamage::kBadOffset:
      return fmt::format("byte {}: the image is damaged, a group does not end at its offset", at);
  }
  return {};
}

std::string Loaded(uint32_t count) {
  if (count == 0) return "nothing was loaded";
  return count == 1 ? "1 entry was loaded" : fmt::format("{} entries were loaded", count);
}

}  // namespace

std::vector<std::string> WarningsOf(const ImageFile& file, const LoadStatus& status) {
  std::vector<std::string> warnings;
  const auto warn = [&](std::string_view text) {
    warnings.push_back(fmt::format("{}: warning: {}", Printable(file.name), text));
  };
  if (const std::string damage = DamageText(file, status); !damage.empty()) {
    warn(fmt::format("{}; {}", damage, Loaded(status.entriesAdded)));
  } else if (status.entriesAdded == 0) {
    warn("the file adds nothing");
  }
  if (status.linesDropped != 0) {
    warn(fmt::format("{} with one or two dollar signs where none or three are due",
                     status.linesDropped == 1
                         ? "1 line was dropped: it begins"
                         : fmt::format("{} lines were dropped: they begin", status.linesDropped)));
  }
  return warnings;
}

bool LoadWithWarnings(DictionaryTable& table, const ImageFile& file) {
  const LoadStatus status = LoadInto(table, file);
  for (const std::string& warning : WarningsOf(file, status)) Say(warning);
  return status.Complete();
}
