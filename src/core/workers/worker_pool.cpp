#include "core/workers/worker_pool.h"

#include <algorithm>
#include <memory>
#include <utility>

#include "core/workers/guarded.h"
#include "platform/freed_memory.h"
#include "platform/process.h"
#include "platform/work_apart.h"

namespace fotomill {

namespace {

constexpr size_t kMostThreads = 256;   // more would only add overhead
constexpr size_t kMostBlocking = 128;  // of these; leaves threads for others if many folders hang
// in order of priority
constexpr Lane kLanes[] = {Lane::Urgent, Lane::Blocking, Lane::Compute};

// The pool that this thread holds a core of, and whether for a task of Lane::Urgent.
thread_local WorkerPool* coreOf = nullptr;
thread_local bool coreIsUrgent = false;

}  // namespace

WorkerPool::WorkerPool(unsigned cores, std::function<void()> quiet)
    : cores_(std::max(cores, 1u)), quiet_(std::move(quiet)) {}

WorkerPool::~WorkerPool() {
  {
    const std::lock_guard lock(mutex_);
    ending_ = true;
  }
  wake_.notify_all();
  // A thread finishing its last task may still start another one.
  for (size_t i = 0;; ++i) {
    std::thread thread;
    {
      const std::lock_guard lock(mutex_);
      if (i == threads_.size()) return;
      thread = std::move(threads_[i]);
    }
    thread.join();
  }
}

WorkerPool& WorkerPool::Shared() {
  const auto rest = [] {
    platform::EndIdleProcesses();
    platform::TrimFreedMemory();
  };
  static WorkerPool* const pool =
      std::make_unique<WorkerPool>(platform::CoreCount(), rest).release();
  return *pool;
}

bool WorkerPool::MayBegin(Lane lane) const {
  if (waiting_[static_cast<size_t>(lane)].empty()) return false;
  if (lane == Lane::Compute) return HasRoom();
  return lane == Lane::Urgent || blocking_ < kMostBlocking;
}

bool WorkerPool::Run(Lane lane, std::function<void()> task) {
  const std::lock_guard lock(mutex_);
  std::deque<std::function<void()>>& waiting = waiting_[static_cast<size_t>(lane)];
  if (Guarded([&] { waiting.push_back(std::move(task)); }) != Status::Ok) return false;
  if (MayBegin(lane)) WakeOne();
  if (!threads_.empty()) return true;
  waiting.pop_back();
  return false;
}

// Ensures that one more thread looks for work. Called with the lock held.
void WorkerPool::WakeOne() {
  if (idle_ > wakings_) {
    ++wakings_;
    wake_.notify_one();
  } else if (threads_.size() < kMostThreads) {
    // If no further thread can be created, the existing ones do the work.
    (void)Guarded([this] { threads_.emplace_back([this] { Work(); }); });
  }
}

// As WakeOne, for a core that has become free. Called with the lock held.
void WorkerPool::WakeForCore() {
  if (HasRoom() && (MayBegin(Lane::Compute) || FindSpare() != spare_.end())) WakeOne();
}

std::list<WorkerPool::SpareWork*>::iterator WorkerPool::FindSpare() {
  return std::ranges::find_if(
      spare_, [](const SpareWork* work) { return !work->exhausted && work->running < work->most; });
}

bool WorkerPool::TakeTask(Task& task) {
  for (const Lane lane : kLanes) {
    if (!MayBegin(lane)) continue;
    std::deque<std::function<void()>>& waiting = waiting_[static_cast<size_t>(lane)];
    task = {std::move(waiting.front()), lane};
    waiting.pop_front();
    ++running_;
    if (lane != Lane::Blocking) {
      ++busy_;
    } else {
      ++blocking_;
      WakeForCore();  // this thread may have been woken for a core
    }
    return true;
  }
  return false;
}

// Runs one step of spare work if there is any and a core is free.
bool WorkerPool::HelpOut(std::unique_lock<std::mutex>& lock) {
  const auto found = HasRoom() ? FindSpare() : spare_.end();
  if (found == spare_.end()) return false;
  SpareWork& work = **found;
  ++work.running;
  ++busy_;
  WakeForCore();
  lock.unlock();
  coreOf = this;
  coreIsUrgent = false;
  bool more = false;
  (void)Guarded([&] { more = work.step(); });
  coreOf = nullptr;
  lock.lock();
  --busy_;
  if (returning_ > 0) core_.notify_one();
  --work.running;
  work.exhausted = work.exhausted || !more;
  helped_.notify_all();
  return true;
}

void WorkerPool::Work() {
  std::unique_lock lock(mutex_);
  for (;;) {
    if (Task task; TakeTask(task)) {
      lock.unlock();
      coreOf = task.lane != Lane::Blocking ? this : nullptr;
      coreIsUrgent = task.lane == Lane::Urgent;
      (void)Guarded(task.run);
      task.run = nullptr;  // destroy captured objects before the task counts as done
      coreOf = nullptr;
      lock.lock();
      --running_;
      if (task.lane != Lane::Blocking) {
        --busy_;
        if (returning_ > 0) core_.notify_one();
      } else {
        --blocking_;
      }
      const bool quiet = running_ == 0 && std::ranges::all_of(waiting_, [](const auto& lane) {
                           return lane.empty();
                         });
      if (!quiet || !quiet_) continue;
      lock.unlock();
      (void)Guarded(quiet_);
      lock.lock();
    } else if (!HelpOut(lock)) {
      if (ending_) return;
      ++idle_;
      wake_.wait(lock, [this] { return wakings_ > 0 || ending_; });
      --idle_;
      if (wakings_ > 0) --wakings_;
    }
  }
}

// Called with the lock held.
void WorkerPool::GiveCore() {
  --busy_;
  if (returning_ > 0) core_.notify_one();
  WakeForCore();
}

void WorkerPool::TakeCoreBack(std::unique_lock<std::mutex>& lock, bool urgent) {
  if (!urgent) {
    ++returning_;
    core_.wait(lock, [this] { return busy_ < cores_; });
    --returning_;
  }
  ++busy_;
}

bool CoreRelease::HoldsCore() { return coreOf != nullptr; }

CoreRelease::CoreRelease() : pool_(std::exchange(coreOf, nullptr)), urgent_(coreIsUrgent) {
  if (pool_ == nullptr) return;
  const std::lock_guard lock(pool_->mutex_);
  pool_->GiveCore();
}

CoreRelease::~CoreRelease() {
  if (pool_ == nullptr) return;
  std::unique_lock lock(pool_->mutex_);
  pool_->TakeCoreBack(lock, urgent_);
  coreOf = pool_;
  coreIsUrgent = urgent_;
}

Helpers::Helpers(WorkerPool& pool, unsigned most, std::function<bool()> step) : pool_(pool) {
  work_.step = std::move(step);
  work_.most = most;
  ownCore_ = coreOf == nullptr;
  if (ownCore_) coreOf = &pool_;
  if (ownCore_) coreIsUrgent = true;
  const std::lock_guard lock(pool_.mutex_);
  if (ownCore_) ++pool_.busy_;
  if (most == 0) return;
  pool_.spare_.push_back(&work_);
  pool_.WakeForCore();  // that one wakes the next
}

Helpers::~Helpers() {
  std::unique_lock lock(pool_.mutex_);
  std::erase(pool_.spare_, &work_);
  pool_.helped_.wait(lock, [this] { return work_.running == 0; });
  if (!ownCore_) return;
  coreOf = nullptr;
  pool_.GiveCore();
}

}  // namespace fotomill
