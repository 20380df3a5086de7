#pragma once

#include <wx/timer.h>

#include <string>
#include <vector>

#include "catalog/history/file_history.h"

namespace fotomill::desktop {

// Takes down which files were used and for what, and writes that to the file history when nothing
// else is to be done. While the history is switched off nothing is taken down.
class UseRecorder {
 public:
  UseRecorder();

  // Takes uses over; they are written within a moment, or by Flush.
  void Note(const std::vector<FileUse>& uses);
  // The same function on each of these files, now.
  void NoteAll(const std::vector<std::string>& paths, FileFunction function);
  // Writes what is still to be written.
  void Flush();
  // The program ends: writes what is still to be written, or deletes the history file if the
  // history is switched off by then.
  void End();

 private:
  std::vector<FileUse> uses_;
  wxTimer timer_;
};

}  // namespace fotomill::desktop
