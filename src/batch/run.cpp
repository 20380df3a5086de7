#include "batch/run.h"

#include <algorithm>
#include <mutex>
#include <optional>

#include "batch/destination_name.h"
#include "batch/output_writer.h"
#include "batch/picture_failure.h"
#include "batch/prompts.h"
#include "batch/reported_run.h"
#include "batch/run_names.h"
#include "core/plain_name.h"
#include "core/text.h"
#include "metadata/exif/picture_exif.h"
#include "operations/engine.h"
#include "platform/files.h"
#include "platform/held_file.h"
#include "platform/paths.h"
#include "platform/reason.h"
#include "platform/temporary_file.h"
#include "platform/volumes.h"
#include "processing/palette/reduce.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr const char* kNoName = TrLater("The name would be empty or contain a folder.");
constexpr const char* kTooLong = TrLater("The path would be longer than 260 characters.");

constexpr const char* kOneFile =
    TrLater("Its pages would be several files; choose one with --page.");

// Whether choosing a name needs more than checking the folder.
bool AsksEveryName(const BatchJob& job) {
  if (job.formatIndex == kNoFormat)
    return job.prompts != nullptr && (job.naming.askName || job.naming.askPassword);
  const FormatEntry& row = FormatRow(job.formatIndex);
  if ((row.flags & FMT_CLIPBOARD) != 0) return true;
  return job.prompts != nullptr &&
         (job.naming.askName || (job.naming.askPassword && row.takesPassword));
}

// The file name of a page: "scan-03.png" from "scan.png". All numbers have the same width.
std::string NumberedPage(const std::string& path, int32_t page, int32_t pages) {
  const std::string digits = std::to_string(page);
  const size_t width = std::to_string(pages).size();
  const std::string_view extension = platform::ExtensionOf(path);
  const size_t end = path.size() - (extension.empty() ? 0 : extension.size() + 1);
  return path.substr(0, end) + "-" + std::string(width - digits.size(), '0') + digits +
         path.substr(end);
}

FileOutcome Failure(const BatchFile& file, Status status, std::string hint = {}) {
  return {.source = file.name, .status = status, .hint = std::move(hint)};
}

class Batch {
 public:
  Batch(std::span<const BatchFile> files, const BatchFunction& function, BatchJob& job)
      : files_(files),
        function_(function),
        job_(job),
        prefix_(function.prefix ? *function.prefix
                                : std::string(job.naming.PrefixOf(function.history))),
        asksEveryName_(AsksEveryName(job)),
        outputs_(function.outputs),
        needsPicture_(std::ranges::any_of(outputs_, &BatchOutput::nameNeedsPicture)),
        writer_(function, job),
        run_(files, job,
             {.process = [this](size_t i) { return Process(i); },
              .history = function.history,
              .dryRun = function.dryRun}) {
    if (outputs_.empty()) outputs_.emplace_back();
    for (const BatchFile& file : files_) {
      if (file.status != Status::Ok) continue;
      names_.AddSource(file.name);
      for (const OutputTarget& target : TargetsOf(file)) {
        if (!target.path.empty()) names_.AddPlanned(target.path);
      }
    }
    TakeRules();
  }

  void Run() { run_.Run(function_.jobs); }

 private:
  // The rules for existing files, as of the last answer.
  struct Rules {
    OverwritePolicy overwrite;
    bool applyToRest = false;
    bool asks = false;
    bool skipNames = false;
  };

  void TakeRules() {
    rules_ = {job_.overwrite, job_.applyToRest, AsksAboutCollisions(job_), job_.naming.skipNames};
  }

  std::vector<OutputTarget> TargetsOf(const BatchFile& file) const {
    std::vector<OutputTarget> targets;
    for (const BatchOutput& output : outputs_) {
      OutputTarget& target =
          targets.emplace_back(TargetOf(file.name, output, job_, function_.fallback));
      if (!output.nameNeedsPicture) target.path = PathOf(file, target, nullptr);
    }
    return targets;
  }

  // The path of an output; empty if its name is empty.
  std::string PathOf(const BatchFile& file, const OutputTarget& target,
                     const PictureRecord* picture) const {
    if (!function_.out.empty()) return function_.out;
    const BatchOutput& output = *target.output;
    std::string base;
    if (output.name) {
      base = function_.prefix.value_or(std::string()) + output.name(file.name, picture);
      if (!IsPlainName(base) || base.empty()) return {};
    } else {
      base = prefix_ + std::string(platform::SplitPath(file.name).base);
      if (!output.label.empty()) base.append("-").append(output.label);
    }
    const std::string_view below =
        function_.keepTree ? std::string_view(file.below) : std::string_view();
    return PlannedDestination(file.name, {target.extension, below, output.folder, base}, job_);
  }

