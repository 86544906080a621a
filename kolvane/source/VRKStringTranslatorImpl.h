// The translator that owns a dictionary.
#pragma once

#include <boost/shared_ptr.hpp>
#include <boost/smart_ptr/enable_shared_from_this.hpp>

#include "kolvane/api/VRKStringTranslatorInterface.h"
#include "kolvane/lib/KolvaneDictionary.h"
#include "wrapper-framework/source/Values.h"

namespace Varnel::LocalizableStrings {

// Translates with its own dictionary. Requires: owned by a boost::shared_ptr, as from
// CreateStringTranslatorImpl, because the default translator is tracked by a weak pointer.
// Throws: std::bad_alloc, and OVErrException if a text is too long to be converted.
class StringTranslatorImpl final : public StringTranslatorInterface,
                                   public boost::enable_shared_from_this<StringTranslatorImpl> {
 public:
  // Also makes the dictionary the process default dictionary.
  void MakeDefault() noexcept override;

  // Loads the bytes as an image. A count of 0 with a pointer that is not null means all bytes up to
  // the first 0. Throws: InvariantViolation for more than 2^31 - 1 bytes; nothing is loaded then.
  void SetTranslations(const char* bytes, uint32_t byteCount) override;
  void SetTranslations(const uint16_t* units, uint32_t unitCount) override;

  // Reads the key up to its NUL and ignores `keyLength`. A null key is an empty one.
  void TranslateString(const char* key, uint32_t keyLength, std::vector<uint16_t>& result) override;

 private:
  KolvaneDictionary dictionary;
};

// Returns a new translator without translations. `parameters` are ignored.
boost::shared_ptr<StringTranslatorInterface> CreateStringTranslatorImpl(
    orvane::dictionary_t const& parameters);

}  // namespace Varnel::LocalizableStrings
