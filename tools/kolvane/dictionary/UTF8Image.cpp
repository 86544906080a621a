#include "tools/kolvane/dictionary/UTF8Image.h"

#include <algorithm>
#include <cstdint>
#include <span>
#include <vector>

#include "kolvane/lib/TextSyntax.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using Units = std::span<const uint16_t>;

constexpr uint16_t kByteOrderMark = 0xFEFF;

std::string BytesOf(Units units) {
  return {reinterpret_cast<const char*>(units.data()), units.size_bytes()};
}

// A line feed for each line that the text, which is line ends alone, has.
std::vector<uint16_t> LineFeedsFor(Units lineEnds) {
  std::vector<uint16_t> feeds;
  uint16_t before = 0;
  for (const uint16_t unit : lineEnds) {
    if (unit != '\n' || before != '\r') feeds.push_back('\n');
    before = unit;
  }
  return feeds;
}

// For text that has no line before its end or before a zero, which ends it. In UTF-16 the mark
// would be a line.
std::string ImageWithoutLines(size_t emptyLines, Units lineEnds, Units rest) {
  if (rest.empty()) return std::string(lineEnds.size(), '\n');
  return std::string(emptyLines, '\n').append(rest.size(), '\0');
}

}  // namespace

std::string MarkedUTF16(std::string_view utf8) {
  std::vector<uint16_t> units = ToUTF16(WithoutUTF8Mark(utf8));
  units.insert(units.begin(), kByteOrderMark);
  return BytesOf(units);
}

// A reader takes the mark as the first character of the first line. What is before the first quote
// of a line is ignored, so the first definition gets an opening quote where it has none, and still
// runs to the end of its line. Empty lines before it move behind it: the mark on a line of its own
// would be an entry, and later lines keep their numbers.
std::string ImageOfUTF8(std::string_view utf8) {
  const std::vector<uint16_t> units = ToUTF16(WithoutUTF8Mark(utf8));
  const auto start = std::ranges::find_if_not(units, IsLineEnd);
  const Units text(start, units.end());
  const std::vector<uint16_t> emptyLines = LineFeedsFor({units.begin(), start});
  if (text.empty() || text.front() == 0) {
    return ImageWithoutLines(emptyLines.size(), {units.begin(), start}, text);
  }
  const auto endsLine = [](uint16_t unit) { return unit == 0 || IsLineEnd(unit); };
  const auto end = std::ranges::find_if(text, endsLine);
  const Units line(text.begin(), end);
  const bool endsAtZero = end != text.end() && *end == 0;
  const Units first = text.first(line.size() + (endsAtZero ? 1 : 0));
  const Units rest = text.subspan(first.size());

  std::vector<uint16_t> image = {kByteOrderMark};
  image.reserve(units.size() + 2);
  if (tovali_private::QuotedPart(line).data() == line.data()) image.push_back('"');
  image.insert(image.end(), first.begin(), first.end());
  image.insert(image.end(), emptyLines.begin(), emptyLines.end());
  image.insert(image.end(), rest.begin(), rest.end());
  return BytesOf(image);
}
