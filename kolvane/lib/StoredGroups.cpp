#include "kolvane/lib/StoredGroups.h"

#include <utility>

#include "kolvane/lib/LittleEndian.h"

namespace tovali_private {

void StoredImage::BeginGroup(uint32_t bucket) {
  groups.push_back({bucket, 0, lengths.size(), data.size(), nullptr, nullptr});
}

void StoredImage::Append(std::span<const uint8_t> key, std::span<const uint8_t> value) {
  uint8_t both[kLengthsSize];
  Write32(both, static_cast<uint32_t>(key.size()));
  Write32(both + 4, static_cast<uint32_t>(value.size()));
  lengths.insert(lengths.end(), std::begin(both), std::end(both));
  data.insert(data.end(), key.begin(), key.end());
  data.insert(data.end(), value.begin(), value.end());
  groups.back().lengthsEnd = lengths.size();
  groups.back().dataEnd = data.size();
  ++groups.back().entryCount;
}

StoredEntry StoredImage::EntryAt(size_t lengthsAt, size_t dataAt) const noexcept {
  const size_t keyLength = Read32(&lengths[lengthsAt]);
  const size_t valueLength = Read32(&lengths[lengthsAt + 4]);
  return {{data.data() + dataAt, keyLength},
          {data.data() + dataAt + keyLength, valueLength},
          dataOffset + dataAt + lengthsAt / kLengthsSize * lengthsBetween};
}

StoredEntry StoredImage::LastOf(const StoredGroup& group) const noexcept {
  const size_t lengthsAt = group.lengthsEnd - kLengthsSize;
  const size_t keyLength = Read32(&lengths[lengthsAt]);
  const size_t valueLength = Read32(&lengths[lengthsAt + 4]);
  return EntryAt(lengthsAt, group.dataEnd - keyLength - valueLength);
}

void StoredImage::DropLastOf(StoredGroup& group) const noexcept {
  const StoredEntry last = LastOf(group);
  group.lengthsEnd -= kLengthsSize;
  group.dataEnd -= last.key.size() + last.value.size();
  --group.entryCount;
}

uint32_t WaitingGroups::Add(StoredImage&& image) {
  if (newest == nullptr) newest = std::make_unique<Queues>();
  images.push_back(std::make_unique<StoredImage>(std::move(image)));
  StoredImage& stored = *images.back();
  stored.place = images.size() - 1;
  uint32_t entryCount = 0;
  for (StoredGroup& group : stored.groups) {
    if (group.bucket >= kBucketCount) continue;
    Enqueue(group, stored);
    entryCount += group.entryCount;
  }
  if (stored.waitingGroups == 0) images.pop_back();
  return entryCount;
}

void WaitingGroups::Enqueue(StoredGroup& group, StoredImage& image) noexcept {
  StoredGroup*& last = (*newest)[group.bucket];
  group.next = last != nullptr ? std::exchange(last->next, &group) : &group;
  last = &group;
  group.image = &image;
  ++image.waitingGroups;
}

StoredGroup* WaitingGroups::Oldest(uint32_t bucket) const noexcept {
  const StoredGroup* const last = Any() ? (*newest)[bucket] : nullptr;
  return last != nullptr ? last->next : nullptr;
}

void WaitingGroups::DropOldest(uint32_t bucket) noexcept {
  StoredGroup*& last = (*newest)[bucket];
  StoredGroup* const oldest = last->next;
  last->next = oldest->next;
  if (oldest == last) last = nullptr;
  StoredImage& image = *oldest->image;
  if (--image.waitingGroups == 0) Drop(image);
}

void WaitingGroups::Drop(StoredImage& image) noexcept {
  const size_t place = image.place;
  images.back()->place = place;
  std::swap(images[place], images.back());
  images.pop_back();
}

void WaitingGroups::Clear() noexcept {
  images.clear();
  newest.reset();
}

}  // namespace tovali_private
