#include "core/workers/latest_work.h"

#include <utility>

#include "core/workers/guarded.h"

namespace fotomill {

LatestWork::LatestWork(Lane lane, unsigned atOnce, std::function<Piece()> next, WorkerPool& pool)
    : lane_(lane), atOnce_(atOnce), next_(std::move(next)), pool_(pool) {}

LatestWork::~LatestWork() {
  std::unique_lock lock(mutex_);
  stopped_ = true;
  ended_.wait(lock, [this] { return running_ == 0; });
}

void LatestWork::Look() {
  const std::lock_guard lock(mutex_);
  ++looks_;
  while (running_ < atOnce_ && !stopped_) {
    ++running_;
    if (!pool_.Run(lane_, [this] { DoOne(); })) {
      --running_;
      return;
    }
  }
}

// Does one piece, then requeues at the end of the pool's queue so that others get their turn.
void LatestWork::DoOne() {
  std::unique_lock lock(mutex_);
  while (!stopped_) {
    const uint64_t looks = looks_;
    lock.unlock();
    Piece piece;
    (void)Guarded([&] { piece = next_(); });
    if (piece) {
      (void)Guarded(piece);
      piece = nullptr;
      lock.lock();
      if (!stopped_ && pool_.Run(lane_, [this] { DoOne(); })) return;
      break;
    }
    lock.lock();
    if (looks == looks_) break;
  }
  --running_;
  ended_.notify_all();
}

}  // namespace fotomill
