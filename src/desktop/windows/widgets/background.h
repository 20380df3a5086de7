#pragma once

#include <wx/event.h>

#include <functional>
#include <memory>

#include "core/workers/background_task.h"

namespace fotomill::desktop {

// Background work for a window. When destroyed,
// stops running work and waits for it.
class Background {
 public:
  // Runs `work` in the background, then `done` on the window's
  // thread, unless stopped: with MemoryAllocationError if the work
  // ran out of memory, otherwise Ok. Stops running work first.
  void Start(wxEvtHandler& window, std::function<void(const StopToken& stop)> work,
             std::function<void(Status)> done) {
    Stop();
    const auto wanted = std::make_shared<bool>(true);
    wanted_ = wanted;
    task_.Start(
        Lane::Blocking,
        [work = std::move(work)](const StopToken& stop) {
          work(stop);
          return stop.Asked() ? Status::FunctionCancelled : Status::Ok;
        },
        [&window, weak = std::weak_ptr(wanted), done = std::move(done)](Status status) {
          if (status == Status::FunctionCancelled) return;
          window.CallAfter([weak, status, done] {
            if (!weak.expired()) done(status);
          });
        });
  }
  // Stops the work and waits; `done` is not called.
  void Stop() {
    wanted_.reset();
    task_.StopAndWait();
  }

 private:
  std::shared_ptr<bool> wanted_;  // window's thread only
  BackgroundTask task_;
};

}  // namespace fotomill::desktop
