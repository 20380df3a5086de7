#pragma once

#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "archive/archive_reader.h"
#include "platform/output_file.h"

namespace fotomill {

// Where an entry goes.
struct ExtractPlace {
  std::string path;
  platform::Existing existing = platform::Existing::Refuse;
  // Called right before the file gets its name, to move the existing one out of the way; false
  // keeps it.
  std::function<bool()> makeWay = {};
};

// How entries are extracted.
struct ExtractJob {
  // The place of an entry; nullopt skips it. Asked for all entries before the first is extracted.
  std::function<std::optional<ExtractPlace>(const ArchiveEntry&)> place;
  // After each wanted entry that was not skipped, with where it went.
  std::function<void(const ArchiveEntry&, const std::string& path, const ArchiveEnd&)> done;
  bool keepTimes = true;  // files get the entries' modification times
};

// Extracts the files whose place in `wanted` is true; refused entries and folders are left out.
// Missing folders are created. A file appears under its name when it is complete and its checksum
// was verified. Statuses of ReadArchive; entries' also ErrorCreatingFile and ErrorWritingFile.
ArchiveEnd ExtractArchive(const ArchiveSource& source, std::span<const ArchiveEntry> entries,
                          std::vector<bool> wanted, const ExtractJob& job);

}  // namespace fotomill
