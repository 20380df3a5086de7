#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace fotomill {

// Result of EditTextFile.
enum class EditResult {
  Done,       // the file holds the new contents
  Unchanged,  // the edit changed nothing
  NotRead,    // the file exists but cannot be read; left alone
  Failed,     // it cannot be locked or written; left unchanged
};

// Changes a small text file that other processes may change at the same time: locks it
// ("PATH.lock", removed afterwards), reads it (a missing file is empty), has `edit` change the
// contents, and replaces the file atomically if they changed. Creates the folder if it is missing.
// Files over `most` bytes are not read.
EditResult EditTextFile(const std::string& path, uint64_t most,
                        const std::function<void(std::string& contents)>& edit);

}  // namespace fotomill
