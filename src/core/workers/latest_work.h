#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>

#include "core/workers/worker_pool.h"

namespace fotomill {

// Work of which only what is wanted now counts: there is no queue that could grow old. A thread
// that is free asks for the most urgent piece, does it, and asks again. The owner keeps its
// requests under a lock of its own, and changes them as it likes.
class LatestWork {
 public:
  using Piece = std::function<void()>;

  // `next` gives the piece of work that is wanted most, an empty one when nothing is; it is called
  // on the pool's threads, as are the pieces, at most `atOnce` at a time.
  LatestWork(Lane lane, unsigned atOnce, std::function<Piece()> next,
             WorkerPool& pool = WorkerPool::Shared());
  // No further piece begins; waits for those that have. The owner's other members have to be there
  // still.
  ~LatestWork();
  LatestWork(const LatestWork&) = delete;
  LatestWork& operator=(const LatestWork&) = delete;

  // Something may be wanted that was not before.
  void Look();

 private:
  void DoOne();

  const Lane lane_;
  const unsigned atOnce_;
  const std::function<Piece()> next_;
  WorkerPool& pool_;
  std::mutex mutex_;
  std::condition_variable ended_;
  unsigned running_ = 0;  // tasks of the pool
  uint64_t looks_ = 0;    // so many calls of Look
  bool stopped_ = false;
};

}  // namespace fotomill
