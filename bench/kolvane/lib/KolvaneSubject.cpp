// The dictionary library, with each kind of image.
#include <boost/interprocess/streams/bufferstream.hpp>

#include "bench/kolvane/lib/Images.h"
#include "bench/kolvane/lib/Subjects.h"
#include "kolvane/lib/KolvaneDictionary.h"
#include "kolvane/lib/TranslatedString.h"

namespace {

class KolvaneSubject final : public AskedSubject<KolvaneSubject, uint16_t> {
 public:
  KolvaneSubject(const char* subjectName, std::string imageBytes)
      : AskedSubject(subjectName), image(std::move(imageBytes)) {}

  void Load() override {
    boost::interprocess::ibufferstream stream(image.data(), image.size());
    dictionary = std::make_unique<KolvaneDictionary>();
    dictionary->Load(stream);
  }

  void Unload() override { dictionary.reset(); }

  void Ask(const Query& query, std::vector<uint16_t>& answer) {
    constexpr int kUTF8 = 1;
    const TranslatedString translated = dictionary->Translate(query.text, &kUTF8);
    answer.resize(translated.BufferSize());
    translated.CopyTo(answer.data(), translated.BufferSize(), true);
    answer.pop_back();  // the terminator
  }

 private:
  std::string image;
  std::unique_ptr<KolvaneDictionary> dictionary;
};

std::unique_ptr<Subject> Make(const char* name, ImageKind kind, const KeySet& set,
                              const std::filesystem::path& folder) {
  return std::make_unique<KolvaneSubject>(name, ReadWholeFile(ImageFile(kind, set, folder)));
}

}  // namespace

std::unique_ptr<Subject> MakeKolvaneUTF16(const KeySet& set, const std::filesystem::path& folder) {
  return Make("kolvane-utf16", ImageKind::kUTF16, set, folder);
}

std::unique_ptr<Subject> MakeKolvaneCodePage(const KeySet& set,
                                             const std::filesystem::path& folder) {
  return Make("kolvane-code-page", ImageKind::kCodePage, set, folder);
}

std::unique_ptr<Subject> MakeKolvaneBinary(const KeySet& set, const std::filesystem::path& folder) {
  return Make("kolvane-binary", ImageKind::kBinary, set, folder);
}
