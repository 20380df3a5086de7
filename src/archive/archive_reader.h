#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "archive/archive_walk.h"
#include "core/workers/stop_token.h"
#include "platform/work_apart.h"

namespace fotomill {

// Why an entry is not extracted.
enum class EntryRefusal : uint8_t {
  None,
  UnsafeName,  // absolute, or outside the folder; see IsSafeEntryName
  Link,        // symbolic or hard
  Special,     // a device etc.
  Duplicate,   // same name as an earlier entry
};

// An entry of an archive.
struct ArchiveEntry {
  std::string name;  // UTF-8, with "/" as separator
  RawEntry facts;
  EntryRefusal refusal = EntryRefusal::None;
  bool IsFile() const { return facts.kind == RawEntry::File; }
};

// An archive to read.
struct ArchiveSource {
  std::string path;
  std::string password = {};  // empty: none
  StopToken stop = {};
};

// Reads the headers of all entries, in archive order. On errors, `entries` has those before it.
// Statuses of WalkArchive, FileOpenError, and FunctionCancelled if `stop` was requested.
ArchiveEnd ListArchive(const ArchiveSource& source, std::vector<ArchiveEntry>& entries);

// Receives the contents of entries.
class EntryReceiver {
 public:
  virtual ~EntryReceiver() = default;
  // Start of entry `index`. A status other than Ok skips its data and is passed to End.
  virtual Status Begin(size_t index) = 0;
  // More data of the entry. A status other than Ok ends it likewise.
  virtual Status Data(std::span<const uint8_t> bytes) = 0;
  virtual void End(size_t index, const ArchiveEnd& end) = 0;
};

// Extracts the entries marked in `wanted`, in archive order; `entries` is from ListArchive.
// Verifies checksums. Returns statuses as above for the archive as a whole; those of entries go to
// the receiver.
ArchiveEnd ReadArchive(const ArchiveSource& source, std::span<const ArchiveEntry> entries,
                       const std::vector<bool>& wanted, EntryReceiver& receiver);

// A sentence in English, to be translated with Tr; empty for None.
std::string_view TroubleText(ArchiveTrouble trouble);
std::string_view RefusalText(EntryRefusal refusal);

// Whether libarchive is installed; its version, or "missing".
bool HasArchiveLibrary();
std::string ArchiveLibraryVersion();

// The worker's task, a row of the program's task table.
bool ReadArchiveApart(const platform::ApartCall& call);
inline constexpr platform::ApartTask kArchiveTask = {"archive-read", ReadArchiveApart};

}  // namespace fotomill