  // On any thread: processes one file from source to outputs. None if canceled before it had a
  // name.
  std::vector<FileOutcome> Process(size_t i) {
    const BatchFile& file = files_[i];
    if (file.status != Status::Ok) return {Failure(file, file.status, file.hint)};
    std::vector<OutputTarget> targets = TargetsOf(file);
    std::vector<std::string> planned;
    for (const OutputTarget& target : targets) planned.push_back(target.path);
    // If another file's output may replace this source, they must run in selection order.
    if (names_.IsOutputOfOthers(file.name, planned) && !run_.InTurn(i, [] {})) return {};
    std::vector<FileOutcome> outcomes(targets.size());
    std::vector<size_t> open;  // outputs that need the picture
    for (size_t k = 0; k < targets.size(); ++k) {
      if (!IsSettledEarly(i, targets[k], outcomes[k])) open.push_back(k);
    }
    if (open.empty()) return outcomes;
    platform::HeldFile held;  // held before reading, if an output will replace the source
    const bool inPlace = std::ranges::any_of(
        targets, [&](const OutputTarget& target) { return target.path == file.name; });
    if (inPlace && !function_.dryRun && !held.Hold(file.name)) return {NotHeld(file)};
    PicturePointer picture;
    if (const Status status = Load(file.name, std::max(function_.page, 1), picture);
        status != Status::Ok) {
      return {Failure(file, status, LoadHint(file.name, status, picture.get()))};
    }
    const bool animated =
        picture->formatIndex != kNoFormat && FormatRow(picture->formatIndex).animate != nullptr;
    if (function_.transform && !IsOnlyPlanned()) {
      if (const Status status = function_.transform(*picture); status != Status::Ok)
        return {Failure(file, status, WorkHint(status))};
    }
    for (const size_t k : open) {
      ChoosePages(*picture, animated, targets[k]);
      if (targets[k].pages > 0) {
        if (function_.oneFile) return {Failure(file, Status::UnsuitableImage, Tr(kOneFile))};
        if (!ProduceNumbered(i, targets[k], held, outcomes)) return {};
        continue;
      }
      auto outcome = Produce(i, targets[k], picture, k == open.back(), held);
      if (!outcome) return {};
      outcomes[k] = std::move(*outcome);
      outcomes[k].output = targets[k].output->label;
    }
    // numbered outputs have added their own outcomes
    std::erase_if(outcomes, [](const FileOutcome& outcome) { return outcome.source.empty(); });
    return outcomes;
  }

  // Whether a dry run does not need the pictures.
  bool IsOnlyPlanned() const { return function_.dryRun && !needsPicture_; }

  // Whether the result of an output is known without the picture; then sets `outcome`.
  bool IsSettledEarly(size_t i, const OutputTarget& target, FileOutcome& outcome) {
    const BatchFile& file = files_[i];
    outcome.output = target.output->label;
    if (target.output->nameNeedsPicture) return false;
    Destination destination;
    destination.path = target.path;
    if (target.path.empty() || target.path.size() > PathText::Capacity()) {
      outcome = Failure(file, Status::InvalidDestination, target.path.empty() ? kNoName : kTooLong);
    } else if (function_.page != kAllPages && IsLeftOut(i, destination)) {
      outcome = Skipped(file, destination);
    } else {
      return false;
    }
    outcome.output = target.output->label;
    return true;
  }

  // Decides whether an output gets several pictures, and how.
  void ChoosePages(const PictureRecord& picture, bool animated, OutputTarget& target) const {
    if (picture.pageCount < 2 || function_.page > 0 || picture.formatIndex == kNoFormat) return;
    BindPluginRow(target);
    const FormatEntry& to = FormatRow(target.formatIndex);
    const bool animation = animated && (to.flags & FMT_FRAMES) != 0;
    const bool all =
        function_.page == kAllPages ||
        std::ranges::find(job_.everyPage, to.extension.view()) != job_.everyPage.end();
    // PNG and plug-ins have frames, but not pages
    const bool holds = to.sequence != nullptr && target.output->mostBytes == 0 &&
                       (animation || (all && (to.flags & (FMT_PNG | FMT_SPARE)) == 0));
    target.sequence = holds;
    target.pages = all && !holds ? picture.pageCount : 0;
  }

