#include "PlugInTest.h"

#include <boost/interprocess/streams/bufferstream.hpp>
#include <filesystem>
#include <fstream>
#include <map>
#include <set>
#include <sstream>

#include "AllocationMeter.h"
#include "KolvaneDictionary.h"
#include "ResultCodes.h"
#include "Runtime.h"
#include "TranslatedString.h"
#include "VRKTranslationImage.h"

namespace {

using namespace std::string_literals;

// Two factories, a coercion of three pairs, and the first translator's object with its handler.
constexpr char kStarted[] = "objects 1 handlers 1 factories 2 coercions 3 blocks 4 ";

TEST_F(PlugInTest, GoesThroughItsStates) {
  const EntryPoints entry;
  EXPECT_EQ(entry.version(), 0x00010000u);
  EXPECT_EQ(entry.initialize(1), 13u);
  EXPECT_EQ(Alive(), "");
  for (int round = 0; round < 3; ++round) {
    EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
    EXPECT_EQ(Alive(), kStarted);
    EXPECT_EQ(entry.terminate(1), 13u);
    EXPECT_EQ(VRKHostPlugInUnload(plugIn), kVRKInUse);
    EXPECT_EQ(Coerced("$$$/k=default"), "default");
    EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u) << "without having been terminated";
    EXPECT_EQ(Alive(), "objects 2 handlers 2 factories 2 coercions 3 blocks 5 ");
    EXPECT_EQ(Coerced("$$$/k=default"), "default");
    EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
    EXPECT_EQ(Alive(), "");
    EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
  }
}

// Notes what is registered, installed, sent, released and ended, in order, and what tokens are made of
// constants.
class Notes {
 public:
  Notes() { VRKHostSetTraceHook(&Hook, this); }
  ~Notes() { VRKHostSetTraceHook(nullptr, nullptr); }
  Notes(const Notes&) = delete;
  Notes& operator=(const Notes&) = delete;

  std::string Take() { return std::exchange(text, {}); }

  VRKDataCoercionCallback coercionCallback = nullptr;
  void* coercion = nullptr;

 private:
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context) {
    if (call->isFinished == 0) static_cast<Notes*>(context)->Note(call->operation, call->arguments);
    return 0;
  }

  // A token's text, without what all have in common.
  static std::string Short(const VRKHostTraceArgument& token) {
    const std::string name = VRKTokenGetString(VRKToken{token.number});
    return name.substr(name.find_last_of(".:") + 1);
  }

  void Note(const std::string& operation, const VRKHostTraceArgument* arguments) {
    if (operation == "VRKTokenCreate" && arguments[1].number == 1) {
      const std::string name = static_cast<const char*>(arguments[0].pointer);
      text += "token " + name.substr(name.find_last_of(".:") + 1) + '\n';
    } else if (operation == "VRKObjectFactoryRegister") {
      text += "register " + (classes[arguments[3].pointer] = Short(arguments[0])) + '\n';
    } else if (operation == "VRKObjectFactoryUnregister") {
      text += "unregister " + classes[arguments[2].pointer] + '\n';
    } else if (operation == "VRKMessageHandlerAddMessages") {
      const auto* const messages = static_cast<const VRKToken*>(arguments[1].pointer);
      for (uint32_t i = 0; i < arguments[2].number; ++i) text += "hear " + std::string(VRKTokenGetString(messages[i])).substr(8) + '\n';
    } else if (operation == "VRKObjectDeliverMessage") {
      text += "send " + Short(arguments[1]) + '\n';
    } else if (operation == "VRKObjectRelease" && arguments[0].number != 0) {
      text += "release\n";
    } else if (operation == "VRKDataCoercionHandlerInstall") {
      text += "coerce " + Short(arguments[0]) + " to " + Short(arguments[1]) + '\n';
      coercionCallback = AsCallback<VRKDataCoercionCallback>(arguments[3].pointer);
      coercion = const_cast<void*>(arguments[4].pointer);
    } else if (operation == "VRKDataCoercionHandlerRemove") {
      text += arguments[1].pointer == coercion ? "remove coercion\n" : "remove earlier coercion\n";
    }
  }

  std::string text;
  std::map<const void*, std::string> classes;
};

