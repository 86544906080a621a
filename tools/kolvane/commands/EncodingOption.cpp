#include "tools/kolvane/commands/EncodingOption.h"

void AddEncodingOption(CommandLine& commandLine, FileEncoding& encoding) {
  commandLine.AddChoice<FileEncoding>(
      {.names = "--encoding",
       .text = "How text is decoded; image: UTF-16 with its mark, or the code page",
       .value = "HOW"},
      {{"auto", FileEncoding::kAuto},
       {"image", FileEncoding::kImage},
       {"utf-8", FileEncoding::kUTF8}},
      encoding);
}
