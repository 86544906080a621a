#include "TranslateCommand.h"

#include <fmt/format.h>

#include <algorithm>
#include <boost/interprocess/streams/bufferstream.hpp>
#include <iostream>
#include <map>
#include <new>
#include <string>
#include <vector>

#include "CommandLine.h"
#include "Console.h"
#include "ImageFile.h"
#include "KolvaneDictionary.h"
#include "LoadWarnings.h"
#include "StandardOutput.h"
#include "Text.h"

namespace {

constexpr const char* kAbout =
    R"(Translate keys with dictionaries, and print each translation on a line of its own.

Examples:
  kolvane translate --dictionary de.txt '$$$/Dialog/Cancel=Cancel'
  kolvane translate --dictionary de.txt --default-dictionary en.txt < keys.txt
  printf '%s\0' "$key" | kolvane translate --dictionary de.bin --nul

A KEY is a text such as '$$$/Dialog/Cancel=Cancel'; what no dictionary has is translated by the text
after its '='. Without a KEY, each line of standard input is one. FILE may be '-' for standard input.
Files are handed over exactly as they are (image) or as text in UTF-8 (utf-8); auto, the default, is
utf-8 for valid UTF-8 text with a character beyond ASCII, else image.)";

struct Request {
  std::vector<std::string> dictionaries;
  std::vector<std::string> defaultDictionaries;
  FileEncoding encoding = FileEncoding::kAuto;
  bool nul = false;
  std::vector<std::string> keys;
};

void AddOptions(CLI::App& options, Request& request) {
  static const std::map<std::string, FileEncoding> kEncodings = {{"auto", FileEncoding::kAuto},
                                                                 {"image", FileEncoding::kImage},
                                                                 {"utf-8", FileEncoding::kUTF8}};
  const auto addFiles = [&](const char* name, std::vector<std::string>& files, const char* text) {
    options.add_option(name, files, text)
        ->type_name("FILE")
        ->allow_extra_args(false)
        ->group("Dictionaries");
  };
  addFiles("--dictionary", request.dictionaries,
           "Look keys up in FILE; of several, the later wins");
  addFiles("--default-dictionary", request.defaultDictionaries,
           "Look up in FILE what the dictionaries lack");
  options
      .add_option_function<std::string>(
          "--encoding", [&](const std::string& name) { request.encoding = kEncodings.at(name); },
          "How FILE is handed over")
      ->check(CLI::IsMember(&kEncodings))
      ->type_name("HOW")
      ->group("Dictionaries");
  options.add_flag("--nul", request.nul, "Keys and translations end in NUL, not in a line end")
      ->group("Input and output");
}

// Standard input is read once: for one dictionary, or for the keys.
void CheckStandardInput(const Request& request) {
  const auto count =
      std::count(request.dictionaries.begin(), request.dictionaries.end(), "-") +
      std::count(request.defaultDictionaries.begin(), request.defaultDictionaries.end(), "-");
  if (count > 1) throw UsageError("standard input is named twice");
  if (count == 1 && request.keys.empty()) {
    throw UsageError("standard input cannot be both a dictionary and the keys");
  }
}

// Loads the files in order, with their warnings. Returns whether all of them could be read.
bool LoadAll(const std::vector<std::string>& names, FileEncoding encoding,
             KolvaneDictionary& dictionary) {
  bool readAll = true;
  for (const std::string& name : names) {
    try {
      const ImageFile file = ReadImageFile(name, encoding);
      boost::interprocess::ibufferstream image(file.bytes.data(), file.bytes.size());
      dictionary.Load(image);
      for (const std::string& warning : WarningsOf(file, dictionary.LastLoad())) Say(warning);
    } catch (const Failure& failure) {
      Say(failure.what());
      readAll = false;
    } catch (const std::bad_alloc&) {
      Say(fmt::format("{}: out of memory", Printable(name)));
      readAll = false;
    }
  }
  return readAll;
}

std::string Translation(KolvaneDictionary& dictionary, const std::string& key) {
  constexpr int kUTF8 = 1;
  const TranslatedString translated = dictionary.Translate(key.c_str(), &kUTF8);
  std::vector<uint16_t> units(translated.BufferSize());
  translated.CopyTo(units.data(), translated.BufferSize(), true);
  units.pop_back();
  return ToUTF8(units);
}

// Reads up to the next line end or NUL (with `nul`, to the next NUL), which ends the key and starts
// none. Returns false at the end of the input. Whoever waits for an answer before asking on gets
// it: nothing stays unwritten while there is nothing to read.
bool ReadKey(std::streambuf& input, bool nul, std::string& key) {
  constexpr int kEnd = std::char_traits<char>::eof();
  key.clear();
  for (;;) {
    if (input.in_avail() <= 0) FlushOutput();
    const int character = input.sbumpc();
    if (character == kEnd) return !key.empty();
    if (character == '\0' || (character == '\n' && !nul)) break;
    key += static_cast<char>(character);
  }
  if (!nul && key.ends_with('\r')) key.pop_back();
  return true;
}

void TranslateInput(KolvaneDictionary& dictionary, bool nul, char ending) {
  std::ios::sync_with_stdio(false);
  try {
    for (std::string key; ReadKey(*std::cin.rdbuf(), nul, key);) {
      WriteOutput(Translation(dictionary, key) + ending);
    }
  } catch (const std::ios_base::failure&) {
    throw Failure("cannot read standard input");
  }
}

}  // namespace

ExitStatus RunTranslate(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane translate", "[KEY]...", kAbout);
  AddOptions(commandLine.Options(), request);
  request.keys = commandLine.Parse(argc, argv);
  CheckStandardInput(request);
  if (request.keys.empty() && platform::StandardInputIsTerminal()) {
    throw UsageError("no KEY, and nothing to read on standard input");
  }

  KolvaneDictionary defaultDictionary;
  KolvaneDictionary dictionary;
  defaultDictionary.MakeDefault();
  const bool readDefaults =
      LoadAll(request.defaultDictionaries, request.encoding, defaultDictionary);
  const bool readOwn = LoadAll(request.dictionaries, request.encoding, dictionary);
  if (!readDefaults || !readOwn) return ExitStatus::kNotDone;

  const char ending = request.nul ? '\0' : '\n';
  for (const std::string& key : request.keys) WriteOutput(Translation(dictionary, key) + ending);
  if (request.keys.empty()) TranslateInput(dictionary, request.nul, ending);
  return ExitStatus::kDone;
}
