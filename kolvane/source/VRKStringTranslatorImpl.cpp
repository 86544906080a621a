#include "kolvane/source/VRKStringTranslatorImpl.h"

#include <cstring>

#include "kolvane/lib/CodePageSelector.h"
#include "kolvane/lib/TranslatedString.h"
#include "kolvane/source/VRKDefaultStringTranslator.h"
#include "wrapper-framework/source/Exceptions.h"

namespace Varnel::LocalizableStrings {
namespace {

// Images are whole units; bytes may be one more.
constexpr uint32_t kMostBytes = kMostImageBytes + 1;

}  // namespace

void StringTranslatorImpl::MakeDefault() noexcept {
  dictionary.MakeDefault();
  gDefaultStringTranslator = weak_from_this();
}

void StringTranslatorImpl::SetTranslations(const char* bytes, uint32_t byteCount) {
  if (byteCount > kMostBytes) throw InvariantViolation();
  const bool endsAtZero = byteCount == 0 && bytes != nullptr;
  const size_t size = endsAtZero ? std::strlen(bytes) : byteCount;
  dictionary.Load(std::span(reinterpret_cast<const uint8_t*>(bytes), size));
}

void StringTranslatorImpl::SetTranslations(const uint16_t* units, uint32_t unitCount) {
  if (unitCount > kMostImageBytes / 2) throw InvariantViolation();
  SetTranslations(reinterpret_cast<const char*>(units), unitCount * 2);
}

void StringTranslatorImpl::TranslateString(const char* key, uint32_t,
                                           std::vector<uint16_t>& result) {
  const TranslatedString translation = dictionary.Translate(key, &kUTF8Selector);
  const uint32_t size = translation.BufferSize();
  result.resize(size);
  translation.CopyTo(result.data(), size, true);
}

boost::shared_ptr<StringTranslatorInterface> CreateStringTranslatorImpl(
    orvane::dictionary_t const&) {
  return boost::shared_ptr<StringTranslatorInterface>(new StringTranslatorImpl);
}

}  // namespace Varnel::LocalizableStrings
