#include "tools/kolvane/dictionary/MalformedText.h"

#include <fmt/format.h>

#include <vector>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/text/UTF8.h"

std::optional<std::string> MalformedText(const ImageFile& file) {
  const std::vector<MalformedByte> malformed = FindMalformedUTF8(file.utf8, 1);
  if (malformed.empty()) return std::nullopt;
  const MalformedByte& first = malformed.front();
  return fmt::format(
      "{}:{}:{}: error: byte {} is malformed UTF-8; --encoding image reads the file in the code "
      "page",
      Printable(file.name), first.line, first.column, first.offset);
}
