#include "tools/kolvane/lint/EncodingCheck.h"

#include <algorithm>
#include <limits>
#include <string>
#include <string_view>

#include "kolvane/lib/DictionaryReader.h"
#include "tools/kolvane/dictionary/FileKind.h"
#include "tools/kolvane/dictionary/TextLines.h"
#include "tools/kolvane/lint/LineCheck.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

const Rule& RuleOf(FileKind kind) noexcept {
  if (kind == FileKind::kUTF16WithoutMark) return rules::kUTF16WithoutMark;
  if (kind == FileKind::kUTF16AsUTF8) return rules::kMalformedInput;
  return rules::kNoDictionary;
}

Place PlaceOf(const MalformedByte& byte) {
  return {.line = byte.line, .column = byte.column, .lineText = ToUTF8(ToUTF16(byte.lineText))};
}

class EncodingCheck {
 public:
  EncodingCheck(const ImageFile& checked, std::vector<Finding>& list)
      : file(checked), findings(list) {}

  bool Run(FileEncoding encoding) {
    const FileKind kind = KindOf(file);
    if (kind != FileKind::kDictionary) {
      Report(RuleOf(kind), {}, std::string(KindText(kind)));
      return false;
    }
    if (!file.utf8.empty()) {
      CheckUTF8(encoding, file.utf8, "a byte here is no UTF-8");
    } else if (tovali_private::EncodingFromBOM(file.bytes) != TextEncoding::kCodePage) {
      return true;
    } else if (IsMeantAsUTF8(file.bytes)) {
      CheckUTF8(encoding, file.bytes,
                "a byte here is no UTF-8, so that the whole file is read in the code page");
    } else {
      CheckCodePage();
    }
    return true;
  }

 private:
  void CheckUTF8(FileEncoding encoding, std::string_view text, const char* message) {
    constexpr size_t kAll = std::numeric_limits<size_t>::max();
    const std::vector<MalformedByte> malformed = FindMalformedUTF8(text, kAll);
    for (const MalformedByte& byte : malformed) {
      Report(rules::kMalformedInput, PlaceOf(byte), message);
    }
    if (encoding == FileEncoding::kUTF8 || !malformed.empty()) return;
    Report(rules::kUTF8AsCodePage, {},
           "this is UTF-8, which is read in the code page when it is loaded as it is");
  }

  // What a code page leaves undefined becomes a control character.
  void CheckCodePage() {
    TextLines lines(file);
    for (TextLine line; lines.Next(line);) {
      const auto bad = std::ranges::find_if(
          line.text, [](uint16_t unit) { return unit >= 0x80 && unit < 0xA0; });
      if (bad == line.text.end()) continue;
      const auto at = static_cast<size_t>(bad - line.text.begin());
      Report(rules::kMalformedInput, PlaceIn(file.name, line, at),
             "a byte here is no character of the code page");
    }
  }

  void Report(const Rule& rule, Place place, std::string message) {
    place.file = file.name;
    findings.push_back({.rule = &rule, .place = std::move(place), .message = std::move(message)});
  }

  const ImageFile& file;
  std::vector<Finding>& findings;
};

}  // namespace

bool CheckEncoding(const ImageFile& file, FileEncoding encoding, std::vector<Finding>& findings) {
  return EncodingCheck(file, findings).Run(encoding);
}
