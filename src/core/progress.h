#pragma once

#include <cstdint>
#include <string_view>

namespace fotomill {

// Receives the progress of a codec or a long computation. Implemented by the user interfaces;
// called on the worker's thread.
class ProgressSink {
 public:
  virtual ~ProgressSink() = default;
  // Begin and End enclose the steps of one operation; operations may nest.
  virtual void Begin() {}
  // `done` of `total` steps, usually rows, are finished.
  virtual void Step(int32_t done, int32_t total) = 0;
  virtual void End() {}  // after the last step, even on failure
  // A text from the operation, shown in place of the status line.
  virtual void SetText(std::string_view) {}
};

}  // namespace fotomill
