#pragma once

#include <wx/timer.h>

#include <string>
#include <vector>

#include "catalog/history/file_history.h"

namespace fotomill::desktop {

// Records used files with their function, and writes them to the file history when idle. Records
// nothing while the history is disabled.
class UseRecorder {
 public:
  UseRecorder();

  // Adds uses; they are written shortly after, or by Flush.
  void Note(const std::vector<FileUse>& uses);
  // Adds a use of each file with the same function, now.
  void NoteAll(const std::vector<std::string>& paths, FileFunction function);
  // Writes pending uses.
  void Flush();
  // At program exit: writes pending uses, or deletes the history file if the history is disabled by
  // then.
  void End();

 private:
  std::vector<FileUse> uses_;
  wxTimer timer_;
};

}  // namespace fotomill::desktop
