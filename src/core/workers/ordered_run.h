#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <vector>

#include "core/status.h"
#include "core/workers/worker_pool.h"

namespace fotomill {

// Work on numbered items that runs on several threads of the pool and looks from outside as if it
// were done one item after the other.
class OrderedRun {
 public:
  // What is done with items, and when.
  struct Steps {
    std::function<Status(size_t item)> work;  // on any thread, several at a time
    // On the calling thread, in order, once the item's work is done: with what it returned, or
    // MemoryAllocationError where it ran out of memory.
    std::function<void(size_t item, Status status)> deliver;
    // on any thread, before an item is begun; false: no more are begun
    std::function<bool()> goesOn;
    std::function<void()> tick;    // on the calling thread, a few times a second while it waits
    // an item is not begun while so many before it wait to be delivered
    size_t ahead = 1024;
  };

  // The pool must outlive the run.
  explicit OrderedRun(Steps steps, WorkerPool& pool = WorkerPool::Shared())
      : steps_(std::move(steps)), pool_(pool) {}
  OrderedRun(const OrderedRun&) = delete;
  OrderedRun& operator=(const OrderedRun&) = delete;
  ~OrderedRun() { Stop(); }

  // Works on items 0 to count - 1, at most `jobs` of them at a time and no more than there are
  // cores for, and delivers those that were begun. With one job all of it happens on the calling
  // thread.
  void Run(size_t count, uint32_t jobs);

  // For the work on an item: waits until every item before it is delivered, then runs `step` on the
  // calling thread of Run. Other work has the core meanwhile. False when the run is given up;
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
  std::condition_variable delivered_;  // something for the calling thread
  std::condition_variable answered_;   // a step has run
  std::vector<Item> items_;
  size_t begun_ = 0;                             // items before this one were begun
  size_t head_ = 0;                              // the item that is delivered next
  // tasks of the pool, each works on an item at a time
  size_t workers_ = 0;
  // of these, those that wait until more is delivered
  size_t parked_ = 0;
  const std::function<void()>* step_ = nullptr;  // of the head item, while it asks
  bool threaded_ = false;
  bool stopped_ = false;
};

}  // namespace fotomill
