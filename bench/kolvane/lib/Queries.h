// Queries to a dictionary, laid out in memory in the order of the first pass.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "bench/kolvane/lib/KeySet.h"

struct Query {
  const char* text;  // `$$$/Key=Default text`
  const char* key;   // `/Key`, terminated
  uint32_t keyLength;
  uint32_t defaultLength;
  uint32_t number;  // of the key; missing keys are numbered after the others

  std::string_view Key() const { return {key, keyLength}; }
  uint32_t TextLength() const { return 3 + keyLength + 1 + defaultLength; }
  std::string_view DefaultText() const { return {text + 3 + keyLength + 1, defaultLength}; }
};

class Queries {
 public:
  Queries(const PackedTexts<char>& keys, const PackedTexts<char>& defaultTexts, size_t firstNumber);

  // Every key once, in random order.
  std::span<const Query> Once() const { return {queries.data(), keyCount}; }

  // At least kLeast queries, every key equally often, each pass in another random order: too many
  // for a branch predictor to learn.
  std::span<const Query> Many() const { return queries; }

 private:
  static constexpr size_t kLeast = 100'000;

  size_t keyCount;
  std::vector<char> texts;
  std::vector<char> bareKeys;
  std::vector<Query> queries;
};
