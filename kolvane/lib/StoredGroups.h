// Deferred entries of binary images, materialised on first access to a bucket: creating entries
// takes several times as long as reading them, and most programs look up few keys.
#pragma once

#include <array>
#include <boost/container/vector.hpp>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <vector>

#include "kolvane/lib/DictionaryItems.h"

namespace tovali_private {

struct StoredImage;

// The rest of a group; entries are taken from its end.
struct StoredGroup {
  uint32_t bucket = 0;
  uint32_t entryCount = 0;
  size_t lengthsEnd = 0;  // where its entries end in the image's lengths and data
  size_t dataEnd = 0;
  StoredImage* image = nullptr;  // these two belong to WaitingGroups
  StoredGroup* next = nullptr;
};

// An entry that borrows its image's bytes.
struct StoredEntry {
  ByteRunKey Key() const { return {key.data(), static_cast<uint32_t>(key.size()), false}; }

  std::span<const uint8_t> key;
  std::span<const uint8_t> value;  // in a table UTF-16
  uint64_t offset;                 // of the key in the image that was loaded
};

// The entries of one image, and its groups in their order.
struct StoredImage {
  using Bytes = boost::container::vector<uint8_t>;

  static constexpr size_t kLengthsSize = 8;  // of the two of an entry

  // Append puts an entry into the group that was begun last. Both throw std::bad_alloc.
  void BeginGroup(uint32_t bucket);
  void Append(std::span<const uint8_t> key, std::span<const uint8_t> value);

  // Visits every entry, with its group, in their order; before any was dropped.
  template <class Visit>
  void ForEachEntry(Visit visit) const {
    size_t lengthsAt = 0;
    size_t dataAt = 0;
    for (const StoredGroup& group : groups) {
      for (; lengthsAt < group.lengthsEnd; lengthsAt += kLengthsSize) {
        const StoredEntry entry = EntryAt(lengthsAt, dataAt);
        dataAt += entry.key.size() + entry.value.size();
        visit(group, entry);
      }
    }
  }

  StoredEntry EntryAt(size_t lengthsAt, size_t dataAt) const noexcept;
  StoredEntry LastOf(const StoredGroup& group) const noexcept;  // there must be one
  void DropLastOf(StoredGroup& group) const noexcept;

  Bytes lengths;  // 32 bits for the key of each entry, and for its value
  Bytes data;     // the key of each entry, and its value
  std::vector<StoredGroup> groups;
  int valueSelector = 0;     // the encoding byte: 0 for UTF-16, else a selector (Converters.h)
  uint64_t load = 0;         // the number of the load that brought it
  bool keysChecked = false;  // whether they were found to belong to their buckets or not

  uint64_t dataOffset = 0;      // of the first key in the image that was loaded,
  uint32_t lengthsBetween = 0;  // where this many bytes stand between a value and the next key

  uint32_t waitingGroups = 0;  // these two belong to WaitingGroups
  size_t place = 0;
};

// The pending groups of every bucket, oldest first. Owns their images; an image is freed with its
// last pending group.
class WaitingGroups {
 public:
  static constexpr uint32_t kBucketCount = 1021;

  bool Any() const noexcept { return !images.empty(); }

  // Adds the groups of an image whose bucket index is in range, and returns the number of their
  // entries. Throws: std::bad_alloc; none is added then.
  uint32_t Add(StoredImage&& image);

  // Returns the bucket's oldest group, or null.
  StoredGroup* Oldest(uint32_t bucket) const noexcept;

  // Removes the bucket's oldest group, and frees its image with its last group.
  void DropOldest(uint32_t bucket) noexcept;

  void Clear() noexcept;

 private:
  void Enqueue(StoredGroup& group, StoredImage& image) noexcept;
  void Drop(StoredImage& image) noexcept;

  std::vector<std::unique_ptr<StoredImage>> images;

  // Tail of each bucket's circular FIFO; tail->next is the head.
  using Queues = std::array<StoredGroup*, kBucketCount>;
  std::unique_ptr<Queues> newest;
};

}  // namespace tovali_private
