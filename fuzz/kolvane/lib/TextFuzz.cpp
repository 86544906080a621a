// Any units as lines of text, as values with their escapes, and as what is to be written.
#include "fuzz/Input.h"
#include "kolvane/lib/TextSyntax.h"
#include "tests/kolvane/lib/SlowTwin.h"
#include "tests/kolvane/lib/Support.h"

namespace {

using namespace tovali_private;
using UnitSpan = std::span<const uint16_t>;

std::u16string TextOf(UnitSpan units) {
  return {units.begin(), units.end()};
}

std::u16string Unescaped(const std::u16string& text) {
  return Text(Unescape(Units(text)));
}

// The first pass of Unescape, start by start.
std::u16string DecodedByStarts(UnitSpan text) {
  std::u16string decoded;
  while (!text.empty()) {
    const EscapeToken start = DecodeNext(text);
    Require(start.taken > 0 && start.taken <= text.size(), "a start is a part of the text");
    Require(start.count > 0 && start.count <= start.taken, "a start never grows");
    decoded += TextOf({start.units, start.count});
    text = text.subspan(start.taken);
  }
  return decoded;
}

void CheckDecoding(const std::u16string& text) {
  const std::u16string decoded = Unescaped(text);
  Require(decoded == SlowTwin::Decode(text), "Unescape decodes as the twin does");
  if (text.find(u'#') != text.npos) return;
  const std::u16string byStarts = DecodedByStarts(Units(text));
  Require(byStarts.find(u"#{") != byStarts.npos || byStarts == decoded,
          "without names the first pass is all");
}

void CheckEscaping(const std::u16string& text) {
  const auto escaped = EscapeForText(Units(text));
  const std::u16string written = escaped ? TextOf(*escaped) : text;
  Require(written.find_first_of(u"\n\r") == text.npos, "no line end is left");
  const bool holdsEscapes = Unescaped(text) != text || text.find_first_of(u"^\\") != text.npos;
  Require(holdsEscapes || Unescaped(written) == text, "Unescape undoes EscapeForText");
}

void CheckWriting(const std::string& key, const std::u16string& value) {
  std::vector<uint16_t> line = {'x'};
  const std::span bytes(reinterpret_cast<const uint8_t*>(key.data()), key.size());
  const UnwritableReason obstacle = AppendLine(bytes, Units(value), line);
  const std::u16string written = TextOf(line).substr(1);
  if (obstacle != UnwritableReason::kNone)
    return Require(written.empty(), "nothing is half written");
  DictionaryTable stored, loaded;
  const Contents expected = {{BucketOf(key), key, value}};
  stored.StoreLine(Units(written));
  Require(ContentsOf(stored) == expected, "StoreLine stores what AppendLine writes");
  Load(loaded, BigEndianImage(written + std::u16string(21, u'\n')));
  Require(ContentsOf(loaded) == expected, "so it is in an image");
}

}  // namespace

// Bytes stand for units of their value, and two by two for any units. The last piece is a value,
// what is before it a key.
int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::vector<std::string> pieces = Pieces(data, size);
  const std::string& key = pieces.size() == 1 ? "/a" : pieces.front();
  for (const std::u16string& text : {Widened(pieces.back()), UnitsFrom(pieces.back())}) {
    CheckDecoding(text);
    CheckEscaping(text);
    CheckWriting(key, text);
  }
  return 0;
}
