#pragma once

#include <wx/app.h>

#include <atomic>
#include <functional>
#include <memory>
#include <thread>

namespace fotomill::desktop {

// Work on a thread that nobody waits for, since a folder may hang: it is asked to stop, and what it tells when nobody is
// interested any more is dropped. Goes with the window that wants its results.
class LooseWork {
 public:
  // Has something done on the window's thread, unless the work was stopped meanwhile.
  using Tell = std::function<void(std::function<void()> action)>;

  LooseWork() = default;
  LooseWork(const LooseWork&) = delete;
  LooseWork& operator=(const LooseWork&) = delete;
  ~LooseWork() { Stop(); }

  // Runs `work` apart. Work that goes on is stopped first.
  void Start(std::function<void(const std::atomic<bool>& stop, const Tell& tell)> work) {
    Stop();
    stop_ = std::make_shared<std::atomic<bool>>(false);
    std::thread([stop = stop_, work = std::move(work)] {
      work(*stop, [&stop](std::function<void()> action) {
        if (*stop) return;
        wxTheApp->CallAfter([stop, action = std::move(action)] {
          if (!*stop) action();
        });
      });
    }).detach();
  }
  void Stop() {
    if (stop_ != nullptr) *stop_ = true;
    stop_.reset();
  }
  // Whether work was started that nobody stopped; who is told of its end stops it then.
  bool Started() const { return stop_ != nullptr; }

 private:
  std::shared_ptr<std::atomic<bool>> stop_;
};

}  // namespace fotomill::desktop
