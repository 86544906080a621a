// The client of a translator object in the kernel.
#pragma once

#include <boost/shared_ptr.hpp>

#include "kolvane/api/VRKStringTranslatorInterface.h"
#include "wrapper-framework/source/KernelRefs.h"

namespace Varnel {

// Sends each operation as a message to its translator object. Each copy of a client holds its own
// reference to the object. If no handler takes the message, MakeDefault and SetTranslations do
// nothing, and TranslateString throws Exception with kVRKNotFound.
//
// Throws: Exception with the kernel's code, or that of the object's handler.
//
// Example:
//
//   const auto translator = Varnel::CreateStringTranslator();
//   translator->SetTranslations(image.units.get(), image.unitCount);
//   translator->TranslateString(key.data(), keyLength, result);
class StringTranslatorClient : public StringTranslatorInterface {
 public:
  StringTranslatorClient() = default;  // without an object: messages fail with kVRKInvalidHandle

  // Replaces the object. Keeps the old one if it throws.
  void SetObject(const ObjectRef& newObject) { object = newObject; }

  void MakeDefault() override;

  // Bytes are sent as UTF-8 text, which the kernel converts to UTF-16. For any other image use
  // units (VRKTranslationImage.h).
  void SetTranslations(const char* bytes, uint32_t byteCount) override;
  void SetTranslations(const uint16_t* units, uint32_t unitCount) override;

  void TranslateString(const char* key, uint32_t keyLength, std::vector<uint16_t>& result) override;

 private:
  ObjectRef object;
};

// Creates an object of class kClassStringTranslator and returns a client that holds it; never null.
// Throws: Exception with kVRKNotFound if the plug-in is not initialised, std::bad_alloc.
boost::shared_ptr<StringTranslatorInterface> CreateStringTranslator();

}  // namespace Varnel
