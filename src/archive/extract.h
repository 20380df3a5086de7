#pragma once

#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "archive/archive_reader.h"
#include "platform/output_file.h"

namespace fotomill {

// Destination of an entry.
struct ExtractPlace {
  std::string path;
  platform::Existing existing = platform::Existing::Refuse;
  // Called right before the file gets its name, to move an existing one out of the way; return
  // false to keep that.
  std::function<bool()> makeWay = {};
};

// Options for extracting entries.
struct ExtractJob {
  // Destination of an entry; nullopt skips it. Called for all entries before any extraction.
  std::function<std::optional<ExtractPlace>(const ArchiveEntry&)> place;
  // Called after each requested entry that was not skipped, with its destination.
  std::function<void(const ArchiveEntry&, const std::string& path, const ArchiveEnd&)> done;
  bool keepTimes = true;  // set modification times from the entries
};

// Extracts the files marked in `wanted`, except refused entries and folders. Creates missing
// folders. A file appears under its name when it is complete and its checksum has been verified.
// Statuses of ReadArchive; for entries also ErrorCreatingFile and ErrorWritingFile.
ArchiveEnd ExtractArchive(const ArchiveSource& source, std::span<const ArchiveEntry> entries,
                          std::vector<bool> wanted, const ExtractJob& job);

}  // namespace fotomill
