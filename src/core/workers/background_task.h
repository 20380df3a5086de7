#pragma once

#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "core/workers/worker_pool.h"

namespace fotomill {

// A single background task with an owner: destroying
// it requests a stop and waits for the end.
class BackgroundTask {
 public:
  using Work = std::function<Status(const StopToken& stop)>;

  BackgroundTask() = default;
  ~BackgroundTask() { StopAndWait(); }
  BackgroundTask(const BackgroundTask&) = delete;
  BackgroundTask& operator=(const BackgroundTask&) = delete;

  // Stops and waits for the previous work, then runs `work` on a pool thread, followed by `ended`
  // with its status: MemoryAllocationError if it ran out of memory, or if no thread is available;
  // in that case `ended` is called right here.
  void Start(Lane lane, Work work, std::function<void(Status)> ended = {});
  void Stop();         // does not wait
  void StopAndWait();  // not on the task's own thread
  void Wait();         // until it has ended
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

// Runs work that may hang, so that no one waits for it: `work` must own, or share ownership of,
// everything it uses. False if no thread is available.
bool RunLoose(std::function<void()> work);

}  // namespace fotomill
