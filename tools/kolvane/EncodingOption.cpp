#include "EncodingOption.h"

#include <map>
#include <string>

void AddEncodingOption(CLI::App& options, FileEncoding& encoding) {
  static const std::map<std::string, FileEncoding> kEncodings = {{"auto", FileEncoding::kAuto},
                                                                 {"image", FileEncoding::kImage},
                                                                 {"utf-8", FileEncoding::kUTF8}};
  options
      .add_option_function<std::string>(
          "--encoding", [&encoding](const std::string& name) { encoding = kEncodings.at(name); },
          "How FILE is handed over")
      ->check(CLI::IsMember(&kEncodings))
      ->type_name("HOW")
      ->group("Dictionaries");
}
