#include <fmt/format.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "kolvane/lib/TextSyntax.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/commands/EncodingOption.h"
#include "tools/kolvane/dictionary/DictionaryFile.h"
#include "tools/kolvane/dictionary/LoadWarnings.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using tovali_private::DictionaryEntry;
using tovali_private::UnwritableReason;
using Entries = std::vector<const DictionaryEntry*>;

constexpr const char* kAbout =
    R"(Print a dictionary as text, one entry a line.

Examples:
  kolvane dump de.kdict
  kolvane dump --json --sort de.kdict
  git config diff.kolvane.textconv 'kolvane dump --json --sort'   # shows images in git diff

The text loads back to the same dictionary: each key once, with the value that a translator answers.
Where an IMAGE is damaged, or text cannot hold an entry, that is said, the rest is printed, and the
exit status is 1. IMAGE may be text too, or '-' for standard input.)";

struct Request {
  std::string file;
  FileEncoding encoding = FileEncoding::kAuto;
  bool json = false;
  bool sort = false;
  bool utf16 = false;
};

void AddOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Output");
  commandLine.AddFlag({.names = "--sort", .text = "In the order of the keys, not of the file"},
                      request.sort);
  commandLine.AddFlag({.names = "--utf-16", .text = "In UTF-16, not UTF-8"}, request.utf16);
  commandLine.AddFlag({.names = "--json", .text = "As JSON, in UTF-8"}, request.json);
  commandLine.BeginGroup("Dictionaries");
  AddEncodingOption(commandLine, request.encoding);
}

Entries EntriesOf(const Request& request, DictionaryTable& table, const ImageFile& file) {
  Entries entries = EntriesInFileOrder(table, file);
  if (request.sort) {
    std::ranges::sort(entries, tovali_private::KeyComesBefore);
  }
  return entries;
}

const char* ReasonText(UnwritableReason obstacle) {
  switch (obstacle) {
    case UnwritableReason::kNone:
      return nullptr;
    case UnwritableReason::kKey:
      return "its key holds a zero, a line end, '=' or a bare quote";
    case UnwritableReason::kZeroCharacter:
      return "its value holds a zero character";
    case UnwritableReason::kLineSeparator:
      return "its value holds U+2028 or U+2029, which end a line";
    case UnwritableReason::kNamedCharacter:
      return "its value spells out a named character";
  }
  return nullptr;
}

// A text image in the making. It has empty lines at its end where it would be too short to load.
class TextDump {
 public:
  explicit TextDump(bool inUTF16) : utf16(inUTF16) {}

  // Returns why text cannot hold the entry, or null.
  const char* Append(const DictionaryEntry& entry) {
    std::vector<uint16_t> line;
    const UnwritableReason obstacle =
        tovali_private::AppendLine(entry.Bytes(), entry.Value().Units(), line);
    if (obstacle != UnwritableReason::kNone) return ReasonText(obstacle);
    if (!utf16 && ToUTF16(ToUTF8(line)) != line) {
      return "its value holds an unpaired surrogate, which takes --utf-16";
    }
    line.push_back('\n');
    Write(line);
    return nullptr;
  }

  // Of UTF-16 there must be an entry: a mark on a line of its own is taken for one.
  void Finish() {
    if (unitCount == 0) return WriteOutput(std::string(kLeastUnits, '\n'));
    Write(std::vector<uint16_t>(kLeastUnits - std::min(unitCount, kLeastUnits), '\n'));
  }

 private:
  // The test for the binary format takes that many bytes at least.
  static constexpr size_t kLeastUnits = tovali_private::kBinaryMagic.size();

  void Write(const std::vector<uint16_t>& units) {
    if (utf16 && unitCount == 0) WriteOutput(UTF16Mark(TextEncoding::kUTF16LE));
    unitCount += units.size();
    utf16 ? WriteOutput({reinterpret_cast<const char*>(units.data()), units.size() * 2})
          : WriteOutput(ToUTF8(units));
  }

  bool utf16;
  size_t unitCount = 0;
};

ExitStatus PrintText(const Entries& entries, const Request& request) {
  ExitStatus status = ExitStatus::kDone;
  TextDump dump(request.utf16);
  for (const DictionaryEntry* entry : entries) {
    const char* const obstacle = dump.Append(*entry);
    if (obstacle == nullptr) continue;
    Say(fmt::format("{}: '{}' cannot be written as text: {}", Printable(request.file),
                    Excerpt(KeyText(AsText(entry->Bytes()))), obstacle));
    status = ExitStatus::kFindings;
  }
  dump.Finish();
  return status;
}

// What is no text in UTF-8 stands under another name, as numbers.
nlohmann::ordered_json JSONOf(const DictionaryEntry& entry) {
  nlohmann::ordered_json object;
  const auto key = entry.Bytes();
  const auto value = entry.Value().Units();
  std::string keyText(key.begin(), key.end());
  std::string valueText = ToUTF8(value);
  if (IsValidUTF8(keyText)) {
    object["key"] = std::move(keyText);
  } else {
    object["keyBytes"] = key;
  }
  if (std::ranges::equal(ToUTF16(valueText), value)) {
    object["value"] = std::move(valueText);
  } else {
    object["valueUnits"] = value;
  }
  return object;
}

void PrintJSON(const Entries& entries) {
  WriteOutput("{\"version\": 1, \"entries\": [");
  const char* separator = "\n";
  for (const DictionaryEntry* entry : entries) {
    WriteOutput(separator + JSONOf(*entry).dump());
    separator = ",\n";
  }
  WriteOutput("\n]}\n");
}

ExitStatus Dump(const Request& request) {
  const ImageFile file = ReadImageFile(request.file, request.encoding);
  DictionaryTable table;
  ExitStatus status = LoadWithWarnings(table, file) ? ExitStatus::kDone : ExitStatus::kFindings;
  const Entries entries = EntriesOf(request, table, file);
  if (request.json) {
    PrintJSON(entries);
  } else {
    status = std::max(status, PrintText(entries, request));
  }
  return status;
}

}  // namespace

ExitStatus RunDump(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane dump", "IMAGE", kAbout);
  AddOptions(commandLine, request);
  request.file = OneFile(commandLine.Parse(argc, argv));
  if (request.json && request.utf16) throw UsageError("--json is in UTF-8");
  return Dump(request);
}
