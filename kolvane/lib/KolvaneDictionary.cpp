#include "KolvaneDictionary.h"

#include "DictionaryTable.h"

KolvaneDictionary::KolvaneDictionary() : table(std::make_unique<DictionaryTable>()) {}

KolvaneDictionary::~KolvaneDictionary() = default;

void KolvaneDictionary::Load(std::istream& image) {
  table->Load(image);
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
