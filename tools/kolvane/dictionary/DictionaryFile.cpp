#include "tools/kolvane/dictionary/DictionaryFile.h"

#include <unordered_set>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/TextSyntax.h"
#include "tools/kolvane/dictionary/TextLines.h"

namespace {

using tovali_private::ByteRunKey;
using tovali_private::DictionaryEntry;

// What was found so far, in the order of the finding.
class FoundOnce {
 public:
  explicit FoundOnce(DictionaryTable& searched) : table(searched) {}

  void Find(const ByteRunKey& key) {
    const DictionaryEntry* const entry = table.Find(key);
    if (entry != nullptr && seen.insert(entry).second) entries.push_back(entry);
  }

  std::vector<const DictionaryEntry*> Take() { return std::move(entries); }

 private:
  DictionaryTable& table;
  std::unordered_set<const DictionaryEntry*> seen;
  std::vector<const DictionaryEntry*> entries;
};

void FindLines(const ImageFile& file, FoundOnce& found) {
  TextLines lines(file);
  for (TextLine line; lines.Next(line);) {
    const auto split = tovali_private::SplitKolvane(tovali_private::QuotedPart(line.text));
    if (!split) continue;
    const auto key = tovali_private::ToKeyBytes(split->key);
    found.Find(ByteRunKey(key.data(), static_cast<uint32_t>(key.size()), false));
  }
}

void FindStored(const ImageFile& file, FoundOnce& found) {
  tovali_private::MemoryInput stream(file.bytes);
  tovali_private::ParseBinary(stream).stored.ForEachEntry(
      [&](const auto&, const tovali_private::StoredEntry& entry) { found.Find(entry.Key()); });
}

}  // namespace

LoadStatus LoadInto(DictionaryTable& table, const ImageFile& file) {
  tovali_private::MemoryInput stream(file.bytes);
  table.Load(stream);
  return table.LastLoad();
}

std::vector<const DictionaryEntry*> EntriesInFileOrder(DictionaryTable& table,
                                                       const ImageFile& file) {
  FoundOnce found(table);
  const bool isBinary = tovali_private::HasBinaryMagic(file.bytes);
  isBinary ? FindStored(file, found) : FindLines(file, found);
  return found.Take();
}
