#include "desktop/models/similar/similar_run.h"

#include <atomic>
#include <memory>
#include <numeric>
#include <set>
#include <utility>

#include "batch/picture_failure.h"
#include "core/workers/ordered_run.h"
#include "desktop/models/archive/archive_listing.h"
#include "desktop/models/batch/progress_status.h"
#include "desktop/models/files/folder_walk.h"
#include "metadata/exif/taken_date.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "texts/grouped_count.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr double kReportInterval = 0.1;  // seconds
constexpr double kGrace = 0.4;           // seconds that a step may still take after a stop

int64_t DateNumberOf(int64_t seconds) {
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  int64_t number = 0;
  for (const auto& [part, size] : {std::pair{time.year, 1},
                                   {time.month, 100},
                                   {time.day, 100},
                                   {time.hour, 100},
                                   {time.minute, 100},
                                   {time.second, 100}})
    number = number * size + part;
  return number;
}

class Run {
 public:
  Run(const SimilarQuestion& question, const StopToken& stop,
      const std::function<void(const SimilarProgress&)>& report)
      : question_(question),
        stop_(stop),
        report_(report),
        store_(question.store),
        search_(question.options, store_) {}

  SimilarFindings Find() {
    for (const std::string& folder : question_.folders) List(folder);
    search_.Read(files_, EventsOf(SimilarStage::Reading));
    Report({SimilarStage::Comparing, 0, files_.size()}, true);
    const std::vector<SimilarGroup> groups = search_.Group(files_, Grace());
    Date(groups);
    if (question_.sharpness) Measure(groups);
    for (const SimilarGroup& group : groups) Add(group);
    for (const ComparedFile& file : files_) Count(file);
    NoteStore();
    return std::move(findings_);
  }

  std::vector<float> Measured(const std::vector<std::string>& paths) {
    for (const std::string& path : paths) files_.push_back({.name = path});
    search_.Recall(files_);
    std::vector<size_t> all(files_.size());
    std::iota(all.begin(), all.end(), size_t{0});
    search_.Measure(files_, all, EventsOf(SimilarStage::Measuring));
    std::vector<float> measured;
    for (const ComparedFile& file : files_) measured.push_back(file.record.sharpness);
    return measured;
  }

 private:
  void Report(const SimilarProgress& progress, bool now) {
    const double time = platform::MonotonicSeconds();
    if (!now && time - reported_ < kReportInterval) return;
    reported_ = time;
    report_(progress);
  }

  SimilarEvents EventsOf(SimilarStage stage) {
    return {.hint = FailureText,
            .goesOn = [this] { return !stop_.Asked(); },
            .progress =
                [this, stage](uint64_t done, uint64_t count) {
                  Report({stage, done, count}, done == 1);
                }};
  }

  // For a step that shows what was read until a stop: it may go on for a while.
  std::function<bool()> Grace() const {
    return [this, end = std::make_shared<std::atomic<double>>(0)] {
      if (!stop_.Asked()) return true;
      const double now = platform::MonotonicSeconds();
      if (*end == 0) *end = now + kGrace;
      return now < *end;
    };
  }

  void List(const std::string& folder) {
    const auto take = [&](const std::vector<std::string>& names) {
      for (const std::string& name : names) {
        if (stop_.Asked()) return;
        if (IsArchiveName(name)) continue;
        std::string path = platform::JoinFolder(folder, name);
        const platform::FileStamp stamp = platform::StampOf(path);
        if (!stamp.there || stamp.link) continue;
        if (!seen_.insert({stamp.device, stamp.identity}).second) continue;
        files_.push_back({.name = std::move(path)});
        stamps_.push_back(stamp);
      }
      Report({SimilarStage::Listing, files_.size(), 0}, false);
    };
    WalkFolder(folder, question_.subfolders, stop_,
               {.files = take,
                .problem = [this](const std::string& why) { findings_.problems.push_back(why); }});
  }

