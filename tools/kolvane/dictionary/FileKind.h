// What a file plainly is when it is no text dictionary in the encoding that it is read in.
#pragma once

#include <string_view>

#include "tools/kolvane/dictionary/ImageFile.h"

enum class FileKind {
  kDictionary,  // or nothing that can be told from its form
  kUTF16WithoutMark,
  kUTF16AsUTF8,
  kPO,
  kXML,  // or HTML
  kJSON,
  kBinaryData  // but no binary dictionary
};

// Whether the first two characters have a zero byte each, as ASCII has in UTF-16.
bool LooksLikeUTF16(std::string_view bytes) noexcept;

FileKind KindOf(const ImageFile& file);

// "this is XML, not a dictionary"; empty for kDictionary.
std::string_view KindText(FileKind kind) noexcept;

// Throws Failure, with the file's name and the text of its kind, for all but dictionaries.
void RequireDictionary(const ImageFile& file);
