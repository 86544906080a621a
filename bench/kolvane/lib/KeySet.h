// The test data: keys in a dictionary, missing keys, and translations.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "bench/kolvane/lib/PackedTexts.h"

struct KeySet {
  std::string name;
  PackedTexts<char> keys;             // `/Path/Of/Key`, all different
  PackedTexts<char16_t> values;       // one for each key
  PackedTexts<char> valuesInUTF8;     // the same
  PackedTexts<char> missingKeys;      // of the same form, none of them in `keys`
  PackedTexts<char> defaultTexts;     // ASCII without escapes, one for each key
  PackedTexts<char> missingDefaults;  // one for each missing key

  size_t Size() const { return keys.Count(); }
};

const std::vector<std::string>& KeySetNames();

// Returns the same set in every run and on every machine. `iso-codes` has a fixed size and ignores
// `size`; it is empty if the package is not installed.
KeySet MakeKeySet(const std::string& name, size_t size);

// Builds a set; for MakeKeySet and IsoCodes.cpp.
void AddEntry(KeySet& set, std::string_view key, std::string_view valueInUTF8);
void AddIsoCodes(KeySet& set);
