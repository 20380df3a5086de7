#pragma once

#include <wx/app.h>

#include <functional>
#include <memory>

#include "core/workers/background_task.h"
#include "core/workers/guarded.h"

namespace fotomill::desktop {

// Background work that is never waited for, as the file system may hang: it is asked to stop, and
// its later reports are ignored. Owned by the window that needs the results.
class LooseWork {
 public:
  // Runs an action on the window's thread, unless the work was stopped meanwhile.
  using Report = std::function<void(std::function<void()> action)>;

  LooseWork() = default;
  LooseWork(const LooseWork&) = delete;
  LooseWork& operator=(const LooseWork&) = delete;
  ~LooseWork() { Stop(); }

  // Runs `work` in the background; if memory runs out, `failed` on the window's thread. Stops
  // running work first.
  void Start(
      std::function<void(const StopToken& stop, const Report& report)> work,
      std::function<void()> failed = [] {}) {
    Stop();
    source_ = std::make_unique<StopSource>();
    const auto report = [stop = source_->Token()](std::function<void()> action) {
      if (stop.Asked()) return;
      wxTheApp->CallAfter([stop, action = std::move(action)] {
        if (!stop.Asked()) action();
      });
    };
    const bool begun = RunLoose([stop = source_->Token(), report, work = std::move(work), failed] {
      if (Guarded([&] { work(stop, report); }) != Status::Ok) report(failed);
    });
    if (!begun) report(std::move(failed));
  }
  // Does not wait; later reports are ignored.
  void Stop() {
    if (source_) source_->Stop();
    source_.reset();
  }
  // Whether work was started and not stopped; call Stop when it reports its end.
  bool Started() const { return source_ != nullptr; }

 private:
  std::unique_ptr<StopSource> source_;
};

}  // namespace fotomill::desktop
