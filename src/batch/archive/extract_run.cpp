#include "batch/archive/extract_run.h"

#include <algorithm>
#include <set>
#include <utility>

#include "archive/extract.h"
#include "batch/destination_name.h"
#include "files/numbered_name.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

Status StatusOf(EntryRefusal refusal) {
  return refusal == EntryRefusal::UnsafeName ? Status::InvalidDestination
                                             : Status::UnsupportedFormat;
}

bool IsBelow(const std::string& name, const std::string& folder) {
  return name.size() > folder.size() && name.starts_with(folder) && name[folder.size()] == '/';
}

// An archive whose entries are reported as the files of a batch.
class ArchiveBatch {
 public:
  ArchiveBatch(const ArchivePart& part, BatchJob& job)
      : part_(part), job_(job), source_{part.path, part.password, job.stop.Token()} {}

  // Lists the archive and reports what cannot be read. False if nothing is left to do.
  bool Open() {
    const ArchiveEnd end = ListArchive(source_, entries_);
    MarkWanted();
    if (end.status != Status::Ok) Report(part_.path, {}, end);
    for (size_t i = 0; i < entries_.size(); ++i) {
      if (!wanted_[i]) continue;
      wanted_[i] = entries_[i].IsFile() && entries_[i].refusal == EntryRefusal::None;
      if (entries_[i].refusal != EntryRefusal::None) ReportRefused(entries_[i]);
    }
    if (std::ranges::find(wanted_, true) == wanted_.end()) return false;
    return AskPassword();
  }

  // Reports the end of the archive, unless an entry's line said the same.
  void Close(const ArchiveEnd& end) {
    if (end.status != Status::Ok && end.status != Status::FunctionCancelled && !job_.errors)
      Report(part_.path, {}, end);
  }

  void Report(const std::string& name, const std::string& path, const ArchiveEnd& end) {
    if (end.status == Status::FunctionCancelled) return;
    ReportLine({.source = name,
                .destination = end.status == Status::Ok ? path : std::string(),
                .status = end.status,
                .hint = TroubleSentence(end)});
  }
  void ReportLine(const FileOutcome& outcome) {
    const auto count = static_cast<uint32_t>(std::max<size_t>(count_, reported_ + 1));
    ReportOutcome(job_, outcome, static_cast<uint32_t>(reported_), count);
    if (job_.box != nullptr) job_.box->ShowProgress(static_cast<uint32_t>(++reported_), count);
  }

  const ArchiveSource& Source() const { return source_; }
  std::span<const ArchiveEntry> Entries() const { return entries_; }
  const std::vector<bool>& Wanted() const { return wanted_; }

 private:
  void MarkWanted() {
    wanted_.assign(entries_.size(), part_.names.empty());
    const std::set<std::string> names(part_.names.begin(), part_.names.end());
    for (size_t i = 0; i < entries_.size(); ++i) {
      const std::string& name = entries_[i].name;
      if (names.contains(name) || std::ranges::any_of(names, [&](const std::string& folder) {
            return IsBelow(name, folder);
          }))
        wanted_[i] = true;
      count_ += wanted_[i] && entries_[i].IsFile();
    }
  }

  void ReportRefused(const ArchiveEntry& entry) {
    ReportLine({.source = entry.name,
                .status = StatusOf(entry.refusal),
                .hint = Tr(RefusalText(entry.refusal))});
  }

  bool AskPassword() {
    bool needed = false;
    for (size_t i = 0; i < entries_.size(); ++i)
      needed = needed || (wanted_[i] && entries_[i].facts.encrypted);
    if (!needed || !source_.password.empty() || job_.prompts == nullptr) return true;
    const auto typed = job_.prompts->AskPassword(part_.path);
    if (typed) source_.password = *typed;
    return typed.has_value();
  }

  const ArchivePart& part_;
  BatchJob& job_;
  ArchiveSource source_;
  std::vector<ArchiveEntry> entries_;
  std::vector<bool> wanted_;
  size_t count_ = 0, reported_ = 0;
};

