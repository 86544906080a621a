// The road of a key through a dictionary.
#include <cstring>

#include "Converters.h"
#include "DictionaryTable.h"
#include "TextSyntax.h"

using tovali_private::ConvertToUnicode;
using tovali_private::KeyedRun;
using tovali_private::SplitKolvane;
using tovali_private::Unescape;
using tovali_private::UnicodeBuffer;

DictionaryTable* DictionaryTable::defaultDictionary = nullptr;

void DictionaryTable::MakeDefault() noexcept {
  defaultDictionary = this;
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

TranslatedString DictionaryTable::Translate(const char* text, const int* selector) {
  if (text == nullptr || *text == 0) return TranslatedString(KolvaneString());
  const auto split = SplitKolvane<char>({text, std::strlen(text)});
  if (!split) return TranslatedString(KolvaneString());
  const ByteRunKey key(reinterpret_cast<const uint8_t*>(split->key.data()),
                       static_cast<uint32_t>(split->key.size()), false);
  KeyedRun* found = FindRun(key);
  const bool fallsBack = defaultDictionary != nullptr && defaultDictionary != this;
  if (found == nullptr && fallsBack) found = defaultDictionary->FindRun(key);
  if (found != nullptr) return TranslatedString(KolvaneString(*found));
  if (split->value.empty()) return TranslatedString(KolvaneString());
  return TranslatedString(DecodeDefaultText(split->value, selector));
}
