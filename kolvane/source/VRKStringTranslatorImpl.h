// The translator that does the work.
#pragma once

#include <boost/shared_ptr.hpp>
#include <boost/smart_ptr/enable_shared_from_this.hpp>

#include "KolvaneDictionary.h"
#include "VRKStringTranslatorInterface.h"
#include "Values.h"

namespace Varnel::LocalizableStrings {

// Translates with a dictionary of its own. It is to be owned by a shared pointer, as one that
// CreateStringTranslatorImpl makes: from that others tell whether the default translator is alive.
// Besides what is said below, throws std::bad_alloc, and OVErrException where a text is too long to
// be converted.
class StringTranslatorImpl final : public StringTranslatorInterface,
                                   public boost::enable_shared_from_this<StringTranslatorImpl> {
 public:
  // Makes the dictionary the default dictionary, too.
  void MakeDefault() noexcept override;

  // Takes the bytes as an image, which is read where it lies. A count of 0 with bytes that are not
  // null stands for all bytes up to the first 0. More than 2^31 - 1 bytes are an
  // InvariantViolation, and nothing is loaded.
  void SetTranslations(const char* bytes, uint32_t byteCount) override;
  void SetTranslations(const uint16_t* units, uint32_t unitCount) override;

  // The key is read up to its NUL, whatever its length; a null key is an empty one.
  void TranslateString(const char* key, uint32_t keyLength, std::vector<uint16_t>& result) override;

 private:
  KolvaneDictionary dictionary;
};

// A new translator without translations, whatever the parameters.
boost::shared_ptr<StringTranslatorInterface> CreateStringTranslatorImpl(
    orvane::dictionary_t const& parameters);

}  // namespace Varnel::LocalizableStrings
