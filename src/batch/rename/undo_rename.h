#pragma once

#include <set>
#include <string>

#include "batch/job.h"

namespace fotomill {

// Restores the old names of the last run of RunRename or RunPatternRename, last file first; with
// `only`, just those absolute paths. Files that cannot be restored can be retried. If all are
// restored, the next sequential run starts with the same number as the last one. False, with no
// change, if the log is unreadable or locked by another program.
// Comment files with the extension, if one is given, go along.
bool UndoRename(const std::set<std::string>& only, bool dryRun, BatchJob& job,
                const std::string& commentExtension = {});

}  // namespace fotomill
