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

// When a task may begin, and whether it counts as keeping a core busy.
enum class Lane : uint8_t {
  Urgent,    // somebody looks at the screen for it: at once; counts, so that others wait instead
  Blocking,  // it mostly waits, for a network folder or for an answer: at once; does not count
  Compute,   // when a core is free, in the order of arrival; counts
};

// The threads of the program. Tasks that compute never keep more cores busy than there are; what
// waits for something slow does so without a core. Threads begin when they are needed and stay.
class WorkerPool {
 public:
  // `quiet` is called on a thread of the pool each time when nothing is left to do.
  explicit WorkerPool(unsigned cores, std::function<void()> quiet = {});
  // Waits for every task, also those that have not begun.
  ~WorkerPool();
  WorkerPool(const WorkerPool&) = delete;
  WorkerPool& operator=(const WorkerPool&) = delete;

  // The pool of the program. It is never destroyed: a task that hangs on a dead network folder does
  // not keep the program from ending. Its tasks' owners wait for theirs.
  static WorkerPool& Shared();

  // How many tasks and helpers the pool lets compute at a time, at least 1.
  unsigned Cores() const { return cores_; }

  // Has a task run on a thread of the pool. An exception that leaves it is dropped: who wants to
  // know wraps its work in Guarded. False when no thread can be had at all; the task is forgotten
  // then.
  [[nodiscard]] bool Run(Lane lane, std::function<void()> task);

 private:
  friend class Helpers;
  friend class CoreRelease;

  // What threads that have nothing better to do may help with; belongs to a Helpers.
  struct SpareWork {
    std::function<bool()> step;
    unsigned most = 0;     // threads at a time
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
  std::condition_variable wake_;    // a thread that waits for work
  std::condition_variable helped_;  // a step of spare work has ended
  std::condition_variable core_;    // a core has become free that a task wants back
  std::array<std::deque<std::function<void()>>, 3> waiting_;  // by lane
  std::list<SpareWork*> spare_;
  std::vector<std::thread> threads_;
  size_t idle_ = 0;      // threads that wait for work
  size_t wakings_ = 0;   // of these, those that were woken and have not noticed
  size_t running_ = 0;   // tasks
  size_t blocking_ = 0;  // of these, those of Lane::Blocking
  unsigned busy_ = 0;    // cores
  unsigned returning_ = 0;  // tasks that want their core back
  bool ending_ = false;
};

// Lets threads of the pool that have a core and nothing else to do help with work in small steps,
// while the calling thread does the same by itself. They begin and leave at any time: where the
// pool is busy with tasks, no one comes.
class Helpers {
 public:
  // `step` does a piece of the work, on up to `most` threads at once; false if there is none left
  // to begin.
  Helpers(WorkerPool& pool, unsigned most, std::function<bool()> step);
  // No further step begins; waits for those that have.
  ~Helpers();
  Helpers(const Helpers&) = delete;
  Helpers& operator=(const Helpers&) = delete;

 private:
  WorkerPool& pool_;
  WorkerPool::SpareWork work_;
  bool ownCore_ = false;  // the calling thread is no task of the pool, but computes as well
};

// For its lifetime, the task that makes it waits for something slow: its core is another one's. At
// the end it waits for a core, before any task that has not begun; one of Lane::Urgent does not
// wait.
class CoreRelease {
 public:
  CoreRelease();  // hands the thread's core to others while it waits
  ~CoreRelease();
  CoreRelease(const CoreRelease&) = delete;
  CoreRelease& operator=(const CoreRelease&) = delete;
  // Whether the calling thread is a task that has a core.
  static bool HoldsCore();

 private:
  WorkerPool* pool_;  // null when the thread holds no core
  bool urgent_ = false;
};

}  // namespace fotomill