  // Writes every page to its own file. False if the run ended.
  bool ProduceNumbered(size_t i, OutputTarget target, platform::HeldFile& held,
                       std::vector<FileOutcome>& outcomes) {
    const BatchFile& file = files_[i];
    for (target.page = 1; target.page <= target.pages; ++target.page) {
      PicturePointer picture;
      Status status = Load(file.name, target.page, picture);
      std::string hint;
      if (status != Status::Ok) {
        hint = LoadHint(file.name, status, picture.get());
      } else if (function_.transform && !IsOnlyPlanned()) {
        status = function_.transform(*picture);
        hint = WorkHint(status);
      }
      auto outcome = status == Status::Ok ? Produce(i, target, picture, true, held)
                                          : Failure(file, status, std::move(hint));
      if (!outcome) return false;
      outcome->output = target.output->label;
      outcomes.push_back(std::move(*outcome));
    }
    return true;
  }

  // Creates one output from a picture after the function's own transform. All but the last one get
  // a copy.
  std::optional<FileOutcome> Produce(size_t i, const OutputTarget& target, PicturePointer& picture,
                                     bool last, platform::HeldFile& held) {
    const BatchFile& file = files_[i];
    PicturePointer copy;
    if (!last && !IsOnlyPlanned()) {
      copy = NewPictureRecord(picture->defaultColour, picture->window, picture->context);
      const Status status =
          copy != nullptr ? CopyPicture(*picture, *copy) : Status::MemoryAllocationError;
      if (status != Status::Ok) return Failure(file, status);
    }
    PictureRecord& own = copy != nullptr ? *copy : *picture;
    BindPluginRow(target);
    std::string hint;
    PreparedOutput output{.picture = own, .target = target};
    const Status status =
        IsOnlyPlanned() ? writer_.Plan(own, target, hint) : writer_.Prepare(output, hint);
    if (status != Status::Ok) return Failure(file, status, std::move(hint));
    Destination destination;
    destination.path = target.output->nameNeedsPicture ? PathOf(file, target, &own) : target.path;
    destination.formatIndex = target.formatIndex;
    destination.extension = target.extension;
    if (destination.path.empty()) return Failure(file, Status::InvalidDestination, kNoName);
    if (target.page > 0)
      destination.path = NumberedPage(destination.path, target.page, target.pages);
    return WriteUnderFreeName(i, std::move(destination), output, held);
  }

  static FileOutcome NotHeld(const BatchFile& file) {
    return Failure(file, Status::ErrorCreatingFile, ReasonSentence());
  }

  static FileOutcome Skipped(const BatchFile& file, const Destination& destination) {
    FileOutcome outcome{.source = file.name, .destination = destination.path, .skipped = true};
    outcome.hint = destination.taken ? Tr("skipped: %1 exists.", destination.path) : Tr("skipped.");
    if (destination.search != VariantSearch::Found) SayNoName(destination, outcome);
    return outcome;
  }

  // Whether a file will be skipped and need not be decoded.
  bool IsLeftOut(size_t i, Destination& destination) {
    const std::string& source = files_[i].name;
    {
      const std::lock_guard lock(mutex_);
      if (rules_.skipNames) return true;
      if (!rules_.overwrite.skip) return false;
      if (IsIndependent(source, destination.path)) {
        return destination.taken =
                   names_.Taken(destination.path, source) == platform::Existence::Yes;
      }
    }
    (void)run_.InTurn(i, [&] { destination.taken = IsTaken(destination.path, source) == platform::Existence::Yes; });
    return destination.taken;
  }

  Status Load(const std::string& name, int32_t page, PicturePointer& picture) const {
    ReadRequest request{.fileName = name,
                        .partial = function_.salvage,
                        .stop = job_.stop.Token(),
                        .options = job_.read};
    RETURN_IF_BAD(LoadPictureInfo(request, picture));
    request.page = picture->page = page - 1;
    if (IsOnlyPlanned()) return page > picture->pageCount ? Status::NoImages : Status::Ok;
    if (function_.decodedSide) request.thumbnailSide = function_.decodedSide(*picture);
    RETURN_IF_BAD(ReadPicture(request, *picture));
    const bool turns = function_.autoOrient && !writer_.TurnsItself();
    return turns ? TurnUpright(*picture) : Status::Ok;
  }

