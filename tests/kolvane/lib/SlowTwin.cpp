#include "tests/kolvane/lib/SlowTwin.h"

#include "kolvane/lib/NamedCharacters.h"
#include "platform/CodePage.h"

namespace {

std::u16string Converted(const std::string& bytes, bool utf8) {
  if (bytes.empty()) return {};
  const uint32_t codePage = utf8 ? platform::kCodePageUTF8 : platform::kCodePageSystem;
  std::vector<uint16_t> units(bytes.size());
  const auto count = static_cast<int>(bytes.size());
  const int size = platform::MultiByteToWideChar(codePage, 0, bytes.data(), count, units.data(), count);
  return {units.begin(), units.begin() + size};
}

uint32_t Number(const std::string& image, size_t at, size_t size) {
  uint32_t number = 0;
  while (size-- > 0) number = number << 8 | static_cast<unsigned char>(image[at + size]);
  return number;
}

// Collects lines as the readers do: `separators` end them, a zero ends them too, and everything
// where the line is empty.
template <class String, class Store>
void ForEachLine(const String& text, const String& separators, const Store& store) {
  String line;
  for (const auto unit : text) {
    const bool zero = unit == 0;
    if (zero && line.empty()) return;
    if (!zero && separators.find(unit) == String::npos) {
      line += unit;
      continue;
    }
    if (!line.empty()) store(line);
    line.clear();
  }
  if (!line.empty()) store(line);
}

}  // namespace

void SlowTwin::Load(const std::string& image) {
  const bool little = image.starts_with("\xFF\xFE");
  const bool big = image.starts_with("\xFE\xFF");
  const std::string tested = image.substr(little || big ? 2 : 0, 21);
  if (tested.size() < 21) return;
  if (tested == "Kolvane Binary Format") return LoadBinary(image);
  if (little || big) return LoadUTF16(image, big);
  LoadCodePage(image);
}

void SlowTwin::LoadUTF16(const std::string& image, bool swapped) {
  const std::string whole = image.size() % 2 == 0 ? image : image + '\0';
  std::u16string text;
  for (size_t at = 0; at < whole.size(); at += 2) {
    const uint32_t unit = Number(whole, at, 2);
    text += static_cast<char16_t>(swapped ? unit << 8 | unit >> 8 : unit);
  }
  ForEachLine(text, std::u16string(u"\n\r\u2028\u2029"), [this](const auto& line) { StoreLine(line); });
}

void SlowTwin::LoadCodePage(const std::string& image) {
  ForEachLine(image, std::string("\n\r"), [this](const auto& line) { StoreLine(Converted(line, false)); });
}

void SlowTwin::StoreLine(const std::u16string& line) {
  const auto quote = [&](size_t from) {
    size_t at = line.find(u'"', from);
    while (at != line.npos && at > 0 && line[at - 1] == u'\\') at = line.find(u'"', at + 1);
    return at;
  };
  std::u16string text = line;
  if (const size_t open = quote(0); open != line.npos) {
    text = line.substr(open + 1, quote(open + 1) - open - 1);
  }
  if (text.starts_with(u"$$$")) {
    text.erase(0, 3);
  } else if (text.starts_with(u"$")) {
    return;
  }
  const size_t equals = text.find(u'=');
  std::string key;
  for (const char16_t unit : text.substr(0, equals)) key += static_cast<char>(unit);
  auto& bucket = buckets[BucketOf(key)];
  for (size_t i = 0; i < bucket.size(); ++i) {
    if (bucket[i].first != key) continue;
    bucket.erase(bucket.begin() + static_cast<std::ptrdiff_t>(i));
    break;
  }
  const std::u16string value = equals == text.npos ? u"" : text.substr(equals + 1);
  bucket.insert(bucket.begin(), {key, Decode(value)});
}

std::u16string SlowTwin::Decode(const std::u16string& value) {
  static const std::map<std::u16string, char16_t> kEscapes = {
      {u"^Q", u'"'},   {u"^[", u'“'},   {u"^]", u'”'},   {u"^{", u'‘'},   {u"^}", u'’'},   {u"^C", u'©'}, {u"^R", u'®'},   {u"^T", u'™'},
      {u"^D", u'°'},   {u"^B", u'•'},   {u"^#", u'⌘'},   {u"^!", u'¬'},   {u"^I", u'∆'},   {u"^S", u'∑'}, {u"^n", u'\n'},  {u"^r", u'\r'},
      {u"\\\"", u'"'}, {u"\\n", u'\n'}, {u"\\r", u'\r'}, {u"\\t", u'\t'}, {u"\\b", u'\b'}, {u"^^", u'^'}, {u"\\\\", u'\\'}};
  std::u16string text;
  for (size_t i = 0; i < value.size(); ++i) {
    const bool escape = (value[i] == u'^' || value[i] == u'\\') && i + 1 < value.size();
    if (!escape) {
      text += value[i];
      continue;
    }
    const auto found = kEscapes.find(value.substr(i, 2));
    text += found != kEscapes.end() ? std::u16string(1, found->second) : value.substr(i, 2);
    ++i;
  }
  for (size_t at = text.find(u"#{"); at != text.npos; at = text.find(u"#{", at)) {
    const size_t end = text.find(u'}', at);
    const std::u16string name = end == text.npos ? u"" : text.substr(at + 2, end - at - 2);
    size_t length = 1;
    for (const auto& named : tovali_private::NamedCharacters()) {
      if (std::u16string(named.name.begin(), named.name.end()) != name) continue;
      const auto units = named.Units();
      text.replace(at, name.size() + 3, std::u16string(units.begin(), units.end()));
      length = units.size();
    }
    at += length;
  }
  return text;
}

