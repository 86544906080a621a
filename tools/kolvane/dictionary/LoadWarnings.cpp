#include "tools/kolvane/dictionary/LoadWarnings.h"

#include <fmt/format.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/dictionary/FileKind.h"
#include "tools/kolvane/dictionary/MalformedText.h"
#include "tools/kolvane/dictionary/TextLines.h"

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

void SayOf(const ImageFile& file, std::string_view severity, std::string_view text) {
  Say(fmt::format("{}: {}: {}", Printable(file.name), severity, text));
}

// These return whether there was nothing to report.
bool ReportMalformedUTF8(const ImageFile& file) {
  const std::optional<std::string> text = MalformedText(file);
  if (text) Say(*text);
  return !text;
}

bool ReportDamage(const ImageFile& file, const LoadStatus& status) {
  if (status.Complete()) return true;
  SayOf(file, "error",
        fmt::format("{}; {}", DamageText(file, status), Loaded(status.entriesAdded)));
  return false;
}

void ReportDoubts(const ImageFile& file, const LoadStatus& status) {
  if (status.Complete() && status.entriesAdded == 0)
    SayOf(file, "warning", "the file adds nothing");
  if (status.linesDropped == 0) return;
  const std::string dropped =
      status.linesDropped == 1
          ? "1 line was dropped: it begins"
          : fmt::format("{} lines were dropped: they begin", status.linesDropped);
  SayOf(file, "warning", dropped + " with one or two dollar signs where none or three are due");
}

}  // namespace

bool LoadWithWarnings(DictionaryTable& table, const ImageFile& file) {
  RequireDictionary(file);
  const bool isWellFormed = ReportMalformedUTF8(file);
  const LoadStatus status = LoadInto(table, file);
  const bool isWhole = ReportDamage(file, status);
  ReportDoubts(file, status);
  return isWellFormed && isWhole;
}
