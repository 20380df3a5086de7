#pragma once

#include <wx/app.h>

#include <functional>
#include <memory>

#include "core/workers/background_task.h"
#include "core/workers/guarded.h"

namespace fotomill::desktop {

// Work that no one waits for, since a folder may hang: it is asked to stop, and what it reports
// when nobody is interested any more is dropped. Goes with the window that wants its results.
class LooseWork {
 public:
  // Has something done on the window's thread, unless the work was stopped meanwhile.
  using Report = std::function<void(std::function<void()> action)>;

  LooseWork() = default;
  LooseWork(const LooseWork&) = delete;
  LooseWork& operator=(const LooseWork&) = delete;
  ~LooseWork() { Stop(); }

  // Runs `work` apart; where it runs out of memory, `failed` on the window's thread. Work that goes
  // on is stopped first.
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
  // Does not wait; what the work reports from here on is dropped.
  void Stop() {
    if (source_) source_->Stop();
    source_.reset();
  }
  // Whether work was started that nobody stopped; who is told of its end stops it then.
  bool Started() const { return source_ != nullptr; }

 private:
  std::unique_ptr<StopSource> source_;
};

}  // namespace fotomill::desktop
