#include "batch/rename/sequential_rename.h"

#include <algorithm>
#include <numeric>
#include <random>
#include <set>
#include <string>
#include <utility>

#include "core/plain_name.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr double kStoreInterval = 1;  // seconds between writes of the next number

// Saves the first number of the next run in the job: a few times a second at most, and at the end.
class NextNumber {
 public:
  NextNumber(const BatchJob& job, bool on) : job_(job), on_(on) {}
  ~NextNumber() { Store(); }
  NextNumber(const NextNumber&) = delete;
  NextNumber& operator=(const NextNumber&) = delete;

  void Set(uint32_t number) {
    number_ = number;
    set_ = on_;
    if (platform::MonotonicSeconds() - stored_ > kStoreInterval) Store();
  }

 private:
  void Store() {
    if (!set_) return;
    set_ = false;
    stored_ = platform::MonotonicSeconds();
    job_.remember(Remembered::NextRenameNumber,
                  static_cast<int32_t>(std::min<uint32_t>(number_, INT32_MAX)));
  }

  const BatchJob& job_;
  const bool on_;
  bool set_ = false;
  uint32_t number_ = 0;
  double stored_ = platform::MonotonicSeconds();
};

std::string NewBaseName(const BatchJob& job, const SequentialRenameRules& rules,
                        std::string_view oldBase) {
  const std::string number = NumberText(job.rename.number, job.rename.digits);
  if (rules.numberFirst) return number + rules.separator + std::string(oldBase);
  return std::string(job.rename.baseName.view()) + rules.separator + number;
}

std::string RenameHint(const std::string& path, const SequentialRenameRules& rules,
                       const BatchJob& job) {
  if (!rules.numberFirst && !IsPlainName(job.rename.baseName.view()))
    return Tr("The base name must be part of a file name, not a path.");
  if (path.size() > PathText::Capacity())
    return Tr("The path would be longer than 260 characters.");
  return {};
}

FileOutcome RenameOne(const BatchFile& file, const SequentialRenameRules& rules,
                      const std::set<std::string>& sidecars, RenamedFiles& files, BatchJob& job) {
  FileOutcome outcome{.source = file.name, .status = file.status, .hint = file.hint};
  const std::string path = platform::AbsolutePath(file.name);
  if (outcome.status == Status::Ok &&
      (sidecars.contains(path) || files.WentAlong(path) || WentWithPicture(path, job.changes))) {
    outcome.destination = file.name;
    outcome.skipped = true;
    outcome.hint = Tr(kRenamedWithPicture);
    return outcome;
  }
  if (outcome.status == Status::Ok &&
      (!files.Exists(file.name) || !platform::IsRegularFile(file.name))) {
    outcome.status = Status::FileOpenError;
  }
  if (outcome.status != Status::Ok) return outcome;
  outcome.destination = file.name;
  outcome.status = RenameSequentially(job, outcome.destination, rules, files);
  if (outcome.status != Status::Ok) {
    outcome.hint = RenameHint(outcome.destination, rules, job);
    if (outcome.hint.empty()) outcome.hint = ReasonSentence();
  } else if (outcome.destination == file.name) {
    outcome.skipped = true;
    outcome.hint = Tr("skipped: the new name is not available.");
  } else if (!files.IsNoted()) {
    outcome.note = TrRecorded(kRenameNotNoted);
  }
  return outcome;
}

}  // namespace

std::string NumberText(uint32_t number, int32_t digits) {
  const std::string text = std::to_string(number);
  const auto width = static_cast<size_t>(std::max(digits, 0));
  return text.size() < width ? std::string(width - text.size(), '0') + text : text;
}

Status RenameSequentially(BatchJob& job, std::string& path, const SequentialRenameRules& rules,
                          RenamedFiles& files) {
  const std::string old = path;
  const platform::PathParts parts = platform::SplitPath(old);
  for (uint32_t attempt = 1; attempt < rules.maxAttempts; ++attempt) {
    path = platform::JoinPath(
        {parts.drive, parts.folder, NewBaseName(job, rules, parts.base), parts.extension});
    if (!RenameHint(path, rules, job).empty()) return Status::RenameError;
    const bool free = path != old && !files.Exists(path);
    const platform::CommitResult result =
        free ? files.Rename(old, path) : platform::CommitResult::Taken;
    if (UINT32_MAX - job.rename.number < rules.increment && result != platform::CommitResult::Done)
      return Status::RenameError;
    job.rename.number += rules.increment;
    if (result == platform::CommitResult::Done) {
      NoteRename(old, path, files.IsDryRun(), job);
      return Status::Ok;
    }
    if (rules.skipColliding) {
      path = old;
      return Status::Ok;
    }
    // another number would not help
    if (result == platform::CommitResult::Failed) return Status::RenameError;
  }
  return Status::RenameError;
}

// Fisher-Yates shuffle with the Mersenne Twister, whose numbers are standardized.
std::vector<size_t> RandomOrder(size_t count, uint64_t seed) {
  std::vector<size_t> order(count);
  std::iota(order.begin(), order.end(), size_t{0});
  std::mt19937_64 numbers(seed);
  for (size_t i = count; i > 1; --i) std::swap(order[i - 1], order[numbers() % i]);
  return order;
}

void RunRename(std::span<const BatchFile> files, const RenameOptions& options, BatchJob& job) {
  if (!OpenProgressBox(job)) return;
  const SequentialRenameRules& rules = options.rules;
  job.rename = {.number = rules.number, .digits = rules.digits, .baseName = {}};
  job.rename.baseName.AssignCut(rules.baseName);
  std::vector<size_t> order(files.size());
  std::iota(order.begin(), order.end(), size_t{0});
  if (rules.random)
    order = RandomOrder(files.size(), options.seed ? *options.seed : std::random_device()());
  const bool remembers = rules.update && !options.dryRun && job.remember;
  RenameLog log(remembers ? std::optional(rules.number) : std::nullopt);
  RenamedFiles renamed(options.dryRun, &log, options.commentExtension);
  NextNumber next(job, remembers);
  const std::set<std::string> sidecars = SidecarsOfListed(files, options.commentExtension);
  const StopToken stop = job.stop.Token();
  uint32_t done = 0;
  for (const size_t place : order) {
    if (stop.Asked() || (job.box != nullptr && !job.box->GoesOn())) break;
    job.source.AssignCut(files[place].name);
    const uint32_t before = job.rename.number;
    const FileOutcome outcome = RenameOne(files[place], rules, sidecars, renamed, job);
    if (job.rename.number != before) next.Set(job.rename.number);
    ReportOutcome(job, outcome, done++, static_cast<uint32_t>(files.size()));
  }
  MarkChangedRecords(std::exchange(job.changes, {}));
  FinishProgress(job);
}

}  // namespace fotomill
