#pragma once

#include <cstddef>
#include <string>

#include "batch/progress_box.h"

namespace fotomill::desktop {

// What the line below a progress box's list is made of.
struct ProgressFacts {
  std::string status;  // the batch's own text, for batches that do not tell their work
  ProgressWork work = {};
  double seconds = 0;     // since the batch began
  bool stopping = false;  // after Abort
  bool ended = false;
  size_t waiting = 0;  // batches behind this one
};
// "Processing file 3 of 12, 8 s left: beach.jpg"; what Abort waits for; the batch's text at the
// end.
std::string ProgressStatusLine(const ProgressFacts& facts);

}  // namespace fotomill::desktop
