#include "desktop/windows/history/use_recorder.h"

#include <utility>

#include "settings/job_options.h"

namespace fotomill::desktop {

namespace {

constexpr int kWriteMs = 2000;  // after the last use

}  // namespace

UseRecorder::UseRecorder() {
  timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Flush(); });
}

void UseRecorder::Note(const std::vector<FileUse>& uses) {
  uses_.insert(uses_.end(), uses.begin(), uses.end());
  if (!uses.empty()) timer_.StartOnce(kWriteMs);
}

void UseRecorder::Flush() {
  if (!uses_.empty())
    (void)UpdateFileHistory(HistoryOptionsFromSettings(), std::exchange(uses_, {}));
}

}  // namespace fotomill::desktop
