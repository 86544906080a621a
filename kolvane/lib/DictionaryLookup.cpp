// The road of a key through a dictionary.
#include <cstring>

#include "Converters.h"
#include "DictionaryTable.h"
#include "TextSyntax.h"

using tovali_private::ConvertToUnicode;
using tovali_private::SplitKolvane;
using tovali_private::Unescape;
using tovali_private::UnicodeBuffer;

DictionaryTable* DictionaryTable::defaultDictionary = nullptr;

void DictionaryTable::MakeDefault() noexcept {
  defaultDictionary = this;
}

TranslatedString DictionaryTable::Translate(const char* text, const int* selector) {
  if (text == nullptr || *text == 0) return TranslatedString(KolvaneString());
  return TranslatedString(Lookup({text, std::strlen(text)}, selector));
}

namespace {

KolvaneString DecodeDefaultText(std::span<const char> text, const int* selector) {
  UnicodeBuffer units;
  if (selector != nullptr && *selector != 0) {
    ConvertToUnicode(text.data(), text.size(), units, selector);
  } else {
    units.Reserve(text.size());
    for (const char byte : text) units.Append(static_cast<uint8_t>(byte));
  }
  return Unescape({units.Data(), units.Length()});
}

}  // namespace

KolvaneString DictionaryTable::Lookup(std::span<const char> text, const int* selector) {
  const auto split = SplitKolvane(text);
  if (!split) return {};
  const ByteRunKey key(reinterpret_cast<const uint8_t*>(split->key.data()),
                       static_cast<uint32_t>(split->key.size()), false);
  if (const DictionaryEntry* own = Find(key)) return own->Value();
  if (defaultDictionary != nullptr && defaultDictionary != this) {
    if (const DictionaryEntry* fallback = defaultDictionary->Find(key)) return fallback->Value();
  }
  if (split->value.empty()) return {};
  return DecodeDefaultText(split->value, selector);
}
