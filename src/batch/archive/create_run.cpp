#include "batch/archive/create_run.h"

#include <algorithm>
#include <set>
#include <utility>

#include "archive/archive_kind.h"
#include "archive/archive_reader.h"
#include "archive/extract.h"
#include "archive/zip_writer.h"
#include "batch/archive/extract_run.h"
#include "batch/destination_name.h"
#include "files/numbered_name.h"
#include "platform/existence.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/held_file.h"
#include "platform/paths.h"
#include "platform/temporary_folder.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

class CreateBatch {
 public:
  CreateBatch(const CreateArchive& request, BatchJob& job) : request_(request), job_(job) {}

  void Run() {
    ArchiveMembers members(request_.path, request_.naming);
    for (const std::string& file : request_.files) members.Add(file);
    path_ = request_.path;
    password_ = request_.password;
    std::string hint;
    Status status = request_.add ? Unpack(members.All(), hint) : Settle(hint);
    if (status == Status::Ok) status = Write(members.All(), hint);
    if (status == Status::Ok || status == Status::FunctionCancelled) return;
    Report({.source = path_, .status = status, .hint = std::move(hint)});
  }

 private:
  void Report(const FileOutcome& outcome) {
    const auto count = static_cast<uint32_t>(std::max(count_, reported_ + 1));
    ReportOutcome(job_, outcome, static_cast<uint32_t>(reported_++), count);
  }

  // Chooses the name of a new archive.
  Status Settle(std::string& hint) {
    Destination destination;
    destination.path = path_;
    const VariantMaker variant = [&](std::string& path) {
      return MakeNumberedVariant(path, job_.naming.firstVariant, job_.naming.lastVariant,
                                 platform::ExistenceOf, job_.stop.Token());
    };
    const DestinationAnswer answer =
        MakeDestinationName(destination, path_, {}, job_, platform::ExistenceOf, variant);
    FileOutcome outcome{.source = path_, .destination = destination.path};
    if (destination.search != VariantSearch::Found) {
      SayNoName(destination, outcome);
      hint = outcome.hint;
      return outcome.status;
    }
    if (answer == DestinationAnswer::Skip) {
      outcome.skipped = true;
      outcome.hint = Tr("skipped: %1 exists.", destination.path);
      Report(outcome);
      return Status::FunctionCancelled;
    }
    path_ = destination.path;
    replace_ = destination.replace;
    return Status::Ok;
  }

  // Unpacks the files of the old archive, except those that are replaced.
  Status Unpack(const std::vector<ArchiveMember>& fresh, std::string& hint) {
    platform::FileView file;
    if (!file.Open(path_)) {
      hint = ReasonSentence();
      return Status::FileOpenError;
    }
    if (ArchiveKindOf(file.Bytes()).type != ArchiveKind::Zip) {
      hint = Tr("Files can only be added to ZIP archives.");
      return Status::UnsupportedFormat;
    }
    file.Close();
    replace_ = true;
    if (!folder_.Create()) return Status::ErrorCreatingFile;
    ArchiveSource source{path_, password_, job_.stop.Token()};
    std::vector<ArchiveEntry> entries;
    ArchiveEnd end = ListArchive(source, entries);
    if (end.status == Status::Ok && !AskPassword(entries, source)) return Status::FunctionCancelled;
    if (end.status == Status::Ok) end = UnpackEntries(source, entries, fresh);
    hint = TroubleSentence(end);
    if (lost_) hint = Tr("It has entries that could not be kept, such as links.");
    return lost_ && end.status == Status::Ok ? Status::UnsupportedFormat : end.status;
  }

  bool AskPassword(const std::vector<ArchiveEntry>& entries, ArchiveSource& source) {
    const bool locked = std::ranges::any_of(
        entries, [](const ArchiveEntry& entry) { return entry.facts.encrypted; });
    if (!locked || !password_.empty()) return true;
    const auto typed = job_.prompts != nullptr ? job_.prompts->AskPassword(path_) : std::nullopt;
    if (typed) source.password = password_ = *typed;
    return typed.has_value();
  }

