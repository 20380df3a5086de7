#pragma once

#include <wx/app.h>

#include <functional>
#include <memory>
#include <utility>

#include "core/workers/background_task.h"
#include "core/workers/stop_token.h"

namespace fotomill::desktop {

// Calls from other threads to a window, which owns this object: run on the window's thread, and
// dropped once the window was destroyed, so that it need not wait for those threads.
class WindowCalls {
 public:
  using Post = std::function<void(std::function<void()> action)>;

  WindowCalls() = default;
  WindowCalls(const WindowCalls&) = delete;
  WindowCalls& operator=(const WindowCalls&) = delete;
  ~WindowCalls() { source_.Stop(); }

  // For any thread; may outlive this object.
  Post Poster() const {
    return [stop = source_.Token()](std::function<void()> action) {
      if (stop.Asked()) return;
      wxTheApp->CallAfter([stop, action = std::move(action)] {
        if (!stop.Asked()) action();
      });
    };
  }

 private:
  StopSource source_;
};

// Destroys an object on another thread, for destructors that wait for running work. It must not
// call back into its owner any more, except with WindowCalls.
template <typename Worker>
void DestroyInBackground(std::unique_ptr<Worker> worker) {
  (void)RunLoose(
      [worker = std::shared_ptr<Worker>(std::move(worker))]() mutable { worker.reset(); });
}

}  // namespace fotomill::desktop
