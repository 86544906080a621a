#include "tools/kolvane/lint/DictionaryCheck.h"

#include <fmt/format.h>

#include <algorithm>
#include <optional>
#include <tuple>
#include <utility>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/DictionaryTable.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/dictionary/DictionaryFile.h"
#include "tools/kolvane/dictionary/TextLines.h"
#include "tools/kolvane/lint/EncodingCheck.h"
#include "tools/kolvane/lint/ImageCheck.h"
#include "tools/kolvane/lint/LineCheck.h"
#include "tools/kolvane/lint/ReferenceCheck.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

// How the file ends for a translator, which a look at its lines does not tell. Returns whether it
// is loaded at all.
bool CheckEnd(const ImageFile& file, std::vector<Finding>& findings) {
  DictionaryTable table;
  const LoadStatus status = LoadInto(table, file);
  Finding finding{.place = {.file = file.name}};
  switch (status.damage) {
    case LoadDamage::kTooShort:
      finding.rule = &rules::kTooShort;
      finding.message =
          "a file with fewer than 21 bytes, its byte-order mark not counted, is ignored";
      break;
    case LoadDamage::kZeroCharacter:
      finding.rule = &rules::kZeroCharacter;
      finding.message = "a zero character at the start of the line ends the file for a translator";
      finding.place.line = LineCounter(file.bytes, status.encoding).LineAt(status.damageOffset);
      finding.place.column = 1;
      break;
    case LoadDamage::kHalfUnit:
      finding.rule = &rules::kMalformedInput;
      finding.message = "the file ends in half of a character";
      break;
    default:
      return true;
  }
  findings.push_back(std::move(finding));
  return status.damage != LoadDamage::kTooShort;
}

Definitions CheckText(const ImageFile& file, FileEncoding encoding,
                      std::vector<Finding>& findings) {
  Definitions definitions;
  if (!CheckEncoding(file, encoding, findings)) return definitions;
  const bool isLoaded = CheckEnd(file, findings);
  TextLines lines(file);
  for (TextLine line; lines.Next(line);) CheckLine(file.name, line, definitions, findings);
  return isLoaded ? definitions : Definitions();
}

Definitions CheckFile(const ImageFile& file, FileEncoding encoding,
                      std::vector<Finding>& findings) {
  const bool isBinary = tovali_private::HasBinaryMagic(file.bytes);
  return isBinary ? CheckImage(file, findings) : CheckText(file, encoding, findings);
}

// Those of a file as a whole come first.
void SortByPlace(std::vector<Finding>& findings) {
  const auto place = [](const Finding& finding) {
    return std::tuple(finding.place.line, finding.place.column, finding.place.offset);
  };
  std::ranges::stable_sort(findings, {}, place);
}

// What keeps a file, or a part of it, from being read for what it is.
bool IsUnread(const Finding& finding) {
  if (finding.rule == &rules::kMalformedInput) return finding.place.line == 0;  // of all of it
  constexpr const Rule* kRules[] = {&rules::kTooShort,         &rules::kNoDictionary,
                                    &rules::kUTF16WithoutMark, &rules::kTruncatedImage,
                                    &rules::kDamagedImage,     &rules::kUnsupportedVersion};
  return std::ranges::find(kRules, finding.rule) != std::end(kRules);
}

void CheckAcross(const Definitions& definitions, Definitions& earlier,
                 std::vector<Finding>& findings) {
  for (const Definition& definition : definitions.All()) {
    if (const Definition* const other = earlier.Find(definition.key)) {
      Finding finding{.rule = &rules::kDuplicateAcrossFiles,
                      .place = definition.place,
                      .message = fmt::format("key '{}' is defined in another file too",
                                             Excerpt(KeyText(definition.key))),
                      .key = KeyText(definition.key)};
      finding.notes.push_back(NoteOf(other->place, "defined here"));
      findings.push_back(std::move(finding));
    } else {
      earlier.Put(definition);
    }
  }
}

}  // namespace

std::vector<Finding> CheckDictionaries(const std::vector<ImageFile>& files,
                                       const ImageFile* reference, FileEncoding encoding) {
  std::vector<Finding> all;
  std::optional<Definitions> source;
  if (reference != nullptr) {
    source = CheckFile(*reference, encoding, all);
    std::erase_if(all, [](const Finding& finding) { return !IsUnread(finding); });
  }
  Definitions earlier;
  for (const ImageFile& file : files) {
    std::vector<Finding> findings;
    const Definitions definitions = CheckFile(file, encoding, findings);
    CheckTranslations(file.name, definitions, source ? &*source : nullptr, findings);
    if (files.size() > 1) CheckAcross(definitions, earlier, findings);
    SortByPlace(findings);
    std::ranges::move(findings, std::back_inserter(all));
  }
  return all;
}
