#pragma once

#include <cstdint>

namespace fotomill {

// Limits for one archive. They keep a small file from filling the disk or the memory.
struct ArchiveLimits {
  uint32_t entries = 250'000;  // more are rejected
  // An archive that unpacks to more than `ratio` times its size is rejected when that exceeds
  // `unpackedBytes`. Compressed pictures stay far below; overlapping entries go far beyond.
  uint64_t ratio = 500;
  uint64_t unpackedBytes = uint64_t{256} << 20;
  // memory of the process that reads it
  uint64_t memoryBytes = uint64_t{768} << 20;
};

// The limits in effect. Changed by tests only.
extern ArchiveLimits archiveLimits;

inline constexpr uint32_t kLongestEntryName = 4096;  // bytes; longer names are cut and rejected
inline constexpr uint32_t kLongestPassword = 1024;   // bytes

}  // namespace fotomill
