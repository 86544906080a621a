// The built plug-in, in a kernel, as a host sees it.
#include "tests/kolvane/source/PlugInTest.h"

#include <boost/interprocess/streams/bufferstream.hpp>
#include <map>
#include <sstream>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "tests/kolvane/source/Messages.h"
#include "wrapper-framework/source/Exceptions.h"

namespace {

using namespace std::string_literals;
using namespace Varnel;
using Translator = boost::shared_ptr<StringTranslatorInterface>;

class PlugInTest : public KernelTest {
 protected:
  PlugInTest() { EXPECT_EQ(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn), 0u) << VRKHostLoadError(); }
  ~PlugInTest() override { EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u); }

  VRKPlugIn plugIn{};
};

// A key's translation by the plug-in's coercion.
std::string Coerced(const std::string& key) {
  return GetUTF8(DataOf(kTypeLocaleIndependentUTF8, key));
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
    auto& self = *static_cast<Notes*>(context);
    const std::string note = call->isFinished == 0 ? self.NoteOf(call->operation, call->arguments) : "";
    if (!note.empty()) self.text += note + '\n';
    return 0;
  }

  // Without what all have in common.
  static std::string Short(const std::string& name) { return name.substr(name.find_last_of(".:") + 1); }
  static std::string Short(const VRKHostTraceArgument& token) { return Short(VRKTokenGetString(VRKToken{token.number})); }

  std::string NoteOf(const std::string& operation, const VRKHostTraceArgument* arguments) {
    const auto& [first, second] = std::tie(arguments[0], arguments[1]);
    if (operation == "VRKTokenCreate" && second.number == 1) return "token " + Short(static_cast<const char*>(first.pointer));
    if (operation == "VRKObjectFactoryRegister") return "register " + (classes[arguments[3].pointer] = Short(first));
    if (operation == "VRKObjectFactoryUnregister") return "unregister " + classes[arguments[2].pointer];
    if (operation == "VRKObjectDeliverMessage") return "send " + Short(second);
    if (operation == "VRKObjectRelease" && first.number != 0) return "release";
    if (operation == "VRKMessageHandlerAddMessages") {
      std::string heard = "hear";
      const auto* const messages = static_cast<const VRKToken*>(second.pointer);
      for (uint32_t i = 0; i < arguments[2].number; ++i) heard += ' ' + Short(VRKTokenGetString(messages[i]));
      return heard;
    }
    if (operation == "VRKDataCoercionHandlerRemove") return second.pointer == coercion ? "remove coercion" : "remove earlier coercion";
    if (operation != "VRKDataCoercionHandlerInstall") return "";
    coercionCallback = AsCallback<VRKDataCoercionCallback>(arguments[3].pointer);
    coercion = const_cast<void*>(arguments[4].pointer);
    return "coerce " + Short(first) + " to " + Short(second);
  }

  std::string text;
  std::map<const void*, std::string> classes;
};

