// The record of a table's latest load.
#pragma once

#include <cstdint>

#include "kolvane/lib/LoadStatus.h"

// The effect of a text line on a table.
enum class StoredLine : uint8_t { kDropped, kAdded, kReplaced };

namespace tovali_private {

struct Damage {
  LoadDamage kind = LoadDamage::kNone;
  uint64_t offset = 0;  // in bytes from the image's start
};

// The only writer of a LoadStatus. Deferred entries are counted when they are materialised, which
// may be during later lookups.
class LoadRecord {
 public:
  const LoadStatus& Status() const noexcept { return status; }

  // The number of loads so far: identifies the latest one.
  uint64_t Number() const noexcept { return number; }

  // Begins a load, which counts as interrupted until End.
  void Begin() noexcept;
  void SetFormat(ImageFormat format, TextEncoding encoding) noexcept;
  void SetInterruption(uint64_t offset) noexcept { status.damageOffset = offset; }
  void Count(StoredLine line) noexcept;
  void CountAdded(uint32_t entryCount) noexcept { status.entriesAdded += entryCount; }
  void CountReplaced() noexcept { ++status.entriesReplaced; }
  void End(Damage damage) noexcept;

  // Notes an entry whose key belongs to another bucket. Other damage has precedence.
  void NoteWrongBucket(uint64_t offset) noexcept;

 private:
  LoadStatus status;
  uint64_t number = 0;
};

}  // namespace tovali_private
