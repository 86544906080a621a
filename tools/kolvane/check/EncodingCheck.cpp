#include "EncodingCheck.h"

#include <fmt/format.h>

#include <algorithm>
#include <string_view>

#include "DictionaryReader.h"
#include "LineCheck.h"
#include "Rules.h"
#include "Text.h"
#include "TextLines.h"

namespace {

bool IsUTF16(std::string_view image) noexcept {
  return tovali_private::EncodingByMark(image) != TextEncoding::kCodePage;
}

// Whether its first two characters have a zero byte each, as ASCII has in UTF-16.
bool LooksLikeUTF16(std::string_view image) noexcept {
  if (image.size() < 4) return false;
  const bool littleEndian = image[0] != 0 && image[1] == 0 && image[2] != 0 && image[3] == 0;
  const bool bigEndian = image[0] == 0 && image[1] != 0 && image[2] == 0 && image[3] != 0;
  return littleEndian || bigEndian;
}

bool IsBeyondASCII(char byte) noexcept {
  return static_cast<unsigned char>(byte) >= 0x80;
}

// The lines of text that may be UTF-8: how many of those beyond ASCII are, and where others fail.
struct LinesOfUTF8 {
  size_t wellFormed = 0;
  std::vector<Place> malformed;
};

Place PlaceInUTF8(std::string_view line, size_t at) {
  Place place;
  place.column = 1 + CodePointCount(ToUTF16(line.substr(0, at)));
  place.lineText = ToUTF8(ToUTF16(line));
  return place;
}

LinesOfUTF8 ReadAsUTF8(std::string_view text) {
  if (text.starts_with(kUTF8Mark)) text.remove_prefix(kUTF8Mark.size());
  LinesOfUTF8 lines;
  LineCounter counter(text, TextEncoding::kCodePage);
  for (size_t at = 0; at < text.size();) {
    const size_t end = std::min(text.find_first_of("\r\n", at), text.size());
    const std::string_view line = text.substr(at, end - at);
    if (const auto bad = MalformedUTF8At(line)) {
      Place& place = lines.malformed.emplace_back(PlaceInUTF8(line, *bad));
      place.line = counter.LineAt(at);
    } else if (std::ranges::any_of(line, IsBeyondASCII)) {
      ++lines.wellFormed;
    }
    at = end + 1;
  }
  return lines;
}

class EncodingCheck {
 public:
  EncodingCheck(const ImageFile& checked, std::vector<Finding>& list)
      : file(checked), findings(list) {}

  bool Run(FileEncoding encoding) {
    if (IsUTF16(file.bytes) && file.utf8.empty()) return true;
    if (IsUTF16(file.utf8)) {
      Report(rules::kMalformedInput, {}, "this is UTF-16, not UTF-8");
      return false;
    }
    if (file.utf8.empty() && LooksLikeUTF16(file.bytes)) {
      Report(rules::kUTF16WithoutMark, {},
             "this is UTF-16 without its byte-order mark, which is read in the code page");
      return false;
    }
    const bool meantForUTF8 = CheckUTF8(encoding);
    if (file.utf8.empty() && !meantForUTF8) CheckCodePage();
    return true;
  }

 private:
  // Returns whether the text is meant for UTF-8, whatever it is read in.
  bool CheckUTF8(FileEncoding encoding) {
    const std::string_view text = file.utf8.empty() ? file.bytes : file.utf8;
    const LinesOfUTF8 lines = ReadAsUTF8(text);
    const bool meantForUTF8 = encoding == FileEncoding::kUTF8 || text.starts_with(kUTF8Mark) ||
                              lines.wellFormed > lines.malformed.size();
    if (!meantForUTF8) return false;
    for (const Place& place : lines.malformed) {
      Report(rules::kMalformedInput, place,
             encoding == FileEncoding::kUTF8
                 ? "a byte here is no UTF-8"
                 : "a byte here is no UTF-8, so that the whole file is read in the code page");
    }
    if (encoding != FileEncoding::kUTF8 && lines.malformed.empty()) {
      Report(rules::kUTF8AsCodePage, {},
             "this is UTF-8, which is read in the code page when it is loaded as it is");
    }
    return true;
  }

  // What a code page leaves undefined becomes a control character.
  void CheckCodePage() {
    TextLines lines(file.bytes);
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