TEST_F(PlugInTest, StartsUpAndShutsDownInOrder) {
  const EntryPoints entry;
  EXPECT_EQ(entry.version(), 0x00010000u);
  Notes notes;
  const std::string object = "hear object-died\n", release = "release\n";
  const std::string messages = "hear make-default set-translations translate-string\n";
  const std::string messageTokens = "token make-default\ntoken set-translations\ntoken translate-string\n";
  for (int round = 0; round < 2; ++round) {
    EXPECT_EQ(entry.initialize(1), 13u);
    EXPECT_EQ(notes.Take(), "");
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
    EXPECT_EQ(entry.terminate(1), 13u);
    EXPECT_EQ(notes.Take(), "");
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

std::string BinaryImage(const std::string& text) {
  DictionaryTable table;
  boost::interprocess::ibufferstream in(text.data(), text.size());
  table.Load(in);
  std::ostringstream out;
  EXPECT_TRUE(WriteBinary(table, tovali_private::BinaryVersion::k1_5, TextEncoding::kUTF8, out).empty());
  return out.str();
}

// Two translators, the first of which is the default, and what a host does with them. The plug-in is
// loaded anew for each world: what it makes when it is first used may fail, too.
class Translators {
 public:
  explicit Translators(const Phase<Translators>& phase) {
    EXPECT_EQ(VRKHostPlugInUnload(*plugIn), 0u);
    EXPECT_EQ(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", plugIn), 0u);
    if (phase.run != &Translators::StartUp) Prepare();
  }

  void StartUp() { ThrowIfFailed(VRKHostPlugInInitialize(*plugIn)); }
  void StartUpAgain() { StartUp(); }
  void LoadText() { ExpectLoaded("\"$$$/text=loaded\"\n// some more\n", "$$$/text=default"); }
  void LoadBinary() { ExpectLoaded(binary, "$$$/binary=default"); }
  void LoadBytes() {
    first->SetTranslations("\"$$$/bytes=loaded\"\n// more\n", 27);
    EXPECT_EQ(Translated(*first, "$$$/bytes=default"), "loaded\0"s);
  }
  void Translate() { EXPECT_EQ(Translated(*first, "$$$/k=default"), "first\0"s); }
  void TranslateKey() {
    const DictionaryRef parameters = With(kParameterTranslationKey, DataOf(kTypeLocaleIndependentUTF8, "$$$/k="));
    ThrowIfFailed(Send(secondObject.Get(), kMessageTranslateString, parameters));
    EXPECT_EQ(GetUTF8(parameters.GetEntry(MakeToken(kParameterMessageResult))), "second's first\0"s);
  }
  void Coerce() {
    EXPECT_EQ(Coerced("$$$/k=default"), "first\0"s);
    std::vector<uint16_t> units;
    GetUTF16LE(DataOf(kTypeLocaleIndependentUTF8, "$$$/k="), units);
    EXPECT_EQ(units.size(), 6u);
  }
  void CreateOfDefault() { ofDefault.Create(MakeToken(kClassDefaultStringTranslator), {}); }
  void MakeDefault() { ThrowIfFailed(Send(secondObject.Get(), kMessageMakeDefault)); }
  void Die() { secondObject.Reset(); }
  void ShutDown() { ThrowIfFailed(VRKHostPlugInTerminate(*plugIn)); }

  // What was translated before still is, and all can be done again.
  void Check(const Phase<Translators>& phase) {
    if (first != nullptr) Translate();
    if (Alive().find("coercions 3") != std::string::npos) {
      const bool startsUp = phase.run == &Translators::StartUp || phase.run == &Translators::StartUpAgain;
      const std::string changed = startsUp ? "default" : phase.run == &Translators::MakeDefault ? "second" : "first";
      const std::string answer = Coerced("$$$/k=default").c_str();
      EXPECT_TRUE(answer == "first" || answer == changed) << answer;
    }
    EXPECT_EQ(CodeOf([&] { (this->*phase.run)(); }), 0u);
    Prepare();
    for (const auto run : {&Translators::LoadText, &Translators::TranslateKey, &Translators::Coerce}) (this->*run)();
    first.reset();
    ofDefault.Reset();
    Die();
    ShutDown();
    EXPECT_EQ(Alive(), "");
  }

  static inline VRKPlugIn* plugIn = nullptr;

 private:
  void Prepare() {
    StartUp();
    first = CreateStringTranslator();
    Load(*first, "\"$$$/k=first\"\n// and more\n");
    first->MakeDefault();
    secondObject.Create(MakeToken(kClassStringTranslator), {});
    StringTranslatorClient second;
    second.SetObject(secondObject);
    Load(second, "\"$$$/k=second\"\n\"$$$first=second's first\"\n");
  }
  void ExpectLoaded(const std::string& image, const std::string& key) {
    Load(*first, image);
    EXPECT_EQ(Translated(*first, key), "loaded\0"s);
  }

  Translator first;
  ObjectRef secondObject, ofDefault;
  std::string binary = BinaryImage("\"$$$/binary=loaded\"\n// and more\n");
};

TEST_F(PlugInTest, SurvivesEveryFault) {
  Translators::plugIn = &plugIn;
  using T = Translators;
  const Phase<T> phases[] = {
      {"start-up",
       &T::StartUp,
       Hears::kAll,
       50,
       15,
       "objects 1 handlers 1 factories 2 coercions 3 blocks 4 ",  // the first translator's object, and its handler
       {"", "objects 1 handlers 1 blocks 1 ", "objects 1 handlers 1 factories 2 blocks 3 "}},
      {"start-up again",
       &T::StartUpAgain,
       Hears::kAll,
       45,
       15,
       "objects 4 handlers 4 factories 2 coercions 3 blocks 7 ",
       {"objects 3 handlers 3 coercions 3 blocks 4 ", "objects 4 handlers 4 coercions 3 blocks 5 ",
        "objects 4 handlers 4 factories 2 blocks 6 "}},
      {"load text", &T::LoadText, Hears::kAll, 60, 15},
      {"load binary", &T::LoadBinary, Hears::kAll, 60, 30},
      {"load bytes", &T::LoadBytes, Hears::kAll, 60, 15},
      {"translate", &T::Translate, Hears::kAll, 40, 5},
      {"translate key", &T::TranslateKey, Hears::kAll, 50, 10},
      {"coerce", &T::Coerce, Hears::kAll, 45, 8},
      {"create of default", &T::CreateOfDefault, Hears::kAll, 20, 5, "objects 4 handlers 4 factories 2 coercions 3 blocks 7 "},
      {"make default", &T::MakeDefault, Hears::kAll, 5, 0},
      {"death", &T::Die, Hears::kNothing, 4, 0, "objects 2 handlers 2 factories 2 coercions 3 blocks 5 "},
      {"shut-down", &T::ShutDown, Hears::kNothing, 6, 0, "objects 2 handlers 2 blocks 2 "}};
  for (const auto& phase : phases) SweepPhase(phase);
}

}  // namespace