  // Reads the dates of the pictures in groups. Those for which a stop leaves no time get the date
  // of the file.
  void Date(const std::vector<SimilarGroup>& groups) {
    std::vector<size_t> places;
    for (const SimilarGroup& group : groups)
      places.insert(places.end(), group.members.begin(), group.members.end());
    dates_.assign(files_.size(), 0);
    OrderedRun({.work =
                    [&](size_t i) {
                      const size_t place = places[i];
                      dates_[place] = TakenDate(files_[place].name);
                      return Status::Ok;
                    },
                .deliver = [](size_t, Status) {},
                .goesOn = Grace(),
                .tick = {}})
        .Run(places.size(), platform::CoreCount());
    for (const size_t place : places) {
      if (dates_[place] <= 0) dates_[place] = DateNumberOf(files_[place].record.modified);
    }
  }

  void Measure(const std::vector<SimilarGroup>& groups) {
    std::vector<size_t> places;
    for (const SimilarGroup& group : groups)
      places.insert(places.end(), group.members.begin(), group.members.end());
    search_.Measure(files_, places, EventsOf(SimilarStage::Measuring));
  }

  void Add(const SimilarGroup& group) {
    FoundGroup found{.pictures = {}, .distance = group.distance};
    for (const size_t place : group.members) {
      const HashRecord& record = files_[place].record;
      found.pictures.push_back({.path = files_[place].name,
                                .stamp = stamps_[place],
                                .modified = record.modified,
                                .width = record.width,
                                .height = record.height,
                                .date = dates_[place],
                                .sharpness = record.sharpness,
                                .severalPages =
                                    record.severalPages && !question_.options.exact});
    }
    findings_.groups.push_back(std::move(found));
  }

  void Count(const ComparedFile& file) {
    if (file.status == Status::Ok) {
      findings_.compared += file.known ? 1 : 0;
      return;
    }
    findings_.problems.push_back(file.name + ": " +
                                 (file.hint.empty() ? StatusText(file.status) : file.hint));
  }

  void NoteStore() {
    if (!store_.SetAside().empty()) {
      findings_.problems.push_back(
          Tr("\"%1\" was damaged; it is kept as \"%2\".", question_.store, store_.SetAside()));
    }
    if (!search_.Kept())
      findings_.problems.push_back(Tr("Results cannot be stored in \"%1\".", question_.store));
  }

  const SimilarQuestion& question_;
  const StopToken& stop_;
  const std::function<void(const SimilarProgress&)>& report_;
  HashStore store_;
  SimilarSearch search_;
  std::vector<ComparedFile> files_;
  std::vector<platform::FileStamp> stamps_;  // of the files
  std::vector<int64_t> dates_;               // of the files in groups
  std::set<std::pair<uint64_t, uint64_t>> seen_;
  SimilarFindings findings_;
  double reported_ = 0;
};

}  // namespace

std::string SimilarProgressText(const SimilarProgress& progress, double seconds) {
  std::string text;
  const std::string done = ThousandsText(progress.done);
  switch (progress.stage) {
    case SimilarStage::Listing:
      return TrGroupedCount("Listing the folders: %1 picture", "Listing the folders: %1 pictures",
                            progress.done);
    case SimilarStage::Comparing:
      return TrGroupedCount("Comparing %1 picture", "Comparing %1 pictures", progress.count);
    case SimilarStage::Reading:
      text = Tr("Reading picture %1 of %2", done, ThousandsText(progress.count));
      break;
    case SimilarStage::Measuring:
      text = Tr("Measuring the sharpness of picture %1 of %2", done, ThousandsText(progress.count));
      break;
  }
  const std::string left = TimeLeftText(seconds, progress.done, progress.count);
  return left.empty() ? text : text + ", " + left;
}

SimilarFindings FindSimilarPictures(const SimilarQuestion& question, const StopToken& stop,
                                    const std::function<void(const SimilarProgress&)>& report) {
  return Run(question, stop, report).Find();
}

std::vector<float> MeasurePictures(const std::vector<std::string>& paths,
                                   const SimilarQuestion& question, const StopToken& stop,
                                   const std::function<void(const SimilarProgress&)>& report) {
  return Run(question, stop, report).Measured(paths);
}

}  // namespace fotomill::desktop
