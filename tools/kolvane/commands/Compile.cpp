#include <fmt/format.h>

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/OutputFile.h"
#include "tools/kolvane/cli/Paths.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/commands/EncodingOption.h"
#include "tools/kolvane/dictionary/DictionaryFile.h"
#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/dictionary/LoadWarnings.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using tovali_private::BinaryVersion;

constexpr const char* kAbout =
    R"(Make one binary image of dictionaries.

Examples:
  kolvane compile de.txt -o de.kdict
  kolvane compile common.txt de.txt -o de.kdict --values utf-8

A translator that loads the image answers as one that loads each INPUT in turn: of two definitions of
a key the later one wins. Equal contents give equal bytes. INPUT may be text, a binary image, or '-' for
standard input; OUT is none of them. Nothing is written where an input is damaged or no dictionary, or
where the encoding of the values lacks a character of one of them.)";

struct Request {
  std::vector<std::string> inputs;
  std::string output;
  BinaryVersion version = BinaryVersion::k1_5;
  TextEncoding values = TextEncoding::kUTF16LE;
  FileEncoding encoding = FileEncoding::kAuto;
};

void AddOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Image");
  commandLine.AddValue({.names = "-o,--output",
                        .text = "Write the image to FILE",
                        .value = "FILE",
                        .isRequired = true},
                       request.output);
  commandLine.AddChoice<BinaryVersion>({.names = "--format",
                                        .text = "Its version of the binary format, else 1.5",
                                        .value = "VERSION"},
                                       {{"1.5", BinaryVersion::k1_5}, {"1.0", BinaryVersion::k1_0}},
                                       request.version);
  commandLine.AddChoice<TextEncoding>({.names = "--values",
                                       .text = "The encoding of its translations, else utf-16",
                                       .value = "ENCODING"},
                                      {{"utf-16", TextEncoding::kUTF16LE},
                                       {"utf-8", TextEncoding::kUTF8},
                                       {"code-page", TextEncoding::kCodePage}},
                                      request.values);
  commandLine.BeginGroup("Dictionaries");
  AddEncodingOption(commandLine, request.encoding);
}

// Returns whether the file could be read and is whole, and says what is wrong with it.
bool Load(const std::string& name, FileEncoding encoding, DictionaryTable& table) {
  try {
    return LoadWithWarnings(table, ReadImageFile(name, encoding));
  } catch (const Failure& failure) {
    Say(failure.what());
    return false;
  }
}

std::string LossText(const tovali_private::LostValue& lost, TextEncoding encoding) {
  const std::string character = CodePointText(CodePointAt(lost.entry->Value().Units(), lost.unit));
  return fmt::format("'{}': its translation holds {}, which {} cannot carry",
                     Excerpt(KeyText(AsText(lost.entry->Bytes()))), character,
                     encoding == TextEncoding::kUTF8 ? "UTF-8" : "the code page");
}

bool LoadAll(const Request& request, DictionaryTable& table) {
  bool loadedAll = true;
  for (const std::string& name : request.inputs) {
    loadedAll = Load(name, request.encoding, table) && loadedAll;
  }
  return loadedAll;
}

void RefuseLosses(const std::vector<tovali_private::LostValue>& lost, TextEncoding encoding) {
  constexpr size_t kMostReports = 20;
  if (lost.empty()) return;
  for (size_t i = 0; i < std::min(lost.size(), kMostReports); ++i) {
    Say(LossText(lost[i], encoding));
  }
  throw Failure(fmt::format(
      "nothing was written, for {} would be lost; utf-16 carries them all",
      lost.size() == 1 ? "a translation" : fmt::format("{} translations", lost.size())));
}

// Sources are not replaced by what is made of them.
void RequireOtherOutput(const Request& request) {
  for (const std::string& input : request.inputs) {
    if (!AreSameFile(input, request.output)) continue;
    throw Failure(fmt::format("{}: nothing was written, for the output is the input {}",
                              Printable(request.output), Printable(input)));
  }
}

ExitStatus Compile(const Request& request) {
  RequireOtherOutput(request);
  DictionaryTable table;
  if (!LoadAll(request, table)) throw Failure("nothing was written, for an input is not whole");
  std::ostringstream image;
  image.exceptions(std::ios::badbit);
  RefuseLosses(WriteBinary(table, request.version, request.values, image), request.values);
  WriteFile(request.output, image.view());
  return ExitStatus::kDone;
}

}  // namespace

ExitStatus RunCompile(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane compile", "INPUT... -o OUT", kAbout);
  AddOptions(commandLine, request);
  request.inputs = commandLine.Parse(argc, argv);
  CheckFiles(request.inputs);
  return Compile(request);
}
