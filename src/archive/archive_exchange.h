#pragma once

#include <atomic>
#include <cstdint>

#include "archive/archive_limits.h"
#include "archive/archive_walk.h"

namespace fotomill {

// Protocol between the program and the worker process that reads an archive. The worker fills the
// block of an ArchiveExchange with records, sends the number of bytes, and waits until `taken` is
// incremented. A record is a RecordHead and `size` bytes:
//
//   Entry   a RawEntry, then the name
//   Data    bytes of the entry
//   EndEntry, End   an ArchiveEnd, of the entry or of the archive

// The request to the worker; the password's bytes follow.
struct ExchangeRequest {
  uint32_t mostEntries = 0;
  uint32_t data = 0;      // 0: headers only
  uint32_t password = 0;  // bytes
};

struct RecordHead {
  enum Kind : uint32_t { Entry, Data, EndEntry, End } kind = End;
  uint32_t size = 0;
};

inline constexpr uint32_t kExchangeBlock = 256 * 1024;
inline constexpr uint32_t kMostWanted = 1'000'000;  // entries

struct ArchiveExchange {
  std::atomic<uint32_t> taken{0};
  uint8_t wanted[kMostWanted / 8] = {};  // one bit per entry, lowest first: send its data
  alignas(8) uint8_t block[kExchangeBlock] = {};
};
static_assert(std::atomic<uint32_t>::is_always_lock_free);
static_assert(sizeof(RecordHead) + sizeof(RawEntry) + kLongestEntryName + 1 < kExchangeBlock);

}  // namespace fotomill