  ArchiveEnd UnpackEntries(const ArchiveSource& source, const std::vector<ArchiveEntry>& entries,
                           const std::vector<ArchiveMember>& fresh) {
    std::set<std::string> replaced;
    for (const ArchiveMember& member : fresh) {
      if (member.status == Status::Ok) replaced.insert(member.name);
    }
    ArchiveEnd worst;
    std::vector<bool> wanted(entries.size());
    for (size_t i = 0; i < entries.size(); ++i) {
      wanted[i] = entries[i].IsFile() && !replaced.contains(entries[i].name);
      lost_ = lost_ || entries[i].refusal != EntryRefusal::None;
    }
    if (lost_) return {};
    const ExtractJob extract{
        .place =
            [&](const ArchiveEntry&) {
              const std::string name = std::to_string(places_++);
              return ExtractPlace{platform::JoinFolder(folder_.Path(), name)};
            },
        .done =
            [&](const ArchiveEntry& entry, const std::string& path, const ArchiveEnd& end) {
              if (end.status == Status::Ok) kept_.push_back({path, entry.name});
              if (end.status != Status::Ok && worst.status == Status::Ok) worst = end;
            },
    };
    const ArchiveEnd end = ExtractArchive(source, entries, wanted, extract);
    return end.status != Status::Ok ? end : worst;
  }

  Status Write(const std::vector<ArchiveMember>& fresh, std::string& hint) {
    platform::HeldFile held;
    if (replace_ && !held.Hold(path_)) {
      hint = ReasonSentence();
      return Status::ErrorCreatingFile;
    }
    ZipWriter zip;
    RETURN_IF_BAD(zip.Create(path_, password_));
    for (const ArchiveMember& member : kept_)
      RETURN_IF_BAD(zip.Add(member.path, member.name, job_.stop.Token()));
    count_ = fresh.size();
    std::vector<const ArchiveMember*> added;
    for (const ArchiveMember& member : fresh) {
      Status status = member.status;
      if (status == Status::Ok) status = zip.Add(member.path, member.name, job_.stop.Token());
      if (status == Status::Ok) {
        added.push_back(&member);
        if (job_.box != nullptr)
          job_.box->ShowProgress(static_cast<uint32_t>(added.size()),
                                 static_cast<uint32_t>(count_));
      } else if (member.status != Status::Ok || status == Status::FileOpenError) {
        Report({.source = member.path,
                .status = status,
                .hint = member.hint.empty() ? ReasonSentence() : member.hint});
      } else {
        return status;
      }
    }
    return added.empty() ? Status::Ok : Finish(zip, added, hint);
  }

  Status Finish(ZipWriter& zip, const std::vector<const ArchiveMember*>& added, std::string& hint) {
    if (replace_ && request_.keepPrevious && !request_.keepPrevious(path_)) {
      hint = Tr("There is not enough disk space to keep the old file for undo.");
      return Status::ErrorCreatingFile;
    }
    const auto existing = replace_ ? platform::Existing::Replace : platform::Existing::Refuse;
    if (zip.Finish(existing) != platform::CommitResult::Done) {
      hint = ReasonSentence();
      return Status::ErrorWritingFile;
    }
    if (replace_ && request_.replaced) request_.replaced(path_);
    job_.filesChanged = true;
    for (const ArchiveMember* member : added)
      Report({.source = member->path, .destination = path_, .replaced = replace_});
    return Status::Ok;
  }

  const CreateArchive& request_;
  BatchJob& job_;
  std::string path_, password_;
  bool replace_ = false, lost_ = false;
  platform::TemporaryFolder folder_;
  std::vector<ArchiveMember> kept_;  // unpacked from the old archive
  size_t places_ = 0;
  size_t count_ = 0, reported_ = 0;
};

}  // namespace

Status RunCreateArchive(const CreateArchive& request, BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  CreateBatch(request, job).Run();
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
