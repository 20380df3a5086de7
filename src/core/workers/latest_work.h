#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>

#include "core/workers/worker_pool.h"

namespace fotomill {

// Work where only the latest requests matter, without a queue that could go stale. A free thread
// asks for the most urgent piece, does it, and asks again. The owner keeps its requests under its
// own lock and may change them at any time.
class LatestWork {
 public:
  using Piece = std::function<void()>;

  // `next` returns the most urgent piece, or an empty one if there is none. It is called on pool
  // threads, as are the pieces, at most `atOnce` at a time.
  LatestWork(Lane lane, unsigned atOnce, std::function<Piece()> next,
             WorkerPool& pool = WorkerPool::Shared());
  // Starts no further piece and waits for running ones. The owner's members that pieces use must
  // still be alive.
  ~LatestWork();
  LatestWork(const LatestWork&) = delete;
  LatestWork& operator=(const LatestWork&) = delete;

  // To be called when there may be new work.
  void Look();

 private:
  void DoOne();

  const Lane lane_;
  const unsigned atOnce_;
  const std::function<Piece()> next_;
  WorkerPool& pool_;
  std::mutex mutex_;
  std::condition_variable ended_;
  unsigned running_ = 0;  // tasks in the pool
  uint64_t looks_ = 0;    // calls of Look so far
  bool stopped_ = false;
};

}  // namespace fotomill
