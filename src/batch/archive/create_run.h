#pragma once

#include <functional>
#include <string>
#include <vector>

#include "batch/archive/archive_members.h"
#include "batch/job.h"

namespace fotomill {

// Options for writing a ZIP archive.
struct CreateArchive {
  std::string path;
  std::vector<std::string> files;  // files and folders
  MemberNaming naming = {};
  std::string password = {};  // not empty: encrypt
  // Keep the files in the existing archive; those with the names of new ones are replaced.
  bool add = false;
  // Called before an archive is replaced; return false to leave it unchanged. And right after.
  std::function<bool(const std::string& path)> keepPrevious = {};
  std::function<void(const std::string& path)> replaced = {};
};

// Creates an archive, or adds to one: opens the job's progress box, reports every file, closes the
// box. The job's policy says what to do if a new archive exists. Nothing is written if a kept file
// would be lost. Ok, or FunctionCancelled if the box cannot be shown.
Status RunCreateArchive(const CreateArchive& request, BatchJob& job);

}  // namespace fotomill
