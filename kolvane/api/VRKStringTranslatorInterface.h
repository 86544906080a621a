// The interface of translators, which turn keys with default texts into localised text.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace Varnel {

// Implemented by the plug-in's translator, and by the client of a translator object in the kernel.
// Nothing is synchronised. Throws: exceptions that depend on the implementation.
class StringTranslatorInterface {
 public:
  // Makes this the process-wide default translator, which supplies the translations that other
  // translators lack and serves requests that name no translator.
  virtual void MakeDefault() = 0;

  // Adds the entries of an image, the complete contents of a dictionary file. A later definition of
  // a key replaces an earlier one. A damaged image adds the entries before the damage and is no
  // failure. The buffer is borrowed for the call.
  //
  // The units overload behaves the same in every implementation: it takes the bytes of any image,
  // two in each unit, in memory's byte order. PackTranslationImage (VRKTranslationImage.h) makes
  // them.
  //
  // The bytes overload depends on the implementation. A client sends the bytes as UTF-8 text. The
  // plug-in's translator takes them as the image; with a count of 0 and a pointer that is not null
  // it reads up to the first 0 byte. A null pointer requires a count of 0.
  virtual void SetTranslations(const char* bytes, uint32_t byteCount) = 0;
  virtual void SetTranslations(const uint16_t* units, uint32_t unitCount) = 0;

  // Replaces `result` by the translation of a UTF-8 key such as $$$/Dialog/Ok=OK, followed by one 0
  // unit. `keyLength` is the length in bytes, with or without the terminating NUL. `result` is
  // unchanged if it throws.
  virtual void TranslateString(const char* key, uint32_t keyLength,
                               std::vector<uint16_t>& result) = 0;

  virtual ~StringTranslatorInterface() = default;
};

// Appends a NUL to a key that does not end in one; an empty key stays empty. The plug-in's
// translator ignores `keyLength` and reads up to the NUL, so the code that calls it passes its key
// through this.
inline std::string WithTerminator(std::string key) {
  if (!key.empty() && key.back() != '\0') key.push_back('\0');
  return key;
}

}  // namespace Varnel
