// Kolvane through the kernel and the plug-in, as hosts use it: by message and by coercion.
#include <stdexcept>

#include "bench/kolvane/lib/Images.h"
#include "bench/kolvane/lib/Subjects.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "kolvane/api/wrapper-framework/VRKTranslationImage.h"
#include "varnel-kernel/VarnelKernelHost.h"
#include "wrapper-framework/source/Data.h"

namespace {

void Require(VRKResult result) {
  if (result != kVRKNoError) throw std::runtime_error("the kernel failed");
}

void StartKernel() {
  static const bool started = [] {
    VRKPlugIn plugIn{};
    Require(VRKHostStart());
    Require(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn));
    Require(VRKHostPlugInInitialize(plugIn));
    return true;
  }();
  static_cast<void>(started);
}

template <class Derived>
class KernelSubject : public AskedSubject<Derived, uint16_t> {
 public:
  KernelSubject(const char* subjectName, std::string imageBytes)
      : AskedSubject<Derived, uint16_t>(subjectName), bytes(std::move(imageBytes)) {
    StartKernel();
  }

  void Load() override {
    const auto image =
        Varnel::PackTranslationImage(bytes.data(), static_cast<uint32_t>(bytes.size()));
    translator = Varnel::CreateStringTranslator();
    translator->SetTranslations(image.units.get(), image.unitCount);
  }

  void Unload() override { translator.reset(); }

 protected:
  boost::shared_ptr<Varnel::StringTranslatorInterface> translator;

 private:
  const std::string bytes;
};

class MessageSubject final : public KernelSubject<MessageSubject> {
 public:
  using KernelSubject::KernelSubject;

  void Ask(const Query& query, std::vector<uint16_t>& answer) {
    translator->TranslateString(query.text, query.TextLength(), answer);
    answer.pop_back();  // the terminator, as in CoercionSubject
  }
};

// The host keeps its keys as kernel data.
class CoercionSubject final : public KernelSubject<CoercionSubject> {
 public:
  CoercionSubject(const char* subjectName, std::string imageBytes, const KeySet& set)
      : KernelSubject(subjectName, std::move(imageBytes)) {
    for (size_t i = 0; i < set.Size(); ++i) AddKey(set.keys[i], set.defaultTexts[i]);
    for (size_t i = 0; i < set.missingKeys.Count(); ++i) {
      AddKey(set.missingKeys[i], set.missingDefaults[i]);
    }
  }

  void Load() override {
    KernelSubject::Load();
    translator->MakeDefault();
  }

  void Ask(const Query& query, std::vector<uint16_t>& answer) {
    Varnel::GetUTF16LE(keys[query.number], answer);
    answer.pop_back();
  }

 private:
  void AddKey(std::string_view key, std::string_view defaultText) {
    const std::string text = "$$$" + std::string(key) + '=' + std::string(defaultText);
    keys.push_back(Varnel::MakeData(Varnel::kTypeLocaleIndependentUTF8, text.data(),
                                    static_cast<uint32_t>(text.size())));
  }

  std::vector<Varnel::DataRef> keys;
};

// Only one size: the overhead does not depend on the dictionary.
bool IsMeasured(const KeySet& set) {
  return set.name == "mixed-paths" && set.Size() <= 1000;
}

std::string Image(const KeySet& set, const std::filesystem::path& folder) {
  return ReadWholeFile(ImageFile(ImageKind::kUTF16, set, folder));
}

}  // namespace

std::unique_ptr<Subject> MakeMessage(const KeySet& set, const std::filesystem::path& folder) {
  if (!IsMeasured(set)) return nullptr;
  return std::make_unique<MessageSubject>("kernel-message", Image(set, folder));
}

std::unique_ptr<Subject> MakeCoercion(const KeySet& set, const std::filesystem::path& folder) {
  if (!IsMeasured(set)) return nullptr;
  return std::make_unique<CoercionSubject>("kernel-coercion", Image(set, folder), set);
}
