#pragma once

#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "core/workers/worker_pool.h"

namespace fotomill {

// One piece of work apart that belongs to somebody: it goes with its owner, who asks it to stop and
// waits for it.
class BackgroundTask {
 public:
  using Work = std::function<Status(const StopToken& stop)>;

  BackgroundTask() = default;
  ~BackgroundTask() { StopAndWait(); }
  BackgroundTask(const BackgroundTask&) = delete;
  BackgroundTask& operator=(const BackgroundTask&) = delete;

  // Stops and waits for what was started before, then has `work` run on a thread of the pool, and
  // `ended` behind it with the status; MemoryAllocationError when the work ran out of memory, or no
  // thread can be had: `ended` is called here then.
  void Start(Lane lane, Work work, std::function<void(Status)> ended = {});
  void Stop();         // without waiting
  void StopAndWait();  // not on the task's own thread
  void Wait();         // for its end
  bool Running() const;

 private:
  struct State {
    StopSource stop;
    std::mutex mutex;
    std::condition_variable ended;
    bool running = true;
  };
  std::shared_ptr<State> state_;
};

// Work that no one waits for, since it may hang: `work` has to hold, or to ask for, all that it
// uses. False when no thread can be had.
bool RunLoose(std::function<void()> work);

}  // namespace fotomill
