// Dictionary files, and the images that translators are given of them.
#pragma once

#include <cstdint>
#include <string>

// Of text; a binary dictionary tells its own, and is handed over as it is.
enum class FileEncoding {
  kAuto,   // kUTF8 for text beyond ASCII that is meant as UTF-8 (UTF8.h), else kImage
  kImage,  // the file's bytes exactly as they are: UTF-16 with its mark, or the code page
  kUTF8    // text in UTF-8, handed over as UTF-16
};

struct ImageFile {
  std::string name;   // as the user gave it; `-` is standard input
  std::string bytes;  // the image
  std::string utf8;   // the file's bytes, where the image is a recoding of them; else empty
};

// Throws Failure, with the file's name and the system's reason, for a file that cannot be read, and
// for one whose image would exceed the 2^31 - 2 bytes that a translator takes. Malformed UTF-8 is
// not refused: FindMalformedUTF8 finds it.
ImageFile ReadImageFile(const std::string& name, FileEncoding encoding);
