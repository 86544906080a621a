#include "tools/kolvane/dictionary/ImageFile.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string_view>
#include <utility>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/DictionaryReader.h"
#include "kolvane/lib/LoadStatus.h"
#include "platform/File.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/dictionary/UTF8Image.h"
#include "tools/kolvane/text/UTF8.h"

namespace {

[[noreturn]] void Fail(const std::string& name, std::string_view reason) {
  throw Failure(fmt::format("{}: {}", Printable(name), reason));
}

std::string ReadAll(const std::string& name, std::FILE* file) {
  std::string bytes;
  char block[1 << 16];
  while (const size_t count = std::fread(block, 1, sizeof block, file)) {
    if (count > kMostImageBytes - bytes.size())
      Fail(name, "larger than a dictionary may be (2 GiB)");
    bytes.append(block, count);
  }
  if (std::ferror(file) != 0) Fail(name, std::strerror(errno));
  return bytes;
}

std::string ReadBytes(const std::string& name) {
  if (name == "-") return ReadAll(name, stdin);
  const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(platform::OpenFile(name.c_str(), "rb"),
                                                             &std::fclose);
  if (file == nullptr) Fail(name, std::strerror(errno));
  return ReadAll(name, file.get());
}

bool IsUTF8(std::string_view bytes, FileEncoding encoding) {
  if (bytes.empty() || tovali_private::HasBinaryMagic(bytes)) return false;
  if (encoding != FileEncoding::kAuto) return encoding == FileEncoding::kUTF8;
  const bool isUnmarked = tovali_private::EncodingFromBOM(bytes) == TextEncoding::kCodePage;
  return isUnmarked && IsMeantAsUTF8(bytes);
}

}  // namespace

ImageFile ReadImageFile(const std::string& name, FileEncoding encoding) {
  std::string bytes = ReadBytes(name);
  if (!IsUTF8(bytes, encoding)) return {name, std::move(bytes), {}};
  std::string image = ImageOfUTF8(bytes);
  if (image.size() > kMostImageBytes) Fail(name, "too large once it is UTF-16 (2 GiB)");
  return {name, std::move(image), std::move(bytes)};
}
