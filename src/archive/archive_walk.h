#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>

#include "core/status.h"

namespace fotomill {

// Why an archive or an entry cannot be read, beyond its status.
enum class ArchiveTrouble : uint8_t {
  None,
  NeedsPassword,  // InvalidPassword: none was given
  WrongPassword,  // InvalidPassword
  LockedRar,      // InvalidPassword: encrypted RAR files cannot be read at all
  Volume,         // UnsupportedFormat: one of several parts
  Method,         // UnsupportedFormat: compressed in an unknown way
  TooManyEntries,
  Bomb,     // it unpacks to far more than its size
  Changed,  // the file was changed while it was read
};

// How an archive or an entry ended.
struct ArchiveEnd {
  Status status = Status::Ok;
  ArchiveTrouble trouble = ArchiveTrouble::None;
};

// An entry's header. Plain data, so that it can be passed between processes.
struct RawEntry {
  enum Kind : uint8_t { File, Folder, Link, Other };
  uint64_t size = 0;     // bytes; 0 unless sizeKnown
  int64_t modified = 0;  // seconds since 1970 UTC; 0 if unknown
  Kind kind = File;
  bool sizeKnown = false;
  bool encrypted = false;
};

// Receives what WalkArchive finds.
class ArchiveSink {
 public:
  virtual ~ArchiveSink() = default;
  // An entry; its name has the bytes of the archive. Its data follow if it returns true.
  virtual bool Entry(const RawEntry& entry, std::string_view name) = 0;
  virtual void Data(std::span<const uint8_t> bytes) = 0;
  // After the data, or what kept them from being read.
  virtual void EndEntry(const ArchiveEnd& end) = 0;
};

// Walks through the entries of a ZIP or RAR archive, in its order, by libarchive. DamagedFile,
// FileReadError, MemoryAllocationError, UnsupportedFormat, InvalidPassword, FeatureDisabled without
// the library. The library is written in C and reads what anybody may have made, so the program
// calls this only in a worker process; see archive_reader.h.
ArchiveEnd WalkArchive(std::span<const uint8_t> file, const std::string& password,
                       uint32_t mostEntries, ArchiveSink& sink);

}  // namespace fotomill
