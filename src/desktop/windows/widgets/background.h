#pragma once

#include <wx/event.h>

#include <functional>
#include <memory>

#include "core/workers/background_task.h"

namespace fotomill::desktop {

// Work that a window has done apart. Goes with the window: what is in work is asked to stop and
// waited for.
class Background {
 public:
  // Runs `work` apart, and then `done` on the window's thread, unless it was stopped: with
  // MemoryAllocationError where the work ran out of memory, Ok otherwise. Work that goes on is
  // stopped first.
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
  // Asks the work to stop and waits for it; `done` is not called any more.
  void Stop() {
    wanted_.reset();
    task_.StopAndWait();
  }

 private:
  std::shared_ptr<bool> wanted_;  // belongs to the window's thread
  BackgroundTask task_;
};

}  // namespace fotomill::desktop
