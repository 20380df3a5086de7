#include "desktop/windows/history/use_recorder.h"

#include <utility>

#include "platform/clock.h"
#include "settings/job_options.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kWriteMs = 2000;  // after the last use

}  // namespace

UseRecorder::UseRecorder() {
  timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Flush(); });
}

void UseRecorder::Note(const std::vector<FileUse>& uses) {
  if (settings.FileHistoryEnable == 0) return;
  uses_.insert(uses_.end(), uses.begin(), uses.end());
  if (!uses.empty()) timer_.StartOnce(kWriteMs);
}

void UseRecorder::NoteAll(const std::vector<std::string>& paths, FileFunction function) {
  std::vector<FileUse> uses;
  for (const std::string& path : paths) {
    uses.push_back(
        {.path = path, .function = function, .accessed = static_cast<int32_t>(platform::Now())});
  }
  Note(uses);
}

// While the history is disabled, uses are kept in memory, as the user may enable it again before
// the program ends.
void UseRecorder::Flush() {
  if (!uses_.empty() && settings.FileHistoryEnable != 0)
    (void)UpdateFileHistory(HistoryOptionsFromSettings(), std::exchange(uses_, {}));
}

void UseRecorder::End() {
  Flush();
  if (settings.FileHistoryEnable == 0) (void)UpdateFileHistory(HistoryOptionsFromSettings(), {});
}

}  // namespace fotomill::desktop
