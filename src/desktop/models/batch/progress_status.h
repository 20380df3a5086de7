#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "batch/progress_box.h"

namespace fotomill::desktop {

// Data for the status line of a progress box.
struct ProgressFacts {
  std::string status;  // text of batches that do not report their work
  ProgressWork work = {};
  double seconds = 0;     // since the start of the batch
  bool stopping = false;  // after Abort
  bool ended = false;
  size_t waiting = 0;  // number of queued batches
};
// "Processing file 3 of 12, 8 s left: beach.jpg"; after Abort, what is still running; at the end,
// the batch's text.
std::string ProgressStatusLine(const ProgressFacts& facts);

// "8 s left", from the time that some of `count` equal steps took; empty if it is too early to say,
// or nothing is left.
std::string TimeLeftText(double seconds, uint64_t done, uint64_t count);

}  // namespace fotomill::desktop
