// Translator objects of the kernel, used like translators.
#pragma once

#include <boost/shared_ptr.hpp>

#include "Holders.h"
#include "VRKStringTranslatorInterface.h"

namespace Varnel {

// Turns each operation into a message to a translator object, to which it holds a reference; copies
// hold one each. Throws the kernel's failures, and those of whatever serves the object, as
// Exception; what it made for the message is released. When the object takes no such message
// nothing happens, but that TranslateString misses the result and throws the kernel's code for
// that.
class StringTranslatorClient : public StringTranslatorInterface {
 public:
  StringTranslatorClient() = default;  // has no object; messages go to the null object

  // Takes a reference of its own, and releases the one it had; keeps that when it throws.
  void SetObject(const ObjectRef& newObject) { object = newObject; }

  void MakeDefault() override;

  // The bytes are sent as UTF-8 text, which the kernel turns into UTF-16. Use the units for an
  // image that may be anything else; see VRKTranslationImage.h.
  void SetTranslations(const char* bytes, uint32_t byteCount) override;
  void SetTranslations(const uint16_t* units, uint32_t unitCount) override;

  void TranslateString(const char* key, uint32_t keyLength, std::vector<uint16_t>& result) override;

 private:
  ObjectRef object;
};

// A client of a new translator object, which has a translator of its own.
boost::shared_ptr<StringTranslatorInterface> CreateStringTranslator();

}  // namespace Varnel
