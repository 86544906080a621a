#include "ImageFile.h"

#include <fmt/format.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string_view>
#include <utility>
#include <vector>

#include "BinaryLoader.h"
#include "File.h"
#include "LoadStatus.h"
#include "Messages.h"
#include "Text.h"

namespace {

constexpr uint16_t kByteOrderMark = 0xFEFF;

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

bool IsTextInUTF8(std::string_view bytes) {
  const bool beyondASCII = std::any_of(bytes.begin(), bytes.end(), [](char byte) {
    return static_cast<unsigned char>(byte) >= 0x80;
  });
  return beyondASCII && IsValidUTF8(bytes);
}

// UTF-16 with its byte-order mark, in the machine's byte order, which is the one that the mark
// tells.
std::string RecodedFromUTF8(const std::string& name, std::string_view text) {
  std::vector<uint16_t> units = ToUTF16(text);
  if (units.empty() || units.front() != kByteOrderMark) units.insert(units.begin(), kByteOrderMark);
  if (units.size() > kMostImageBytes / 2) Fail(name, "too large once it is UTF-16 (2 GiB)");
  return {reinterpret_cast<const char*>(units.data()), units.size() * 2};
}

}  // namespace

ImageFile ReadImageFile(const std::string& name, FileEncoding encoding) {
  std::string bytes = ReadBytes(name);
  const bool isText = !bytes.empty() && !tovali_private::IsBinary(bytes);
  const bool isUTF8 = isText && (encoding == FileEncoding::kUTF8 ||
                                 (encoding == FileEncoding::kAuto && IsTextInUTF8(bytes)));
  if (!isUTF8) return {name, std::move(bytes), {}};
  std::string image = RecodedFromUTF8(name, bytes);
  return {name, std::move(image), std::move(bytes)};
}
