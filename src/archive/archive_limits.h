#pragma once

#include <cstdint>

namespace fotomill {

// Limits for an archive, to keep a small file from filling the disk or memory.
struct ArchiveLimits {
  uint32_t entries = 250'000;  // more are rejected
  // An archive with more than `unpackedBytes` is rejected if that is more than `ratio` times its
  // size. Compressed pictures stay far below that; overlapping entries go far beyond.
  uint64_t ratio = 500;
  uint64_t unpackedBytes = uint64_t{256} << 20;
  // of the worker process
  uint64_t memoryBytes = uint64_t{768} << 20;
};

// The current limits. Only changed by tests.
extern ArchiveLimits archiveLimits;

inline constexpr uint32_t kLongestEntryName = 4096;  // bytes; longer names are cut and rejected
inline constexpr uint32_t kLongestPassword = 1024;   // bytes

}  // namespace fotomill
