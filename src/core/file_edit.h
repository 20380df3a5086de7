#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace fotomill {

// What became of a change.
enum class EditResult {
  Done,       // the file holds the new contents
  Unchanged,  // there was nothing to change
  NotRead,    // the file is there and cannot be read, so it was left alone
  Failed,     // it cannot be locked or written; it is unchanged
};

// Changes a small text file that other processes may change at the same time: takes its lock
// ("PATH.lock", which goes again), reads it afresh (empty when it is missing), lets `edit` change
// the contents, and replaces the file in one step unless they stayed the same. The folder is made
// when it is missing. Files over `most` bytes are not read.
EditResult EditTextFile(const std::string& path, uint64_t most,
                        const std::function<void(std::string& contents)>& edit);

}  // namespace fotomill