TEST_F(PlugInTest, StartsUpAndShutsDownInOrder) {
  Notes notes;
  const std::string object = "hear orvane.vrk.object-died\n", release = "release\n";
  const std::string messages =
      "hear orvane.localizable-strings.make-default\nhear orvane.localizable-strings.set-translations\n"
      "hear orvane.localizable-strings.translate-string\n";
  const std::string messageTokens = "token make-default\ntoken set-translations\ntoken translate-string\n";
  for (int round = 0; round < 2; ++round) {
    VRKHostPlugInInitialize(plugIn);
    EXPECT_EQ(notes.Take(), "register string-translator\n" + object + messageTokens + messages + release + release + release +
                                "send make-default\nregister default\n" + release +
                                "token utf8\ntoken locale-independent-utf8\ncoerce locale-independent-utf8 to utf8\n"
                                "token utf16le\ncoerce locale-independent-utf8 to utf16le\n"
                                "token utf16be\ncoerce locale-independent-utf8 to utf16be\n");
    VRKHostPlugInInitialize(plugIn);
    EXPECT_EQ(notes.Take(), "register string-translator\nunregister string-translator\n" + object + messages + release + release + release +
                                "send make-default\nregister default\nunregister default\n" + release +
                                "coerce locale-independent-utf8 to utf8\ncoerce locale-independent-utf8 to utf16le\n"
                                "coerce locale-independent-utf8 to utf16be\nremove earlier coercion\n");
    VRKHostPlugInTerminate(plugIn);
    EXPECT_EQ(notes.Take(), "remove coercion\nunregister string-translator\nunregister default\n" + messageTokens);
  }
}

// A host that has a loader of its own keeps no object for the plug-in: the first translator dies at
// once. And it may unload the library as it is.
TEST_F(PlugInTest, UnregistersItsClassesWhenItIsUnloaded) {
  EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u);
  Notes notes;
  {
    const EntryPoints entry;
    EXPECT_EQ(entry.initialize(0), 0u);
    EXPECT_EQ(Alive(), "factories 2 coercions 3 blocks 3 ");
    EXPECT_EQ(CodeOf([] { Coerced("$$$/k=default"); }), 15u);
    notes.Take();
  }
  EXPECT_EQ(notes.Take(), "unregister default\nunregister string-translator\n");
  EXPECT_EQ(Alive(), "coercions 3 blocks 1 ") << "of which nobody else can take care";
  VRKDataCoercionHandlerRemove(notes.coercionCallback, notes.coercion, 0, 0);
  VRKMemoryDeallocate(notes.coercion);
  EXPECT_EQ(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn), 0u);
}

void Load(Varnel::StringTranslatorInterface& translator, const std::string& bytes) {
  const auto image = Varnel::PackTranslationImage(bytes.data(), static_cast<uint32_t>(bytes.size()));
  translator.SetTranslations(image.units.get(), image.unitCount);
}

VRKResult Use() {
  return CodeOf([] {
    const auto translator = Varnel::CreateStringTranslator();
    Load(*translator, "\"$$$/k=a translation\"\n");
    translator->MakeDefault();
    EXPECT_EQ(TranslatedBy(*translator, "$$$/k=default").size(), 13u);
    EXPECT_EQ(Coerced("$$$/k=default"), "a translation");
  });
}

// How a phase went with a fault in it; `failed` is empty when it was too short for the fault.
struct Faulted {
  VRKResult result;
  std::string failed;
};

// Starts up, starts up again, translates and shuts down, each once for every point where `run` puts a fault into it.
// Classes and coercions are there afterwards all or not at all; the next start works, and nothing is
// left in the end. Returns what there was after start-ups.
using Installed = std::set<std::pair<uint32_t, uint32_t>>;  // factories and coercions
template <class Run, class Check>
Installed SurviveEveryFault(VRKPlugIn plugIn, const Run& run, const Check& check) {
  Installed afterStartUp;
  const struct {
    std::function<VRKResult()> run;
    Installed allowed;  // afterwards
  } phases[] = {{[=] { return VRKHostPlugInInitialize(plugIn); }, {{0, 0}, {2, 0}, {2, 3}}},
                {[=] { return VRKHostPlugInInitialize(plugIn); }, {{0, 3}, {2, 0}, {2, 3}}},
                {Use, {{2, 3}}},
                {[=] { return VRKHostPlugInTerminate(plugIn); }, {{0, 0}}}};
  for (const auto& phase : phases) {
    const bool startsUp = &phase == phases;
    std::string failed = "none yet";
    for (size_t n = 1; !failed.empty(); ++n) {
      if (!startsUp) {
        EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
        EXPECT_EQ(Use(), 0u);
      }
      const Faulted faulted = run(n, phase.run);
      failed = faulted.failed;
      SCOPED_TRACE(failed + ' ' + std::to_string(n));
      check(faulted);
      VRKHostLiveCounts left{};
      EXPECT_EQ(VRKHostGetLiveCounts(&left), 0u);
      const std::pair installed(left.objectFactories, left.dataCoercions);
      EXPECT_TRUE(phase.allowed.contains(installed)) << installed.first << ", " << installed.second;
      if (startsUp) {
        EXPECT_EQ(faulted.result == 0, left.dataCoercions == 3);
        afterStartUp.insert(installed);
      }
      EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
      EXPECT_EQ(Use(), 0u);
      EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
      EXPECT_EQ(Alive(), "");
    }
  }
  return afterStartUp;
}

