#include "tests/kolvane/lib/Support.h"

#include <boost/interprocess/streams/bufferstream.hpp>
#include <memory>

#include "kolvane/lib/DictionaryWriter.h"

namespace {

std::string Header(char minor, int encoding) {
  return std::string("Kolvane Binary Format\x01") + minor + static_cast<char>(encoding);
}

}  // namespace

std::string Little(uint64_t value, size_t size) {
  std::string bytes;
  for (size_t i = 0; i < size; ++i) bytes += static_cast<char>(value >> (8 * i));
  return bytes;
}

std::string Bytes(const std::u16string& text) {
  std::string bytes;
  for (const char16_t unit : text) bytes += Little(unit, 2);
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
    counts += Little(count, 4);
    buckets += Little(group.bucket, 2);
    for (const auto& [key, value] : group.entries) {
      lengths += Little(key.size(), 4) + Little(value.size(), 4);
      data += key + value;
    }
  }
  return Header(5, encoding) + Little(groups.size(), 4) + counts + lengths + buckets + data;
}

std::string Image1_0(int encoding, const std::vector<ImageGroup>& groups) {
  std::string image = Header(0, encoding) + Little(groups.size() + 1, 2);
  const size_t dataAt = image.size() + 6 * (groups.size() + 1);
  std::string data;
  for (const ImageGroup& group : groups) {
    image += Little(group.bucket, 2) + Little(dataAt + data.size(), 4);
    for (const auto& [key, value] : group.entries) {
      data += Little(key.size(), 4) + key + Little(value.size(), 4) + value;
    }
  }
  return image + Little(0, 2) + Little(dataAt + data.size(), 4) + data;
}

tovali_private::ByteRunKey Key(const std::string& key) {
  return {reinterpret_cast<const uint8_t*>(key.data()), static_cast<uint32_t>(key.size()), false};
}

std::vector<ImageGroup> Grouped(const std::vector<std::pair<std::string, std::string>>& entries) {
  std::vector<ImageGroup> groups;
  for (const auto& entry : entries) {
    groups.push_back({static_cast<uint16_t>(BucketOf(entry.first)), {entry}});
  }
  return groups;
}

uint32_t BucketOf(const std::string& key) {
  return Key(key).Hash(DictionaryTable::kBucketCount);
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
