#pragma once

#include <wx/event.h>

#include <atomic>
#include <functional>
#include <memory>
#include <thread>

namespace fotomill::desktop {

// Work that a window has done on a thread of its own. Goes with the window: what is in work is asked to stop and waited for.
class Background {
 public:
  ~Background() { Stop(); }

  // Runs `work` apart, and then `done` on the window's thread, unless it was stopped. Work that goes on is stopped first.
  void Start(wxEvtHandler& window, std::function<void(const std::atomic<bool>& stop)> work, std::function<void()> done) {
    Stop();
    job_ = std::make_shared<Job>();
    job_->thread = std::thread(
        [job = job_.get(), shared = std::weak_ptr<Job>(job_), &window, work = std::move(work), done = std::move(done)] {
          work(job->stop);
          if (job->stop) return;
          window.CallAfter([shared, done] {
            const std::shared_ptr<Job> still = shared.lock();
            if (still != nullptr && !still->stop) done();
          });
        });
  }
  void Stop() {
    if (job_ == nullptr) return;
    job_->stop = true;
    job_->thread.join();
    job_.reset();
  }

 private:
  struct Job {
    std::atomic<bool> stop{false};
    std::thread thread;
  };
  std::shared_ptr<Job> job_;
};

}  // namespace fotomill::desktop
