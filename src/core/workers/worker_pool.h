#pragma once

#include <array>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <list>
#include <mutex>
#include <thread>
#include <vector>

namespace fotomill {

// When a task may start, and whether it occupies a core.
enum class Lane : uint8_t {
  Urgent,    // the user is waiting for it: starts at once; counts, so other tasks wait instead
  Blocking,  // mostly waits, for a network folder or an answer: starts at once; does not count
  Compute,   // starts when a core is free, in FIFO order; counts
};

// The program's thread pool. Computing tasks never occupy more cores than there are; blocking tasks
// run without a core. Threads are started on demand and kept.
class WorkerPool {
 public:
  // `quiet` is called on a pool thread each time the pool becomes idle.
  explicit WorkerPool(unsigned cores, std::function<void()> quiet = {});
  // Waits for all tasks, including queued ones.
  ~WorkerPool();
  WorkerPool(const WorkerPool&) = delete;
  WorkerPool& operator=(const WorkerPool&) = delete;

  // The program's pool. It is never destroyed, so a task that hangs on a dead network folder cannot
  // keep the program from exiting. Task owners wait for their own tasks.
  static WorkerPool& Shared();

  // The number of tasks and helpers that may compute at the same time, at least 1.
  unsigned Cores() const { return cores_; }

  // Runs a task on a pool thread. Exceptions from it are
  // dropped; wrap the work in Guarded to see them. False
  // if no thread is available; the task is discarded then.
  [[nodiscard]] bool Run(Lane lane, std::function<void()> task);

 private:
  friend class Helpers;
  friend class CoreRelease;

  // Work that idle threads may help with; owned by a Helpers.
  struct SpareWork {
    std::function<bool()> step;
    unsigned most = 0;     // maximum number of threads
    unsigned running = 0;  // threads
    bool exhausted = false;
  };
  struct Task {
    std::function<void()> run;
    Lane lane = Lane::Blocking;
  };

  bool HasRoom() const { return busy_ + returning_ < cores_; }
  bool MayBegin(Lane lane) const;
  std::list<SpareWork*>::iterator FindSpare();
  bool TakeTask(Task& task);
  bool HelpOut(std::unique_lock<std::mutex>& lock);
  void WakeOne();
  void WakeForCore();
  void GiveCore();
  void TakeCoreBack(std::unique_lock<std::mutex>& lock, bool urgent);
  void Work();

  const unsigned cores_;
  const std::function<void()> quiet_;
  std::mutex mutex_;
  std::condition_variable wake_;    // threads waiting for work
  std::condition_variable helped_;  // a step of spare work is done
  std::condition_variable core_;    // a core is free for a task that wants it back
  std::array<std::deque<std::function<void()>>, 3> waiting_;  // by lane
  std::list<SpareWork*> spare_;
  std::vector<std::thread> threads_;
  size_t idle_ = 0;      // threads waiting for work
  size_t wakings_ = 0;   // of these, threads woken that have not run yet
  size_t running_ = 0;   // tasks
  size_t blocking_ = 0;  // of these, those of Lane::Blocking
  unsigned busy_ = 0;    // cores
  unsigned returning_ = 0;  // tasks waiting to get their core back
  bool ending_ = false;
};

// Has idle pool threads that can get a core help with work in small
// steps, while the calling thread does the same. They join and
// leave at any time; if the pool is busy with tasks, none may join.
class Helpers {
 public:
  // `step` does one piece of the work, on up to `most` threads at a time; false if there is nothing
  // left to start.
  Helpers(WorkerPool& pool, unsigned most, std::function<bool()> step);
  // Starts no further step; waits for running ones.
  ~Helpers();
  Helpers(const Helpers&) = delete;
  Helpers& operator=(const Helpers&) = delete;

 private:
  WorkerPool& pool_;
  WorkerPool::SpareWork work_;
  bool ownCore_ = false;  // the calling thread is not a pool task, but computes as well
};

// Marks the current task as waiting for something slow for its
// lifetime, releasing its core. The destructor waits for a core,
// ahead of queued tasks; a task of Lane::Urgent does not wait.
class CoreRelease {
 public:
  CoreRelease();  // releases the thread's core
  ~CoreRelease();
  CoreRelease(const CoreRelease&) = delete;
  CoreRelease& operator=(const CoreRelease&) = delete;
  // Whether the calling thread is a task with a core.
  static bool HoldsCore();

 private:
  WorkerPool* pool_;  // null when the thread holds no core
  bool urgent_ = false;
};

}  // namespace fotomill
