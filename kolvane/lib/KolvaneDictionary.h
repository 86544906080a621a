// The dictionary of a program: loads dictionary images and translates keys.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <span>

#include "kolvane/lib/CodePageSelector.h"
#include "kolvane/lib/LoadStatus.h"
#include "kolvane/lib/TranslatedString.h"

class DictionaryTable;

// Maps keys to UTF-16 text. It is empty at first, and each load adds to it.
//
// Not synchronised, not even for lookups. All dictionaries of a process, and the TranslatedStrings
// from them, must be used by one thread at a time: they share the default dictionary and plain
// reference counts.
//
// Example:
//
//   KolvaneDictionary dictionary;
//   dictionary.Load(bytes);  // the contents of a dictionary file
//   const auto text = dictionary.Translate("$$$/Dialog/Cancel=Cancel", &kUTF8Selector);
//   std::vector<uint16_t> units(text.BufferSize());
//   text.CopyTo(units.data(), text.BufferSize(), true);
class KolvaneDictionary {
 public:
  KolvaneDictionary();
  KolvaneDictionary(const KolvaneDictionary&) = delete;
  KolvaneDictionary& operator=(const KolvaneDictionary&) = delete;

  // If this is the default dictionary, there is none afterwards. TranslatedStrings stay valid.
  ~KolvaneDictionary();

  // Adds the entries of an image, text or binary. A later definition of a key hides an earlier one.
  // Damage is no failure: the entries before it are added, and LastLoad reports it. Takes time and
  // memory linear in the image's size. Requires: a stream is at its start and can seek back there;
  // bytes are borrowed for the call. Throws: OVErrException if a conversion fails, std::bad_alloc;
  // entries that were added before stay.
  void Load(std::istream& image);
  void Load(std::span<const uint8_t> image);

  // Returns the result of the latest load, also of one that threw; valid until the next load.
  // Creates the pending entries of binary images to find their damage. Throws: std::bad_alloc.
  const LoadStatus& LastLoad();

  // Makes this the process-wide default dictionary, which supplies the keys that others lack. The
  // caller keeps ownership.
  void MakeDefault() noexcept;

  // Translates a NUL-terminated key string `$$$/Key=Default text`. Returns the first that exists
  // of: this dictionary's value, the default dictionary's value, the default text with its escapes
  // decoded. Otherwise, and for null, an empty text, and a text that begins with `$` or `$$` but
  // not
  // `$$$`, returns an empty text.
  //
  // Keys are compared as bytes. `selector` (CodePageSelector.h) selects the encoding of the default
  // text; with null or a pointer to 0, each of its bytes becomes the unit of the same value.
  //
  // O(1) expected. The first lookup in a bucket of a binary image also creates that bucket's
  // entries. Throws: OVErrException if the default text cannot be converted, std::bad_alloc.
  TranslatedString Translate(const char* text, const int* selector);

 private:
  std::unique_ptr<DictionaryTable> table;
};
