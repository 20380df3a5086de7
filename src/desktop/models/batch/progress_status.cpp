#include "desktop/models/batch/progress_status.h"

#include <algorithm>
#include <cmath>

#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr double kTimeLeftAfter = 3;  // seconds

std::string StoppingText(const ProgressWork& work) {
  if (work.inWork > 1)
    return TrCount("Stopping when %1 file is done...", "Stopping when %1 files are done...",
                   work.inWork);
  if (work.file.empty()) return Tr("Stopping...");
  return Tr("Stopping when %1 is done...", platform::FileNameOf(work.file));
}

}  // namespace

std::string TimeLeftText(double seconds, uint64_t done, uint64_t count) {
  if (seconds < kTimeLeftAfter || done == 0 || done >= count) return {};
  const double each = seconds / static_cast<double>(done);
  const auto left = std::lround(std::ceil(each * static_cast<double>(count - done)));
  return left < 60 ? Tr("%1 s left", left) : Tr("%1 min left", (left + 59) / 60);
}

std::string ProgressStatusLine(const ProgressFacts& facts) {
  const ProgressWork& work = facts.work;
  if (facts.ended) return facts.status;
  if (facts.stopping) return StoppingText(work);
  std::string line = facts.status;
  if (work.count > 0)
    line = Tr("Processing file %1 of %2", std::min(work.done + 1, work.count), work.count);
  if (const std::string left = TimeLeftText(facts.seconds, work.done, work.count); !left.empty())
    line.append(", ").append(left);
  if (facts.waiting > 0)
    line.append(", ").append(
        TrCount("%1 batch is waiting", "%1 batches are waiting", facts.waiting));
  if (!work.file.empty()) line.append(": ").append(platform::FileNameOf(work.file));
  return line;
}

}  // namespace fotomill::desktop
