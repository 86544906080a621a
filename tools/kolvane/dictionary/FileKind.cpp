#include "tools/kolvane/dictionary/FileKind.h"

#include <fmt/format.h>

#include <algorithm>
#include <initializer_list>
#include <nlohmann/json.hpp>
#include <string>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryReader.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

constexpr std::string_view kSpace = " \t\r\n";

bool IsUTF16(std::string_view image) noexcept {
  return tovali_private::EncodingFromBOM(image) != TextEncoding::kCodePage;
}

// In UTF-8, of the first `most` bytes.
std::string TextOf(const ImageFile& file, size_t most) {
  if (!file.utf8.empty()) return std::string(WithoutUTF8Mark(file.utf8).substr(0, most));
  const std::string_view bytes = std::string_view(file.bytes).substr(0, most);
  const TextEncoding encoding = tovali_private::EncodingFromBOM(bytes);
  return ToUTF8(encoding == TextEncoding::kCodePage
                    ? FromMultiByte(bytes, tovali_private::kDefaultSelector)
                    : DecodedUTF16(bytes.substr(2), encoding == TextEncoding::kUTF16BE));
}

bool HasDefinition(std::string_view text) noexcept {
  return text.find("$$$") != text.npos;
}

bool HasLine(std::string_view text, std::string_view start) {
  return text.starts_with(start) || text.find(fmt::format("\n{}", start)) != text.npos;
}

bool IsPO(std::string_view text) {
  return HasLine(text, "msgid \"") && (HasLine(text, "msgstr \"") || HasLine(text, "msgstr["));
}

bool StartsWithTag(std::string_view text) noexcept {
  constexpr std::string_view kLetters = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz_";
  return text.size() > 1 && text[0] == '<' && kLetters.find(text[1]) != kLetters.npos;
}

// A dictionary may have tags outside its quotes, too.
bool IsXML(std::string_view text) noexcept {
  for (const std::string_view start : {"<?xml", "<!DOCTYPE", "<!doctype", "<!--"}) {
    if (text.starts_with(start)) return true;
  }
  const bool endsTag = text.find("</") != text.npos || text.find("/>") != text.npos;
  return StartsWithTag(text) && endsTag && !HasDefinition(text);
}

bool IsJSON(std::string_view start, const ImageFile& file) {
  if (!start.starts_with('{') && !start.starts_with('[')) return false;
  constexpr bool kIgnoreComments = true;
  return nlohmann::json::accept(TextOf(file, file.bytes.size()), kIgnoreComments);
}

// Of random or compressed data one byte in ten is a control that text has no use for.
bool IsBinaryData(std::string_view text) noexcept {
  constexpr size_t kFewControls = 3;
  constexpr size_t kTextForEachControl = 64;
  constexpr std::string_view kInText = "\t\n\v\f\r\x1A\x1B";
  const auto controls = std::ranges::count_if(text, [&](char character) {
    return static_cast<unsigned char>(character) < 0x20 && kInText.find(character) == kInText.npos;
  });
  const size_t most = kFewControls + text.size() / kTextForEachControl;
  return static_cast<size_t>(controls) > most && !HasDefinition(text);
}

FileKind KindOfText(const ImageFile& file) {
  constexpr size_t kStart = 1 << 16;
  const std::string text = TextOf(file, kStart);
  std::string_view start = text;
  start.remove_prefix(std::min(start.find_first_not_of(kSpace), start.size()));
  if (IsPO(start)) return FileKind::kPO;
  if (IsXML(start)) return FileKind::kXML;
  if (IsJSON(start, file)) return FileKind::kJSON;
  return IsBinaryData(text) ? FileKind::kBinaryData : FileKind::kDictionary;
}

}  // namespace

bool LooksLikeUTF16(std::string_view bytes) noexcept {
  if (bytes.size() < 4) return false;
  const bool littleEndian = bytes[0] != 0 && bytes[1] == 0 && bytes[2] != 0 && bytes[3] == 0;
  const bool bigEndian = bytes[0] == 0 && bytes[1] != 0 && bytes[2] == 0 && bytes[3] != 0;
  return littleEndian || bigEndian;
}

FileKind KindOf(const ImageFile& file) {
  if (tovali_private::HasBinaryMagic(file.bytes)) return FileKind::kDictionary;
  if (IsUTF16(file.utf8)) return FileKind::kUTF16AsUTF8;
  if (LooksLikeUTF16(file.utf8.empty() ? file.bytes : file.utf8)) {
    return FileKind::kUTF16WithoutMark;
  }
  return KindOfText(file);
}

std::string_view KindText(FileKind kind) noexcept {
  switch (kind) {
    case FileKind::kDictionary:
      return {};
    case FileKind::kUTF16WithoutMark:
      return "this is UTF-16 without its byte-order mark, which is read in the code page";
    case FileKind::kUTF16AsUTF8:
      return "this is UTF-16, not UTF-8";
    case FileKind::kPO:
      return "this is a PO file, not a dictionary";
    case FileKind::kXML:
      return "this is XML, not a dictionary";
    case FileKind::kJSON:
      return "this is JSON, not a dictionary";
    case FileKind::kBinaryData:
      return "this is binary data, not a dictionary";
  }
  return {};
}

void RequireDictionary(const ImageFile& file) {
  const FileKind kind = KindOf(file);
  if (kind == FileKind::kDictionary) return;
  throw Failure(fmt::format("{}: error: {}", Printable(file.name), KindText(kind)));
}
