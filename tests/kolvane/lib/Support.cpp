#include "Support.h"

#include <boost/interprocess/streams/bufferstream.hpp>
#include <memory>

#include "DictionaryWriter.h"

namespace {

template <class Integer>
void Put(std::string& image, Integer value) {
  for (size_t i = 0; i < sizeof value; ++i) {
    image += static_cast<char>(static_cast<uint64_t>(value) >> (8 * i));
  }
}

uint32_t Size(const std::string& text) {
  return static_cast<uint32_t>(text.size());
}

std::string Header(char minor, int encoding) {
  return std::string("Kolvane Binary Format\x01") + minor + static_cast<char>(encoding);
}

}  // namespace

std::string Bytes(const std::u16string& text) {
  std::string bytes;
  for (const char16_t unit : text) Put(bytes, static_cast<uint16_t>(unit));
  return bytes;
}

std::string LittleEndianImage(const std::u16string& text) {
  return Bytes(u'\uFEFF' + text);
}

std::string BigEndianImage(const std::u16string& text) {
  std::string image = LittleEndianImage(text);
  for (size_t i = 0; i < image.size(); i += 2) std::swap(image[i], image[i + 1]);
  return image;
}

std::vector<uint16_t> Units(const std::u16string& text) {
  return {text.begin(), text.end()};
}

std::u16string Text(const KolvaneString& string) {
  return {string.Data(), string.Data() + string.Length()};
}

std::string Image1_5(int encoding, const std::vector<ImageGroup>& groups) {
  std::string counts, lengths, buckets, data;
  uint32_t count = 0;
  for (const ImageGroup& group : groups) {
    count += 2 * static_cast<uint32_t>(group.entries.size());
    Put(counts, count);
    Put(buckets, group.bucket);
    for (const auto& [key, value] : group.entries) {
      Put(lengths, Size(key));
      Put(lengths, Size(value));
      data += key + value;
    }
  }
  std::string image = Header(5, encoding);
  Put(image, static_cast<uint32_t>(groups.size()));
  return image + counts + lengths + buckets + data;
}

std::string Image1_0(int encoding, const std::vector<ImageGroup>& groups) {
  std::string image = Header(0, encoding);
  Put(image, static_cast<uint16_t>(groups.size() + 1));
  const uint32_t dataAt = Size(image) + 6 * static_cast<uint32_t>(groups.size() + 1);
  std::string data;
  for (const ImageGroup& group : groups) {
    Put(image, group.bucket);
    Put(image, dataAt + Size(data));
    for (const auto& [key, value] : group.entries) {
      Put(data, Size(key));
      data += key;
      Put(data, Size(value));
      data += value;
    }
  }
  Put(image, uint16_t{0});
  Put(image, dataAt + Size(data));
  return image + data;
}

std::vector<ImageGroup> Grouped(const std::vector<std::pair<std::string, std::string>>& entries) {
  std::vector<ImageGroup> groups;
  for (const auto& entry : entries) {
    groups.push_back({static_cast<uint16_t>(BucketOf(entry.first)), {entry}});
  }
  return groups;
}

uint32_t BucketOf(const std::string& key) {
  return tovali_private::ByteRunKey(reinterpret_cast<const uint8_t*>(key.data()), Size(key), false).Hash(DictionaryTable::kBucketCount);
}

void Load(DictionaryTable& table, const std::string& image) {
  const auto block = std::make_unique<char[]>(image.size());
  image.copy(block.get(), image.size());
  boost::interprocess::ibufferstream stream(block.get(), image.size());
  table.Load(stream);
}

Contents ContentsOf(DictionaryTable& table) {
  Contents contents;
  for (uint32_t bucket = 0; bucket < DictionaryTable::kBucketCount; ++bucket) {
    for (auto item = table.Bucket(bucket); item != nullptr; item = item->next) {
      const auto& entry = static_cast<const tovali_private::DictionaryEntry&>(*item);
      const auto key = entry.Bytes();
      contents.emplace_back(bucket, std::string(key.begin(), key.end()), Text(entry.Value()));
    }
  }
  return contents;
}

Answers AnswersOf(DictionaryTable& table) {
  Answers answers;
  for (const tovali_private::DictionaryEntry* entry : tovali_private::FoundEntries(table)) {
    answers[{entry->Bytes().begin(), entry->Bytes().end()}] = Text(entry->Value());
  }
  return answers;
}

std::u16string Translated(DictionaryTable& table, const char* text, int selector) {
  const TranslatedString translated = table.Translate(text, &selector);
  std::vector<uint16_t> units(translated.BufferSize());
  translated.CopyTo(units.data(), translated.BufferSize(), true);
  return {units.begin(), units.end() - 1};
}
