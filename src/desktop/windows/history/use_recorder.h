#pragma once

#include <wx/timer.h>

#include <vector>

#include "catalog/history/file_history.h"

namespace fotomill::desktop {

// Takes down which files were used and for what, and writes that to the file history when nothing
// else is to be done.
class UseRecorder {
 public:
  UseRecorder();

  // Takes uses over; they are written within a moment, or by Flush.
  void Note(const std::vector<FileUse>& uses);
  // Writes what is still to be written.
  void Flush();

 private:
  std::vector<FileUse> uses_;
  wxTimer timer_;
};

}  // namespace fotomill::desktop
