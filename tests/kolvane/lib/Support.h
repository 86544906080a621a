// Images to load, and a look into what became of them.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "kolvane/lib/DictionaryTable.h"

// A text image with its byte-order mark.
std::string LittleEndianImage(const std::u16string& text);
std::string BigEndianImage(const std::u16string& text);

std::string Little(uint64_t value, size_t size);  // its lowest bytes in little-endian order
std::string Bytes(const std::u16string& text);    // in that order, too
std::vector<uint16_t> Units(const std::u16string& text);
std::u16string Text(const KolvaneString& string);

struct ImageGroup {
  uint16_t bucket;
  std::vector<std::pair<std::string, std::string>> entries;  // keys and value bytes
};

// Binary images, laid out as they should be whatever the groups say.
std::string Image1_5(int encoding, const std::vector<ImageGroup>& groups);
std::string Image1_0(int encoding, const std::vector<ImageGroup>& groups);

// One group for each entry, in the bucket of its key.
std::vector<ImageGroup> Grouped(const std::vector<std::pair<std::string, std::string>>& entries);

tovali_private::ByteRunKey Key(const std::string& key);  // which borrows it
uint32_t BucketOf(const std::string& key);

// From a block that ends where the image ends.
void Load(DictionaryTable& table, const std::string& image);

// Every entry of a table: bucket, key and value, in the order of the chains.
using Contents = std::vector<std::tuple<uint32_t, std::string, std::u16string>>;
Contents ContentsOf(DictionaryTable& table);

// What lookups find: the value of each key.
using Answers = std::map<std::string, std::u16string>;
Answers AnswersOf(DictionaryTable& table);

std::u16string Translated(DictionaryTable& table, const char* text, int selector = 1);
