#include "desktop/models/thumbnails/upkeep.h"

#include "catalog/thumbnails/thumbnail_file.h"
#include "core/choice_lists.h"
#include "core/text.h"
#include "desktop/models/browser/browser_model.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "registry/registry.h"
#include "texts/status_text.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

using Opened = ThumbnailDatabase::Opened;
using Compacted = ThumbnailDatabase::Compacted;

constexpr const char* kNoDatabase = TrLater("Not a readable thumbnail database; left unchanged.");
constexpr const char* kUnchanged = TrLater("The database was left unchanged.");
constexpr int kDeepest = 64;  // of nested folders

std::string OutcomeText(Compacted result, int32_t before, int32_t after, uint64_t saved) {
  switch (result) {
    case Compacted::Done:
      if (before == after) {
        return TrGroupedCount("Nothing to remove: the only record is in use.",
                       "Nothing to remove: all %1 records are in use.",
                       static_cast<uint64_t>(after));
      }
      return TrGroupedCount("%1 record was removed, %2 remain. The file is %3 smaller.",
                     "%1 records were removed, %2 remain. The file is %3 smaller.",
                     static_cast<uint64_t>(before - after),
                     ThousandsText(static_cast<uint64_t>(after)),
                     SizeText(saved, choice::kSizeFitting));
    case Compacted::Stopped: return std::string(Tr("Stopped.")).append(" ").append(Tr(kUnchanged));
    case Compacted::NotRead:
      return StatusText(Status::FileReadError).append(" ").append(Tr(kUnchanged));
    case Compacted::Failed: break;
  }
  return StatusText(Status::ErrorWritingFile)
      .append(" ")
      .append(Tr(kUnchanged))
      .append(" ")
      .append(Tr("The disk may be full, or the folder write-protected."));
}

void CollectOrphans(const std::string& folder, int depth, const StopToken& stop,
                    std::vector<std::string>& orphans) {
  const auto entries = platform::ListFolder(folder);
  if (!entries || stop.Asked() || platform::VolumeOf(folder).kind == platform::DriveKind::Optical)
    return;
  std::vector<std::string> pictures;
  for (const platform::FolderEntry& entry : *entries) {
    if (entry.kind == platform::FileKind::Regular && FindFormatByName(entry.name) != kNoFormat)
      pictures.push_back(entry.name);
  }
  if (const auto found = OrphanThumbnails(folder, pictures))
    orphans.insert(orphans.end(), found->begin(), found->end());
  for (const platform::FolderEntry& entry : *entries) {
    const bool goDown = depth > 0 && entry.kind == platform::FileKind::Folder && !entry.link &&
                        !entry.name.starts_with('.');
    if (goDown && !stop.Asked())
      CollectOrphans(platform::JoinFolder(folder, entry.name), depth - 1, stop, orphans);
  }
}

}  // namespace

DatabaseCompaction::DatabaseCompaction(std::string path, bool purge, bool hidden)
    : path_(std::move(path)), hidden_(hidden) {
  const auto ended = [this](Status status) {
    if (status != Status::Ok) outcome_ = StatusText(status);
    ended_ = true;
  };
  task_.Start(
      Lane::Blocking,
      [this, purge](const StopToken& stop) {
        Run(purge, stop);
        return Status::Ok;
      },
      ended);
}

void DatabaseCompaction::Step(int32_t done, int32_t total) {
  total_ = total;
  done_ = done;
}

void DatabaseCompaction::Run(bool purge, const StopToken& stop) {
  ThumbnailDatabase database;
  DatabaseHeader before, after;
  if (database.OpenThumbnailDatabase(path_, false, hidden_) != Opened::Done ||
      !database.ReadDatabaseHeader(before)) {
    outcome_ = platform::FileExists(path_) ? Tr(kNoDatabase)
                                           : Tr("This thumbnail database does not exist.");
  } else {
    const uint64_t size = platform::FactsOf(path_).size;
    const Compacted result = database.CompactThumbnailDatabase(purge, this, stop);
    succeeded_ = result == Compacted::Done && database.ReadDatabaseHeader(after);
    const uint64_t now = platform::FactsOf(path_).size;
    outcome_ = OutcomeText(result, before.count, after.count, size > now ? size - now : 0);
  }
}

std::string DescribeDatabase(const std::string& path) {
  if (path.empty()) return Tr("There is no data folder.");
  if (!platform::FileExists(path)) return Tr("It does not exist yet.");
  ThumbnailDatabase database;
  DatabaseHeader header;
  if (database.OpenThumbnailDatabase(path, false) != Opened::Done ||
      !database.ReadDatabaseHeader(header))
    return Tr(kNoDatabase);
  return TrGroupedCount("%1 record, %2", "%1 records, %2",
                 static_cast<uint64_t>(std::max(header.count, 0)),
                 SizeText(platform::FactsOf(path).size, choice::kSizeFitting));
}

std::vector<std::string> FindOrphanThumbnails(const std::string& folder, bool below,
                                              const StopToken& stop) {
  std::vector<std::string> orphans;
  CollectOrphans(folder, below ? kDeepest : 0, stop, orphans);
  return orphans;
}

std::vector<std::string> DeleteThumbnails(const std::vector<std::string>& files) {
  std::vector<std::string> left;
  for (const std::string& file : files) {
    if (!platform::DeleteFile(file)) left.push_back(file);
  }
  return left;
}

}  // namespace fotomill::desktop
