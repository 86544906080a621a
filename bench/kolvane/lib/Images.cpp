#include "bench/kolvane/lib/Images.h"

#include <boost/interprocess/streams/bufferstream.hpp>
#include <fstream>
#include <sstream>
#include <stdexcept>

#include "bench/kolvane/lib/Subjects.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "platform/CodePage.h"

namespace {

void AppendUnit(std::string& image, char16_t unit) {
  image += static_cast<char>(unit & 0xFF);
  image += static_cast<char>(unit >> 8);
}

void AppendUnits(std::string& image, std::u16string_view text) {
  for (const char16_t unit : text) AppendUnit(image, unit);
}

// The text form of a definition.
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

std::string BinaryImage(const KeySet& set) {
  const std::string text = UTF16Image(set);
  boost::interprocess::ibufferstream stream(text.data(), text.size());
  DictionaryTable table;
  table.Load(stream);
  std::ostringstream image;
  image.exceptions(std::ios::badbit);
  if (!WriteBinary(table, tovali_private::BinaryVersion::k1_5, TextEncoding::kUTF16LE, image)
           .empty()) {
    throw std::logic_error("UTF-16 carries every value");
  }
  return image.str();
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
