#pragma once

#include <cstdint>
#include <string_view>

namespace fotomill {

// Where a codec or a long computation tells how far it is. Implemented by the faces; called from
// the thread that works.
class ProgressSink {
 public:
  virtual ~ProgressSink() = default;
  // Begin and End enclose the steps of one operation; operations within it enclose theirs.
  virtual void Begin() {}
  // `done` of `total` steps, usually rows, are finished.
  virtual void Step(int32_t done, int32_t total) = 0;
  virtual void End() {}  // after the last step, also of work that failed
  // A text of the operation's own, shown in place of the status line.
  virtual void SetText(std::string_view) {}
};

}  // namespace fotomill