TEST_F(PlugInTest, SurvivesEveryFailedCall) {
  std::map<std::string, std::set<VRKResult>> results;  // of each operation that failed
  const auto run = [](size_t n, const std::function<VRKResult()>& phase) {
    CallTrace trace;
    trace.FailAt(n);
    const VRKResult result = phase();
    return Faulted{result, trace.Failed()};
  };
  const auto check = [&](const Faulted& faulted) { results[faulted.failed].insert(faulted.result); };
  const Installed afterStartUp = SurviveEveryFault(plugIn, run, check);
  EXPECT_EQ(afterStartUp, (Installed{{0, 0}, {2, 0}, {2, 3}}));

  using Results = std::set<VRKResult>;
  const Results heard{CallTrace::kFailure}, unheard{0}, either{0, CallTrace::kFailure};
  const std::map<std::string, Results> expected = {{"", unheard},
                                                   {"VRKMemoryAllocate", {Varnel::kResultOutOfMemory}},
                                                   {"VRKMemoryDeallocate", unheard},
                                                   {"VRKMessageHandlerRemove", unheard},
                                                   {"VRKObjectFactoryUnregister", unheard},
                                                   {"VRKDataCoercionHandlerRemove", unheard},
                                                   // A death tells nobody of what fails in it.
                                                   {"VRKTokenCreate", either},
                                                   {"VRKDictionaryRetain", either},
                                                   // Only where a holder gets another handle.
                                                   {"VRKDataRelease", either},
                                                   {"VRKListRelease", either},
                                                   {"VRKDictionaryRelease", either},
                                                   {"VRKObjectRelease", either}};
  for (const auto& [operation, codes] : results) {
    const auto found = expected.find(operation);
    EXPECT_EQ(codes, found != expected.end() ? found->second : heard) << operation;
  }
  EXPECT_GT(results.size(), 20u);
}

TEST_F(PlugInTest, SurvivesEveryFailedAllocation) {
  if (!kLibrariesShareRuntime) GTEST_SKIP() << "the plug-in's allocations are its own";
  const auto run = [](size_t n, const std::function<VRKResult()>& phase) {
    const AllocationMeter meter(n);
    const VRKResult result = phase();
    return Faulted{result, meter.Failed() ? "allocation" : ""};
  };
  const auto check = [](const Faulted& faulted) { EXPECT_EQ(faulted.result, faulted.failed.empty() ? 0 : Varnel::kResultOutOfMemory); };
  EXPECT_TRUE(SurviveEveryFault(plugIn, run, check).contains({0, 0}));
}

// The name of each entry of a dictionary in UTF-16 with a definition a line, as a key.
std::vector<std::string> KeysOf(const std::string& bytes) {
  const std::string text = Varnel::GetUTF8(Varnel::MakeData(Varnel::kTypeUTF16, bytes.data(), static_cast<uint32_t>(bytes.size())));
  std::vector<std::string> keys;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) keys.push_back(line.substr(1, line.find('=')) + "default");
  return keys;
}

// Real dictionaries through the kernel, held against the dictionary library.
TEST_F(PlugInTest, TranslatesAsTheLibraryDoes) {
  ASSERT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
  size_t compared = 0;
  for (const auto& file : std::filesystem::directory_iterator(ISO_CODES_FOLDER)) {
    SCOPED_TRACE(file.path());
    std::ifstream stream(file.path(), std::ios::binary);
    const std::string bytes(std::istreambuf_iterator<char>(stream), {});
    KolvaneDictionary dictionary;
    boost::interprocess::ibufferstream image(bytes.data(), bytes.size());
    dictionary.Load(image);
    const auto translator = Varnel::CreateStringTranslator();
    Load(*translator, bytes);
    translator->MakeDefault();
    for (const std::string& key : KeysOf(bytes)) {
      constexpr int kUTF8 = 1;
      const TranslatedString translated = dictionary.Translate(key.c_str(), &kUTF8);
      std::vector<uint16_t> expected(translated.BufferSize()), coerced;
      translated.CopyTo(expected.data(), translated.BufferSize(), true);
      Varnel::GetUTF16LE(Varnel::MakeData(Varnel::kTypeLocaleIndependentUTF8, key.data(), static_cast<uint32_t>(key.size())), coerced);
      ASSERT_EQ(coerced, expected) << key;
      expected.pop_back();
      ASSERT_EQ(TranslatedBy(*translator, key), expected) << key;
      ++compared;
    }
  }
  EXPECT_GT(compared, 10000u);
  EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
}

}  // namespace
