#include "core/workers/ordered_run.h"

#include <algorithm>
#include <chrono>
#include <utility>

#include "core/workers/guarded.h"

namespace fotomill {

namespace {

constexpr std::chrono::milliseconds kTick{200};

}  // namespace

void OrderedRun::Run(size_t count, uint32_t jobs) {
  if (std::min<size_t>(jobs, count) > 1) {
    items_.assign(count, {});
    threaded_ = true;
    {
      const std::lock_guard lock(mutex_);
      while (workers_ < std::min<size_t>(jobs, count) && StartWorker()) {
      }
      threaded_ = workers_ > 0;
    }
    if (threaded_) DeliverAll();
    threaded_ = false;
  }
  // Also runs the remaining items if no worker could continue.
  for (size_t item = begun_; item < count && steps_.goesOn(); ++item) {
    const Status status = Guarded([&] { return steps_.work(item); });
    steps_.deliver(item, status);
  }
}

// Called with the lock held.
bool OrderedRun::StartWorker() {
  if (!pool_.Run(Lane::Compute, [this] { WorkOnOne(); })) return false;
  ++workers_;
  return true;
}

bool OrderedRun::InTurn(size_t item, const std::function<void()>& step) {
  if (!threaded_) {
    step();
    return true;
  }
  const CoreRelease release;
  std::unique_lock lock(mutex_);
  items_[item].state = State::Asking;
  answered_.wait(lock, [&] { return stopped_ || item == head_; });
  if (stopped_) return false;
  step_ = &step;
  delivered_.notify_one();
  answered_.wait(lock, [&] { return stopped_ || items_[item].state == State::AtWork; });
  return items_[item].state == State::AtWork;
}

// Processes one item, then requeues at the end of the pool's queue so that other work
// gets its turn.
void OrderedRun::WorkOnOne() {
  const bool goesOn = steps_.goesOn();
  std::unique_lock lock(mutex_);
  --workers_;
  if (stopped_ || !goesOn || begun_ == items_.size()) {
    delivered_.notify_one();
    return;
  }
  ++workers_;
  if (begun_ >= head_ + steps_.ahead) {
    ++parked_;
    return;
  }
  const size_t item = begun_++;
  lock.unlock();
  const Status status = Guarded([&] { return steps_.work(item); });
  lock.lock();
  items_[item] = {State::Done, status};
  --workers_;
  (void)StartWorker();
  if (item == head_ || workers_ == 0) delivered_.notify_one();
}

// Resumes workers that waited for deliveries. Called with the lock held.
void OrderedRun::ResumeWorkers() {
  if (begun_ >= head_ + steps_.ahead) return;
  workers_ -= parked_;
  for (size_t i = std::exchange(parked_, 0); i > 0; --i) (void)StartWorker();
}

void OrderedRun::DeliverAll() {
  const CoreRelease release;
  std::unique_lock lock(mutex_);
  for (;;) {
    const bool waits = head_ < begun_ && items_[head_].state != State::Done;
    if (step_ != nullptr) {
      const auto* const step = std::exchange(step_, nullptr);
      lock.unlock();
      (*step)();
      lock.lock();
      items_[head_].state = State::AtWork;
      answered_.notify_all();
    } else if (head_ < begun_ && !waits) {
      const Status status = items_[head_].status;
      lock.unlock();
      steps_.deliver(head_, status);
      lock.lock();
      ++head_;
      ResumeWorkers();
      if (head_ < begun_ && items_[head_].state == State::Asking) answered_.notify_all();
    } else if (workers_ == 0 && head_ == begun_) {
      return;
    } else if (delivered_.wait_for(lock, kTick) == std::cv_status::timeout && steps_.tick) {
      lock.unlock();
      steps_.tick();
      lock.lock();
    }
  }
}

void OrderedRun::Stop() {
  std::unique_lock lock(mutex_);
  stopped_ = true;
  answered_.notify_all();
  workers_ -= std::exchange(parked_, 0);
  delivered_.wait(lock, [this] { return workers_ == 0; });
}

}  // namespace fotomill
