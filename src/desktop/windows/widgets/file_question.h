#pragma once

#include <wx/timer.h>

#include <functional>
#include <utility>

#include "desktop/windows/widgets/loose_work.h"

namespace fotomill::desktop {

// The way for windows to ask the file system something: in the background, as it may hang. Owned by
// the window that needs the answer; nothing is called after it was destroyed. One question at a
// time: a new one replaces the pending one.
class FileQuestion {
 public:
  static constexpr int kPatienceMs = 1000;

  // Runs `question` on another thread, and `answered` on the window's thread with its result, also
  // if it could not be run: then with `unknown`. Runs `late` once if there is no answer after
  // kPatienceMs, to tell the user.
  template <typename Answer>
  void Ask(std::function<Answer()> question, std::function<void(Answer answer)> answered,
           std::function<void()> late = {}, Answer unknown = {}) {
    Forget();
    late_ = std::move(late);
    if (late_) timer_.StartOnce(kPatienceMs);
    work_.Start(
        [this, question = std::move(question), answered](const StopToken&,
                                                         const LooseWork::Report& report) {
          report([this, answered, answer = question()] {
            Forget();
            answered(answer);
          });
        },
        [this, answered, unknown] {
          Forget();
          answered(unknown);
        });
  }
  // The answer is no longer wanted.
  void Forget() {
    timer_.Stop();
    work_.Stop();
  }
  bool Pending() const { return work_.Started(); }

  FileQuestion() {
    timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
      if (late_) late_();
    });
  }

 private:
  std::function<void()> late_;
  wxTimer timer_;
  LooseWork work_;
};

}  // namespace fotomill::desktop