void SlowTwin::LoadBinary(const std::string& image) {
  size_t at = 21;
  bool whole = true;
  const auto has = [&](uint64_t count) { return whole = whole && count <= image.size() - at; };
  const auto number = [&](size_t size) {
    if (!has(size)) return 0u;
    at += size;
    return Number(image, at - size, size);
  };
  const auto bytes = [&](uint64_t count) {
    if (!has(count)) return std::string();
    const std::string taken = image.substr(at, static_cast<size_t>(count));
    at += taken.size();
    return taken;
  };
  const uint32_t version = number(1) << 8 | number(1);
  const uint32_t encoding = number(1);
  std::vector<Entry> group;
  const auto take = [&](const std::string& key, const std::string& value) {
    std::u16string text;
    for (size_t i = 0; encoding == 0 && i + 1 < value.size(); i += 2) {
      text += static_cast<char16_t>(Number(value, i, 2));
    }
    if (whole) group.emplace_back(key, encoding == 0 ? text : Converted(value, encoding == 1));
  };
  if (version == 0x105) {
    const uint32_t groups = number(4);
    const std::string counts = bytes(uint64_t{4} * groups);
    if (!whole || groups == 0) return;
    const uint32_t lengthCount = Number(counts, counts.size() - 4, 4);
    const std::string lengths = bytes(uint64_t{4} * lengthCount);
    const std::string indices = bytes(uint64_t{2} * groups);
    uint32_t done = 0;
    for (uint32_t i = 0; whole && i < groups; ++i) {
      const uint32_t end = Number(counts, size_t{4} * i, 4);
      if (end % 2 != 0 || end < done || end > lengthCount) return;
      for (group.clear(); whole && done < end; done += 2) {
        const std::string key = bytes(Number(lengths, size_t{4} * done, 4));
        take(key, bytes(Number(lengths, size_t{4} * done + 4, 4)));
      }
      Prepend(Number(indices, size_t{2} * i, 2), group);
    }
  } else if (version == 0x100) {
    const uint32_t records = number(2);
    const std::string table = bytes(uint64_t{6} * records);
    if (!whole || records == 0) return;
    uint64_t place = Number(table, 2, 4);
    for (size_t i = 0; whole && i + 1 < records; ++i) {
      const uint32_t end = Number(table, 6 * i + 8, 4);
      for (group.clear(); whole && place < end;) {
        const size_t start = at;
        const std::string key = bytes(number(4));
        take(key, bytes(number(4)));
        place += at - start;
      }
      Prepend(Number(table, 6 * i, 2), group);
    }
  }
}

void SlowTwin::Prepend(uint32_t bucket, const std::vector<Entry>& group) {
  if (bucket >= 1021 || group.empty()) return;
  auto& entries = buckets[bucket];
  entries.insert(entries.begin(), group.begin(), group.end());
}

const SlowTwin::Entry* SlowTwin::Find(const std::string& key) const {
  const auto bucket = buckets.find(BucketOf(key));
  if (bucket == buckets.end()) return nullptr;
  for (const Entry& entry : bucket->second) {
    if (entry.first == key) return &entry;
  }
  return nullptr;
}

std::u16string SlowTwin::Translate(const std::string& text, const SlowTwin* fallback) const {
  if (text.empty()) return u"";
  const bool marked = text.starts_with("$$$");
  if (!marked && text.starts_with("$")) return u"";
  const std::string rest = text.substr(marked ? 3 : 0);
  const size_t equals = rest.find('=');
  const std::string key = rest.substr(0, equals);
  if (const Entry* own = Find(key)) return own->second;
  const Entry* other = fallback != nullptr ? fallback->Find(key) : nullptr;
  if (other != nullptr) return other->second;
  return equals == rest.npos ? u"" : Decode(Converted(rest.substr(equals + 1), true));
}

Contents SlowTwin::AllContents() const {
  Contents contents;
  for (const auto& [bucket, entries] : buckets) {
    for (const auto& [key, value] : entries) contents.emplace_back(bucket, key, value);
  }
  return contents;
}