  std::string LoadHint(const std::string& name, Status status, const PictureRecord* picture) const {
    if (picture == nullptr || status != Status::NoImages || function_.page <= picture->pageCount) {
      const std::string hint = OpenHint(name, status);
      const bool tellsSalvage = status == Status::FileReadError && !function_.salvage;
      return hint.empty() && tellsSalvage ? function_.salvageHint : hint;
    }
    return TrCount("The file has only one page.", "The file has only %1 pages.",
                   static_cast<uint64_t>(picture->pageCount));
  }

  // Chooses the name and writes; repeats if another program takes the name meanwhile.
  std::optional<FileOutcome> WriteUnderFreeName(size_t i, const Destination& planned,
                                                const PreparedOutput& output,
                                                platform::HeldFile& source) {
    std::optional<FileOutcome> outcome;
    const bool settled =
        RetryLostRaces([&] { return TryToWrite(i, planned, output, source, outcome); });
    return settled ? outcome : Failure(files_[i], Status::ErrorCreatingFile, Tr(kWriteAborted));
  }

  // One attempt. False if the name was taken; otherwise `outcome` is the result, none if canceled.
  bool TryToWrite(size_t i, Destination destination, const PreparedOutput& output,
                  platform::HeldFile& source, std::optional<FileOutcome>& outcome) {
    const BatchFile& file = files_[i];
    bool cancelled = false;
    if (Settle(i, destination, output, cancelled) == DestinationAnswer::Skip) {
      cancelled = cancelled || destination.search == VariantSearch::Stopped;
      if (!cancelled) outcome = Skipped(file, destination);
      return true;
    }
    if (destination.path.size() > PathText::Capacity()) {
      GiveBack(destination.path);
      outcome = Failure(file, Status::InvalidDestination, kTooLong);
      return true;
    }
    const bool replaces = destination.replace && platform::FileExists(destination.path);
    platform::HeldFile held;
    if (!function_.dryRun && destination.replace && !Hold(destination, source, held)) {
      GiveBack(destination.path);
      if (!job_.stop.Token().Asked()) outcome = NotHeld(file);
      return true;
    }
    std::string hint;
    const Status status = function_.dryRun ? writer_.PlanFile(output, destination, hint)
                                           : writer_.Write(output, destination, hint);
    if (status == Status::Ok) {
      outcome = Written(file, destination, replaces, output);
      return true;
    }
    GiveBack(destination.path);
    if (!destination.replace && LostRace(status, destination.path)) return false;
    outcome = Failure(file, status, std::move(hint));
    return true;
  }

  // Holds the file to be replaced. One that is moved to the trash cannot be lost, even if modified
  // by others.
  static bool Hold(const Destination& destination, platform::HeldFile& source,
                   platform::HeldFile& held) {
    if (destination.recycle) source.Release();
    return destination.recycle || source.IsHeldAs(destination.path) || held.Hold(destination.path);
  }

  void GiveBack(const std::string& path) {
    const std::lock_guard lock(mutex_);
    names_.Release(path);
  }

  DestinationAnswer Settle(size_t i, Destination& destination, const PreparedOutput& output,
                           bool& cancelled) {
    DestinationAnswer answer = DestinationAnswer::Skip;
    // numbered pages have no planned names
    const bool planned = output.target.page == 0;
    if (planned && SettleAtOnce(files_[i].name, destination, answer)) return answer;
    const bool done = run_.InTurn(
        i, [&] { answer = SettleInTurn(files_[i].name, destination, output.picture, cancelled); });
    cancelled = cancelled || !done;
    return answer;
  }

  // Whether other files of the run cannot affect the name of this one.
  bool IsIndependent(const std::string& source, const std::string& planned) const {
    return function_.out.empty() && names_.ConcernsNobodyElse(source, planned);
  }

