#include <fmt/format.h>

#include <algorithm>
#include <iostream>
#include <limits>
#include <new>
#include <optional>
#include <string>
#include <vector>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "kolvane/api/wrapper-framework/VRKTranslationImage.h"
#include "platform/Console.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/commands/EncodingOption.h"
#include "tools/kolvane/dictionary/DictionaryFile.h"
#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/dictionary/LoadWarnings.h"
#include "tools/kolvane/host/KernelTrace.h"
#include "tools/kolvane/host/ResultText.h"
#include "tools/kolvane/host/TranslatorHost.h"
#include "tools/kolvane/text/Unicode.h"
#include "wrapper-framework/source/Exceptions.h"

namespace {

using Translator = Varnel::StringTranslatorInterface;

constexpr const char* kAbout =
    R"(Translate keys with dictionaries, and print each translation on a line of its own.

Examples:
  kolvane translate --dictionary de.txt '$$$/Dialog/Cancel=Cancel'
  kolvane translate --dictionary de.txt --default-dictionary en.txt < keys.txt
  printf '%s\0' "$key" | kolvane translate --dictionary de.bin --nul

A KEY is a text such as '$$$/Dialog/Cancel=Cancel'; what no dictionary has is translated by the text
after its '='. Without a KEY, each line of standard input is one. FILE may be '-' for standard input.
Files are handed over exactly as they are (image) or as text in UTF-8 (utf-8); auto, the default, is
utf-8 for text beyond ASCII that is meant as UTF-8, else image. Of a damaged FILE the rest is used, and
the exit status is 2.)";

struct Request {
  std::vector<std::string> dictionaries;
  std::vector<std::string> defaultDictionaries;
  FileEncoding encoding = FileEncoding::kAuto;
  bool nul = false;
  bool trace = false;
  std::optional<std::string> plugIn;
  std::vector<std::string> keys;
};

void AddOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Dictionaries");
  commandLine.AddValues({.names = "--dictionary",
                         .text = "Look keys up in FILE; of several, the later wins",
                         .value = "FILE"},
                        request.dictionaries);
  commandLine.AddValues({.names = "--default-dictionary",
                         .text = "Look up in FILE what the dictionaries lack",
                         .value = "FILE"},
                        request.defaultDictionaries);
  AddEncodingOption(commandLine, request.encoding);
  commandLine.BeginGroup("Input and output");
  commandLine.AddFlag(
      {.names = "--nul", .text = "Keys and translations end in NUL, not in a line end"},
      request.nul);
  commandLine.BeginGroup("Kernel");
  commandLine.AddFlag(
      {.names = "--trace", .text = "Print the calls to the kernel on standard error"},
      request.trace);
  commandLine.AddValue(
      {.names = "--plugin", .text = "Translate with the plug-in FILE", .value = "FILE"},
      request.plugIn);
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

// Does what calls the kernel. `what` tells, when that fails, what could not be done.
template <class What, class Action>
void Call(What what, Action action) {
  try {
    action();
  } catch (const Varnel::Exception& failure) {
    throw Failure(fmt::format("{}: {}", what(), ResultText(failure.GetResultCode())));
  }
}

boost::shared_ptr<Translator> NewTranslator() {
  boost::shared_ptr<Translator> translator;
  Call([] { return "cannot create a translator"; },
       [&] { translator = Varnel::CreateStringTranslator(); });
  return translator;
}

void Load(const ImageFile& file, Translator& translator) {
  const Varnel::TranslationImage image =
      Varnel::PackTranslationImage(file.bytes.data(), static_cast<uint32_t>(file.bytes.size()));
  Call([&] { return Printable(file.name) + ": cannot be loaded"; },
       [&] { translator.SetTranslations(image.units.get(), image.unitCount); });
}

// Reports what is wrong with the file, which a translator does not tell but a table does. Returns
// whether all of it could be loaded.
bool IsWhole(const ImageFile& file) {
  try {
    DictionaryTable table;
    return LoadWithWarnings(table, file);
  } catch (const Failure& failure) {
    Say(failure.what());
    return false;
  }
}

enum class Loading { kWhole, kPartly, kFailed };

Loading LoadFile(const std::string& name, FileEncoding encoding, Translator& translator) {
  try {
    const ImageFile file = ReadImageFile(name, encoding);
    Load(file, translator);
    return IsWhole(file) ? Loading::kWhole : Loading::kPartly;
  } catch (const Failure& failure) {
    Say(failure.what());
  } catch (const std::bad_alloc&) {
    Say(fmt::format("{}: out of memory", Printable(name)));
  }
  return Loading::kFailed;
}

// Loads the files in order, and returns the worst that came of it.
Loading LoadAll(const std::vector<std::string>& names, FileEncoding encoding,
                Translator& translator) {
  Loading worst = Loading::kWhole;
  for (const std::string& name : names) {
    worst = std::max(worst, LoadFile(name, encoding, translator));
  }
  return worst;
}

std::string Translation(Translator& translator, const std::string& key) {
  if (key.size() > std::numeric_limits<uint32_t>::max()) throw Failure("a key is too long");
  std::vector<uint16_t> units;
  Call([&] { return fmt::format("cannot translate '{}'", Excerpt(key)); },
       [&] { translator.TranslateString(key.data(), static_cast<uint32_t>(key.size()), units); });
  if (!units.empty()) units.pop_back();  // the 0 that ends it
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

void TranslateInput(Translator& translator, bool nul, char ending) {
  std::ios::sync_with_stdio(false);
  try {
    for (std::string key; ReadKey(*std::cin.rdbuf(), nul, key);) {
      WriteOutput(Translation(translator, key) + ending);
    }
  } catch (const std::ios_base::failure&) {
    throw Failure("cannot read standard input");
  }
}

ExitStatus Translate(const Request& request) {
  const boost::shared_ptr<Translator> defaultTranslator = NewTranslator();
  const boost::shared_ptr<Translator> translator = NewTranslator();
  Call([] { return "cannot make a translator the default"; },
       [&] { defaultTranslator->MakeDefault(); });
  const Loading defaults =
      LoadAll(request.defaultDictionaries, request.encoding, *defaultTranslator);
  const Loading own = LoadAll(request.dictionaries, request.encoding, *translator);
  const Loading loaded = std::max(defaults, own);
  if (loaded == Loading::kFailed) return ExitStatus::kNotDone;

  const char ending = request.nul ? '\0' : '\n';
  for (const std::string& key : request.keys) WriteOutput(Translation(*translator, key) + ending);
  if (request.keys.empty()) TranslateInput(*translator, request.nul, ending);
  return loaded == Loading::kWhole ? ExitStatus::kDone : ExitStatus::kNotDone;
}

}  // namespace

ExitStatus RunTranslate(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane translate", "[KEY]...", kAbout);
  AddOptions(commandLine, request);
  request.keys = commandLine.Parse(argc, argv);
  CheckStandardInput(request);
  if (request.keys.empty() && platform::StandardInputIsTerminal()) {
    throw UsageError("no KEY, and nothing to read on standard input");
  }

  TranslatorHost host;
  std::optional<KernelTrace> trace;
  if (request.trace) trace.emplace();
  host.LoadPlugIn(request.plugIn);
  const ExitStatus status = Translate(request);
  host.Close();
  return status;
}
