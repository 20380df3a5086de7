#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <vector>

#include "core/status.h"
#include "core/workers/worker_pool.h"

namespace fotomill {

// Processes numbered items on several threads of the pool, with results delivered as if they were
// processed one after the other.
class OrderedRun {
 public:
  // The callbacks of a run.
  struct Steps {
    std::function<Status(size_t item)> work;  // on any thread, several at a time
    // On the calling thread, in order, once the item is processed: with the status of `work`, or
    // MemoryAllocationError if it ran out of memory.
    std::function<void(size_t item, Status status)> deliver;
    // on any thread, before an item is started; false: start no more
    std::function<bool()> goesOn;
    std::function<void()> tick;    // on the calling thread, a few times a second while it waits
    // maximum number of items started but not yet delivered
    size_t ahead = 1024;
  };

  // The pool must outlive the run.
  explicit OrderedRun(Steps steps, WorkerPool& pool = WorkerPool::Shared())
      : steps_(std::move(steps)), pool_(pool) {}
  OrderedRun(const OrderedRun&) = delete;
  OrderedRun& operator=(const OrderedRun&) = delete;
  ~OrderedRun() { Stop(); }

  // Processes items 0 to count - 1, at most `jobs` at a time and
  // no more than there are cores, and delivers all that were
  // started. With one job, everything runs on the calling thread.
  void Run(size_t count, uint32_t jobs);

  // For use by `work`: waits until all earlier items are delivered, then runs `step` on the thread
  // that called Run. The core is free for other work meanwhile. False if the run was canceled;
  // `step` has not run then.
  bool InTurn(size_t item, const std::function<void()>& step);

 private:
  enum class State : uint8_t { AtWork, Asking, Done };
  struct Item {
    State state = State::AtWork;
    Status status = Status::Ok;
  };

  bool StartWorker();
  void WorkOnOne();
  void ResumeWorkers();
  void DeliverAll();
  void Stop();

  const Steps steps_;
  WorkerPool& pool_;
  std::mutex mutex_;
  std::condition_variable delivered_;  // signals the calling thread
  std::condition_variable answered_;   // a step has run
  std::vector<Item> items_;
  size_t begun_ = 0;                             // items before this one were started
  size_t head_ = 0;                              // the next item to deliver
  // tasks in the pool, each processing one item at a time
  size_t workers_ = 0;
  // workers waiting for deliveries
  size_t parked_ = 0;
  const std::function<void()>* step_ = nullptr;  // of the head item, while it waits for an answer
  bool threaded_ = false;
  bool stopped_ = false;
};

}  // namespace fotomill
