#pragma once

#include <cstdint>

namespace fotomill {

// Where a codec or a long computation tells how far it is. Implemented by the faces; called from the thread that works.
class ProgressSink {
 public:
  virtual ~ProgressSink() = default;
  virtual void Begin() {}
  // `done` of `total` steps, usually rows, are finished.
  virtual void Step(int32_t done, int32_t total) = 0;
  virtual void End() {}
};

}  // namespace fotomill
