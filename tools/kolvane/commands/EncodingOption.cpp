#include "tools/kolvane/commands/EncodingOption.h"

#include <map>
#include <string>

#include "tools/kolvane/cli/ChoiceOption.h"

void AddEncodingOption(CLI::App& options, FileEncoding& encoding) {
  static const std::map<std::string, FileEncoding> kEncodings = {{"auto", FileEncoding::kAuto},
                                                                 {"image", FileEncoding::kImage},
                                                                 {"utf-8", FileEncoding::kUTF8}};
  AddChoice(options, "--encoding", kEncodings, encoding,
            "How text is decoded; image: UTF-16 with its mark, or the code page")
      ->type_name("HOW")
      ->group("Dictionaries");
}
