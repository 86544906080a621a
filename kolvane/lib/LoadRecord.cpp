#include "kolvane/lib/LoadRecord.h"

namespace tovali_private {

void LoadRecord::Begin() noexcept {
  ++number;
  status = {};
  status.damage = LoadDamage::kInterrupted;
}

void LoadRecord::SetFormat(ImageFormat format, TextEncoding encoding) noexcept {
  status.format = format;
  status.encoding = encoding;
}

void LoadRecord::Count(StoredLine line) noexcept {
  if (line == StoredLine::kDropped) {
    ++status.linesDropped;
    return;
  }
  ++status.entriesAdded;
  if (line == StoredLine::kReplaced) ++status.entriesReplaced;
}

void LoadRecord::End(Damage damage) noexcept {
  status.damage = damage.kind;
  status.damageOffset = damage.offset;
}

// Buckets materialise in the order of lookups; the entry to report is the image's first.
void LoadRecord::NoteWrongBucket(uint64_t offset) noexcept {
  const bool isEarlier = status.damage == LoadDamage::kWrongBucket && offset < status.damageOffset;
  if (status.damage == LoadDamage::kNone || isEarlier) End({LoadDamage::kWrongBucket, offset});
}

}  // namespace tovali_private
