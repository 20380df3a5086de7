#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>

#include "core/status.h"

namespace fotomill {

// Why an archive or entry cannot be read, in addition to the status.
enum class ArchiveTrouble : uint8_t {
  None,
  NeedsPassword,  // InvalidPassword: none was given
  WrongPassword,  // InvalidPassword
  LockedRar,      // InvalidPassword: encrypted RAR files are not supported
  Volume,         // UnsupportedFormat: one of several parts
  Method,         // UnsupportedFormat: unknown compression
  TooManyEntries,
  Bomb,     // expands to far more than its size
  Changed,  // the file was modified while being read
};

// The result of reading an archive or entry.
struct ArchiveEnd {
  Status status = Status::Ok;
  ArchiveTrouble trouble = ArchiveTrouble::None;
};

// An entry's header. Plain data that can be passed between processes.
struct RawEntry {
  enum Kind : uint8_t { File, Folder, Link, Other };
  uint64_t size = 0;     // bytes; 0 unless sizeKnown
  int64_t modified = 0;  // seconds since 1970 UTC; 0 if unknown
  Kind kind = File;
  bool sizeKnown = false;
  bool encrypted = false;
};

// Callbacks of WalkArchive.
class ArchiveSink {
 public:
  virtual ~ArchiveSink() = default;
  // An entry; the name is as stored in the archive. Return true to receive its data.
  virtual bool Entry(const RawEntry& entry, std::string_view name) = 0;
  virtual void Data(std::span<const uint8_t> bytes) = 0;
  // After the data, or with the reason why it could not be read.
  virtual void EndEntry(const ArchiveEnd& end) = 0;
};

// Walks through the entries of a ZIP or RAR archive in order, using libarchive. DamagedFile,
// FileReadError, MemoryAllocationError, UnsupportedFormat, InvalidPassword, FeatureDisabled without
// the library. As this is a C library reading untrusted data, only call it in a worker process; see
// archive_reader.h.
ArchiveEnd WalkArchive(std::span<const uint8_t> file, const std::string& password,
                       uint32_t mostEntries, ArchiveSink& sink);

}  // namespace fotomill
