#include "batch/ordered_run.h"

#include <algorithm>
#include <chrono>
#include <system_error>
#include <utility>

namespace fotomill {

namespace {

constexpr std::chrono::milliseconds kTick{200};
constexpr size_t kMostThreads = 256;  // more only cost

}  // namespace

void OrderedRun::Run(size_t count, uint32_t threads) {
  threads = static_cast<uint32_t>(std::min({size_t{threads}, count, kMostThreads}));
  if (threads > 1) {
    states_.assign(count, State::AtWork);
    workers_.reserve(threads);
    working_ = threads;
    threaded_ = true;
    try {
      while (workers_.size() < threads) workers_.emplace_back([this] { Work(); });
    } catch (const std::system_error&) {  // those that there are do the work
      const std::lock_guard lock(mutex_);
      working_ -= threads - workers_.size();
    }
  }
  if (!workers_.empty()) return DeliverAll();
  threaded_ = false;
  for (size_t item = 0; item < count && steps_.goesOn(); ++item) {
    steps_.work(item);
    steps_.deliver(item);
  }
}

bool OrderedRun::InTurn(size_t item, const std::function<void()>& step) {
  if (!threaded_) {
    step();
    return true;
  }
  std::unique_lock lock(mutex_);
  states_[item] = State::Asking;
  answered_.wait(lock, [&] { return stopped_ || item == head_; });
  if (stopped_) return false;
  step_ = &step;
  delivered_.notify_one();
  answered_.wait(lock, [&] { return stopped_ || states_[item] == State::AtWork; });
  return states_[item] == State::AtWork;
}

void OrderedRun::Work() {
  for (;;) {
    std::unique_lock lock(mutex_);
    caughtUp_.wait(lock, [this] { return stopped_ || begun_ < head_ + steps_.ahead; });
    lock.unlock();
    const bool goesOn = steps_.goesOn();
    lock.lock();
    if (stopped_ || !goesOn || begun_ == states_.size()) {
      --working_;
      delivered_.notify_one();
      return;
    }
    const size_t item = begun_++;
    lock.unlock();
    steps_.work(item);
    lock.lock();
    states_[item] = State::Done;
    if (item == head_) delivered_.notify_one();
  }
}

void OrderedRun::DeliverAll() {
  std::unique_lock lock(mutex_);
  for (;;) {
    const bool waits = head_ < begun_ && states_[head_] != State::Done;
    if (step_ != nullptr) {
      const auto* const step = std::exchange(step_, nullptr);
      lock.unlock();
      (*step)();
      lock.lock();
      states_[head_] = State::AtWork;
      answered_.notify_all();
    } else if (head_ < begun_ && !waits) {
      lock.unlock();
      steps_.deliver(head_);
      lock.lock();
      ++head_;
      if (begun_ >= head_ + steps_.ahead - 1) caughtUp_.notify_all();
      if (head_ < begun_ && states_[head_] == State::Asking) answered_.notify_all();
    } else if (working_ == 0 && head_ == begun_) {
      return;
    } else if (delivered_.wait_for(lock, kTick) == std::cv_status::timeout && steps_.tick) {
      lock.unlock();
      steps_.tick();
      lock.lock();
    }
  }
}

void OrderedRun::Stop() {
  {
    const std::lock_guard lock(mutex_);
    stopped_ = true;
    answered_.notify_all();
    caughtUp_.notify_all();
  }
  for (std::thread& worker : workers_) worker.join();
}

}  // namespace fotomill
