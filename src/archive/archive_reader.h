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
  UnsafeName,  // absolute, or it leaves the folder; see IsSafeEntryName
  Link,        // symbolic or hard
  Special,     // a device or the like
  Duplicate,   // an earlier entry has the same name
};

// An entry of an archive.
struct ArchiveEntry {
  std::string name;  // UTF-8, parts separated by "/"
  RawEntry facts;
  EntryRefusal refusal = EntryRefusal::None;
  bool IsFile() const { return facts.kind == RawEntry::File; }
};

// An archive to be read.
struct ArchiveSource {
  std::string path;
  std::string password = {};  // empty: none
  StopToken stop = {};
};

// Reads the entries' headers, in the order of the archive. `entries` has those before an error.
// Statuses of WalkArchive, besides FileOpenError, and FunctionCancelled if `stop` was requested.
ArchiveEnd ListArchive(const ArchiveSource& source, std::vector<ArchiveEntry>& entries);

// Receives the contents of entries.
class EntryReceiver {
 public:
  virtual ~EntryReceiver() = default;
  // Entry `index` begins. The status that is not Ok skips its data, and is passed to End.
  virtual Status Begin(size_t index) = 0;
  // More of its bytes. A status that is not Ok ends it likewise.
  virtual Status Data(std::span<const uint8_t> bytes) = 0;
  virtual void End(size_t index, const ArchiveEnd& end) = 0;
};

// Unpacks the entries whose place in `wanted` is true, in the order of the archive; `entries` come
// from ListArchive. Checksums are verified. Statuses as above, for the archive as a whole; those of
// entries go to the receiver.
ArchiveEnd ReadArchive(const ArchiveSource& source, std::span<const ArchiveEntry> entries,
                       const std::vector<bool>& wanted, EntryReceiver& receiver);

// A sentence for people, in English, to be passed to Tr; empty for None.
std::string_view TroubleText(ArchiveTrouble trouble);
std::string_view RefusalText(EntryRefusal refusal);

// Whether libarchive is installed, and its version, "missing" without it.
bool HasArchiveLibrary();
std::string ArchiveLibraryVersion();

// The task for the worker process, a row of the program's task table.
bool ReadArchiveApart(const platform::ApartCall& call);
inline constexpr platform::ApartTask kArchiveTask = {"archive-read", ReadArchiveApart};

}  // namespace fotomill
