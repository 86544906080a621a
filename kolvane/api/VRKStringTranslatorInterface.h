// Translators: what turns keys with their default texts into localised text.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace Varnel {

// A translator is in the same process, or a kernel object behind a client. Failures are exceptions;
// what they are depends on the translator. Nothing here is synchronised.
class StringTranslatorInterface {
 public:
  // Becomes the default translator: the one whose translations stand in where another translator
  // has none, and which translates what is not sent to any translator in particular.
  virtual void MakeDefault() = 0;

  // Adds the entries of an image, the complete contents of a dictionary file, to those it has; a
  // later translation of a name wins. A damaged image adds the entries before the damage, and is no
  // failure. What the pointer points at is read during the call only. Of an image without bytes the
  // pointer is null: with a count of 0 and a pointer that is not null, a translator in the same
  // process reads up to the first 0 byte.
  //
  // How bytes are taken is up to the translator: one in the same process takes an image as it is, a
  // client takes text in UTF-8. Units, in memory's byte order, hold the image's bytes two by two.
  // VRKTranslationImage.h makes units of any image.
  virtual void SetTranslations(const char* bytes, uint32_t byteCount) = 0;
  virtual void SetTranslations(const uint16_t* units, uint32_t unitCount) = 0;

  // Replaces `result` by the translation of a key such as $$$/Dialog/Ok=OK, in UTF-8, followed by
  // one 0 unit; when it throws, `result` is as it was. `keyLength` is the key's length in bytes,
  // with or without its terminating NUL.
  virtual void TranslateString(const char* key, uint32_t keyLength,
                               std::vector<uint16_t>& result) = 0;

  virtual ~StringTranslatorInterface() = default;
};

// A key in the form in which those who serve others hand it to TranslateString: with a terminating
// NUL, which its length counts, unless it is empty.
inline std::string Terminated(std::string key) {
  if (!key.empty() && key.back() != '\0') key.push_back('\0');
  return key;
}

}  // namespace Varnel
