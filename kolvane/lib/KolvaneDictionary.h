// A dictionary as its users hold it.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <span>

#include "kolvane/lib/LoadStatus.h"
#include "kolvane/lib/TranslatedString.h"

class DictionaryTable;

// Owns one DictionaryTable, empty at first, and forwards to it; DictionaryTable.h is the contract
// of each operation.
class KolvaneDictionary {
 public:
  KolvaneDictionary();
  KolvaneDictionary(const KolvaneDictionary&) = delete;
  KolvaneDictionary& operator=(const KolvaneDictionary&) = delete;
  ~KolvaneDictionary();

  void Load(std::istream& image);
  void Load(std::span<const uint8_t> image);
  const LoadStatus& LastLoad();
  void MakeDefault() noexcept;
  TranslatedString Translate(const char* text, const int* selector);

 private:
  std::unique_ptr<DictionaryTable> table;
};