  // Chooses a name without waiting for earlier files, if they do not matter and no prompt is
  // needed. False, with the destination unchanged, if that is not possible.
  bool SettleAtOnce(const std::string& source, Destination& destination,
                    DestinationAnswer& answer) {
    const std::lock_guard lock(mutex_);
    if (asksEveryName_ || !IsIndependent(source, destination.path)) return false;
    Destination settled = destination;
    answer = DestinationAnswer::Write;
    const platform::Existence existence = names_.Taken(settled.path, source);
    if (existence == platform::Existence::Unknown) {
      destination.search = VariantSearch::Unknown;
      answer = DestinationAnswer::Skip;
      return true;
    }
    settled.taken = existence == platform::Existence::Yes;
    if (settled.taken) {
      if (rules_.asks) return false;
      bool free = true;
      const TakenTest taken = [&](const std::string& path) {
        free = !names_.IsExpected(path);
        return free ? names_.Taken(path, source) : platform::Existence::No;
      };
      answer = SettleUnasked(settled, rules_.overwrite, rules_.applyToRest,
                             [&](std::string& path) { return MakeVariant(path, taken); });
      if (!free) {
        names_.ForgetVariants();
        return false;
      }
    }
    destination = std::move(settled);
    if (answer == DestinationAnswer::Write) names_.Give(destination.path);
    return true;
  }

  // As SettleAtOnce, but in turn: all earlier files are finished.
  DestinationAnswer SettleInTurn(const std::string& source, Destination& destination,
                                 const PictureRecord& picture, bool& cancelled) {
    cancelled = job_.stop.Token().Asked();
    if (cancelled) return DestinationAnswer::Skip;
    const TakenTest taken = [&](const std::string& path) { return IsTaken(path, source); };
    const auto number = [&](std::string& path) {
      if (names_.TakenByRun(path, source)) destination.shared = path;
      return MakeVariant(
          path, [&](const std::string& candidate) { return names_.Taken(candidate, source); });
    };
    const VariantMaker variant = [&](std::string& path) {
      const std::lock_guard lock(mutex_);
      return number(path);
    };
    DestinationAnswer answer =
        MakeDestinationName(destination, source, {}, job_, taken, variant, &picture);
    // the user ended the batch at the prompt
    cancelled = answer == DestinationAnswer::Skip && job_.stop.Token().Asked();
    const std::lock_guard lock(mutex_);
    // Outputs of a run never replace each other, unless confirmed for this file.
    if (answer == DestinationAnswer::Write && destination.replace && !destination.asked) {
      if (names_.TakenByRun(destination.path, source)) {
        destination.replace = destination.recycle = false;
        destination.search = number(destination.path);
      }
      if (destination.search != VariantSearch::Found) answer = DestinationAnswer::Skip;
    }
    TakeRules();
    if (answer == DestinationAnswer::Write) names_.Give(destination.path);
    return answer;
  }

  platform::Existence IsTaken(const std::string& path, const std::string& source) const {
    const std::lock_guard lock(mutex_);
    return names_.Taken(path, source);
  }

  VariantSearch MakeVariant(std::string& path, const TakenTest& taken) {
    return names_.MakeVariant(path, job_.naming.firstVariant, job_.naming.lastVariant, taken,
                              job_.stop.Token());
  }

  FileOutcome Written(const BatchFile& file, const Destination& destination, bool replaces,
                      const PreparedOutput& output) const {
    if (function_.keepTimes && !function_.dryRun &&
        !platform::CopyTimes(file.name, destination.path)) {
      FileOutcome outcome = Failure(file, Status::ErrorWritingFile,
                                    Tr("The output was written, but its time could not be set."));
      outcome.destination = destination.path;
      return outcome;
    }
    FileOutcome outcome{.source = file.name, .destination = destination.path, .replaced = replaces};
    if (!destination.shared.empty()) outcome.note = SharedNameNote(destination.shared);
    outcome.note.Append(writer_.Note(output));
    outcome.detail = output.detail;
    if (!function_.dryRun) NoteLostAttributes(outcome);
    return outcome;
  }

  const std::span<const BatchFile> files_;
  const BatchFunction& function_;
  BatchJob& job_;
  const std::string prefix_;
  const bool asksEveryName_;
  std::vector<BatchOutput> outputs_;
  const bool needsPicture_;  // a name has macros about the picture
  const OutputWriter writer_;
  mutable std::mutex mutex_;  // guards the following members
  RunNames names_;
  Rules rules_;
  ReportedRun run_;  // must be last: its threads use the other members
};

}  // namespace

Status RunBatch(std::span<const BatchFile> files, const BatchFunction& function, BatchJob& job) {
  job.extension = ExtensionOfFormat(job);
  if (!function.dryRun && !IsDestinationWanted(job, function.out.empty()))
    return Status::FunctionCancelled;
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  Batch(files, function, job).Run();
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
