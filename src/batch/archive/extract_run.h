#pragma once

#include <functional>
#include <string>
#include <vector>

#include "archive/archive_reader.h"
#include "batch/job.h"

namespace fotomill {

// What to read of an archive.
struct ArchivePart {
  std::string path;
  std::string password = {};            // empty: asked for if needed
  std::vector<std::string> names = {};  // entries, and folders with their contents; empty: all
};

// Where to extract to.
struct ExtractTarget {
  std::string folder;  // created if missing
  bool keepPaths = true;
  bool keepTimes = true;
  // Called with the path of each extracted file.
  std::function<void(const std::string& path)> extracted = {};
};

// Extracts entries: opens the job's progress box, reports every entry, closes the box. The job's
// policy says what to do if a file exists. Ok, or FunctionCancelled if the box cannot be shown.
Status RunExtract(const ArchivePart& part, const ExtractTarget& target, BatchJob& job);

// Unpacks entries without writing them, and reports whether their checksums are right. Statuses as
// above.
Status RunArchiveTest(const ArchivePart& part, BatchJob& job);

// A sentence about why an entry or an archive cannot be read; may be empty.
std::string TroubleSentence(const ArchiveEnd& end);

}  // namespace fotomill
