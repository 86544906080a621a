#include "kolvane/lib/KolvaneDictionary.h"

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/DictionaryTable.h"

KolvaneDictionary::KolvaneDictionary() : table(std::make_unique<DictionaryTable>()) {}

KolvaneDictionary::~KolvaneDictionary() = default;

void KolvaneDictionary::Load(std::span<const uint8_t> image) {
  tovali_private::MemoryInput input(image);
  table->Load(input);
}

const LoadStatus& KolvaneDictionary::LastLoad() {
  return table->LastLoad();
}

void KolvaneDictionary::MakeDefault() noexcept {
  table->MakeDefault();
}

TranslatedString KolvaneDictionary::Translate(const char* text, const int* selector) {
  return table->Translate(text, selector);
}
