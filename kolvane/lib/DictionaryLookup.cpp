// Translating keys: own table, then default dictionary, then default text.
#include <algorithm>
#include <boost/container/small_vector.hpp>
#include <cstring>
#include <limits>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/OVErrException.h"
#include "kolvane/lib/TextSyntax.h"

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

// ASCII text is the same in every code page and needs no conversion.
bool IsASCII(std::span<const char> text) noexcept {
  uint8_t all = 0;
  for (const char byte : text) all |= static_cast<uint8_t>(byte);
  return all < 0x80;
}

KolvaneString DecodeDefaultText(std::span<const char> text, const int* selector) {
  constexpr size_t kMost = std::numeric_limits<int>::max();
  if (text.size() > kMost) throw OVErrException(kErrorConversionFailed);
  const bool isMultibyte = selector != nullptr && *selector != 0;
  if (isMultibyte && !IsASCII(text)) {
    UnicodeBuffer units;
    ConvertToUnicode(text.data(), text.size(), units, selector);
    return Unescape({units.Data(), units.Length()});
  }
  boost::container::small_vector<uint16_t, 256> units(text.size(), boost::container::default_init);
  std::transform(text.begin(), text.end(), units.begin(),
                 [](char byte) { return static_cast<uint8_t>(byte); });
  return Unescape(units);
}

}  // namespace

TranslatedString DictionaryTable::Translate(const char* text, const int* selector) {
  if (text == nullptr || *text == 0) return TranslatedString(KolvaneString());
  const auto split = SplitKolvane<char>({text, std::strlen(text)});
  if (!split) return TranslatedString(KolvaneString());
  const std::span<const uint8_t> key(reinterpret_cast<const uint8_t*>(split->key.data()),
                                     split->key.size());
  KeyedRun* found = FindRun(key);
  const bool fallsBack = defaultDictionary != nullptr && defaultDictionary != this;
  if (found == nullptr && fallsBack) found = defaultDictionary->FindRun(key);
  if (found != nullptr) return TranslatedString(*found);
  if (split->value.empty()) return TranslatedString(KolvaneString());
  return TranslatedString(DecodeDefaultText(split->value, selector));
}