// Chooses where entries go.
class Places {
 public:
  Places(const ExtractTarget& target, ArchiveBatch& batch, BatchJob& job)
      : target_(target), batch_(batch), job_(job) {}

  // None after reporting why, or that the entry is skipped.
  std::optional<ExtractPlace> Of(const ArchiveEntry& entry) {
    if (job_.stop.Token().Asked()) return {};
    Destination destination;
    destination.path = platform::JoinFolder(
        target_.folder,
        target_.keepPaths ? entry.name : std::string(platform::FileNameOf(entry.name)));
    const TakenTest taken = [this](const std::string& path) {
      return given_.contains(path) ? platform::Existence::Yes : platform::ExistenceOf(path);
    };
    const VariantMaker variant = [&](std::string& path) {
      return MakeNumberedVariant(path, job_.naming.firstVariant, job_.naming.lastVariant, taken,
                                 job_.stop.Token());
    };
    const bool own = given_.contains(destination.path);  // by an earlier entry
    DestinationAnswer answer = DestinationAnswer::Write;
    if (own) {
      destination.search = variant(destination.path);
    } else {
      answer = MakeDestinationName(destination, entry.name, {}, job_, taken, variant);
    }
    FileOutcome outcome{.source = entry.name, .destination = destination.path};
    if (destination.search != VariantSearch::Found) SayNoName(destination, outcome);
    outcome.skipped = outcome.skipped || answer == DestinationAnswer::Skip;
    if (outcome.skipped && outcome.hint.empty())
      outcome.hint = Tr("skipped: %1 exists.", destination.path);
    if (outcome.skipped || outcome.status != Status::Ok) {
      batch_.ReportLine(outcome);
      return {};
    }
    given_.insert(destination.path);
    ExtractPlace place{destination.path};
    if (destination.replace) place.existing = platform::Existing::Replace;
    if (destination.replace && destination.recycle)
      place.makeWay = [path = place.path] { return platform::MoveToTrash(path); };
    return place;
  }

 private:
  const ExtractTarget& target_;
  ArchiveBatch& batch_;
  BatchJob& job_;
  std::set<std::string> given_;
};

class Tester final : public EntryReceiver {
 public:
  explicit Tester(ArchiveBatch& batch) : batch_(batch) {}
  Status Begin(size_t) override { return Status::Ok; }
  Status Data(std::span<const uint8_t>) override { return Status::Ok; }
  void End(size_t index, const ArchiveEnd& end) override {
    const std::string& name = batch_.Entries()[index].name;
    batch_.Report(name, Tr("intact"), end);
  }

 private:
  ArchiveBatch& batch_;
};

}  // namespace

std::string TroubleSentence(const ArchiveEnd& end) {
  return end.trouble == ArchiveTrouble::None ? std::string() : Tr(TroubleText(end.trouble));
}

Status RunExtract(const ArchivePart& part, const ExtractTarget& target, BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  ArchiveBatch batch(part, job);
  if (batch.Open()) {
    Places places(target, batch, job);
    const ExtractJob extract{
        .place = [&](const ArchiveEntry& entry) { return places.Of(entry); },
        .done =
            [&](const ArchiveEntry& entry, const std::string& path, const ArchiveEnd& end) {
              batch.Report(entry.name, path, end);
              if (end.status != Status::Ok) return;
              job.filesChanged = true;
              if (target.extracted) target.extracted(path);
            },
        .keepTimes = target.keepTimes,
    };
    batch.Close(ExtractArchive(batch.Source(), batch.Entries(), batch.Wanted(), extract));
  }
  FinishProgress(job);
  return Status::Ok;
}

Status RunArchiveTest(const ArchivePart& part, BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  ArchiveBatch batch(part, job);
  if (batch.Open()) {
    Tester tester(batch);
    batch.Close(ReadArchive(batch.Source(), batch.Entries(), batch.Wanted(), tester));
  }
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
