// Any images, and what is written of them once they are loaded.
#include <algorithm>
#include <optional>
#include <sstream>

#include "fuzz/Input.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "tests/kolvane/lib/Support.h"

namespace {

using namespace tovali_private;

// None where the encoding cannot carry all values.
std::optional<std::string> Written(DictionaryTable& table, BinaryVersion version,
                                   TextEncoding values) {
  std::ostringstream image;
  const std::vector<LostValue> lost = WriteBinary(table, version, values, image);
  for (const LostValue& value : lost) {
    Require(value.unit < value.entry->Value().Length(), "what is lost is a part of its value");
  }
  if (lost.empty()) return image.str();
  Require(values != TextEncoding::kUTF16LE, "UTF-16 carries everything");
  Require(image.str().empty(), "nothing is half written");
  return {};
}

void CheckImage(DictionaryTable& table, BinaryVersion version, TextEncoding values) {
  const auto image = Written(table, version, values);
  if (!image) return;
  DictionaryTable back;
  Load(back, *image);
  const LoadStatus& status = back.LastLoad();
  Require(status.Complete(), "what is written is whole");
  Require(status.encoding == values, "an image names its encoding");
  Require(status.entriesReplaced == 0, "no key is written twice");
  Require(AnswersOf(back) == AnswersOf(table), "the same answers come back");
  Require(Written(back, version, values) == image, "the same bytes come back");
}

}  // namespace

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  DictionaryTable table;
  for (const std::string& image : Pieces(data, size)) Load(table, image);
  for (const BinaryVersion version : {BinaryVersion::k1_0, BinaryVersion::k1_5}) {
    for (const TextEncoding values :
         {TextEncoding::kUTF16LE, TextEncoding::kUTF8, TextEncoding::kCodePage}) {
      CheckImage(table, version, values);
    }
  }
  return 0;
}
