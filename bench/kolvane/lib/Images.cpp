#include "Images.h"

#include <fstream>
#include <vector>

#include "CodePage.h"
#include "DictionaryTable.h"
#include "Subjects.h"

namespace {

void AppendUnit(std::string& image, char16_t unit) {
  image += static_cast<char>(unit & 0xFF);
  image += static_cast<char>(unit >> 8);
}

void AppendUnits(std::string& image, std::u16string_view text) {
  for (const char16_t unit : text) AppendUnit(image, unit);
}

// As translators write it.
std::u16string Escaped(std::u16string_view value) {
  std::u16string escaped;
  for (const char16_t unit : value) {
    if (unit == u'"') {
      escaped += u"^Q";
      continue;
    }
    if (unit == u'^' || unit == u'\\') escaped += unit;
    escaped += unit;
  }
  return escaped;
}

std::u16string Line(const KeySet& set, size_t i) {
  const std::string_view key = set.keys[i];
  std::u16string line = u"\"$$$";
  line.append(key.begin(), key.end());
  return line + u'=' + Escaped(set.values[i]) + u"\"\n";
}

std::string UTF16Image(const KeySet& set) {
  std::string image = "\xFF\xFE";
  for (size_t i = 0; i < set.Size(); ++i) AppendUnits(image, Line(set, i));
  return image;
}

void AppendInCodePage(std::string& image, const std::u16string& line) {
  const auto* units = reinterpret_cast<const uint16_t*>(line.data());
  const int count = static_cast<int>(line.size());
  std::string bytes(line.size(), 0);  // in this code page a unit is a byte
  platform::WideCharToMultiByte(platform::kCodePageSystem, 0, units, count, bytes.data(), count);
  std::u16string back(line.size(), 0);
  platform::MultiByteToWideChar(platform::kCodePageSystem, 0, bytes.data(), count,
                                reinterpret_cast<uint16_t*>(back.data()), count);
  if (back != line) throw LeftOut("the code page lacks letters of its translations");
  image += bytes;
}

std::string CodePageImage(const KeySet& set) {
  std::string image;
  for (size_t i = 0; i < set.Size(); ++i) AppendInCodePage(image, Line(set, i));
  return image;
}

void AppendNumber(std::string& image, size_t number, int byteCount) {
  for (int i = 0; i < byteCount; ++i) image += static_cast<char>(number >> (8 * i) & 0xFF);
}

// The numbers of the entries, by bucket.
std::vector<std::vector<size_t>> Buckets(const KeySet& set) {
  std::vector<std::vector<size_t>> buckets(DictionaryTable::kBucketCount);
  for (size_t i = 0; i < set.Size(); ++i) {
    const std::string_view key = set.keys[i];
    const tovali_private::ByteRunKey run(reinterpret_cast<const uint8_t*>(key.data()),
                                         static_cast<uint32_t>(key.size()), false);
    buckets[run.Hash(DictionaryTable::kBucketCount)].push_back(i);
  }
  return buckets;
}

// The parts of a version 1.5 image, in its order (BinaryLoader.h).
struct BinaryParts {
  size_t groupCount = 0;
  size_t lengthCount = 0;
  std::string counts, lengths, buckets, entries;
};

void AppendEntry(BinaryParts& parts, std::string_view key, std::u16string_view value) {
  AppendNumber(parts.lengths, key.size(), 4);
  AppendNumber(parts.lengths, value.size() * 2, 4);
  parts.lengthCount += 2;
  parts.entries += key;
  AppendUnits(parts.entries, value);
}

std::string BinaryImage(const KeySet& set) {
  BinaryParts parts;
  const auto buckets = Buckets(set);
  for (size_t bucket = 0; bucket < buckets.size(); ++bucket) {
    if (buckets[bucket].empty()) continue;
    for (const size_t i : buckets[bucket]) AppendEntry(parts, set.keys[i], set.values[i]);
    AppendNumber(parts.counts, parts.lengthCount, 4);
    AppendNumber(parts.buckets, bucket, 2);
    ++parts.groupCount;
  }
  std::string image = "Kolvane Binary Format\1\5";
  AppendNumber(image, 0, 1);  // values in UTF-16
  AppendNumber(image, parts.groupCount, 4);
  return image + parts.counts + parts.lengths + parts.buckets + parts.entries;
}

struct ImageForm {
  const char* fileName;
  std::string (*write)(const KeySet& set);
};

constexpr ImageForm kForms[] = {
    {"utf16.image", UTF16Image}, {"code-page.image", CodePageImage}, {"binary.image", BinaryImage}};

}  // namespace

std::filesystem::path ImageFile(ImageKind kind, const KeySet& set,
                                const std::filesystem::path& folder) {
  const ImageForm& form = kForms[static_cast<size_t>(kind)];
  const auto path = folder / form.fileName;
  if (exists(path)) return path;
  const std::string image = form.write(set);
  std::ofstream stream(path, std::ios::binary);
  stream.exceptions(std::ios::failbit | std::ios::badbit);
  stream.write(image.data(), static_cast<std::streamsize>(image.size()));
  return path;
}

std::string ReadWholeFile(const std::filesystem::path& path) {
  std::string bytes(file_size(path), 0);
  std::ifstream stream(path, std::ios::binary);
  stream.exceptions(std::ios::failbit | std::ios::badbit);
  stream.read(bytes.data(), static_cast<std::streamsize>(bytes.size()));
  return bytes;
}
