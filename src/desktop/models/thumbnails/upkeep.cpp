#include "desktop/models/thumbnails/upkeep.h"

#include "catalog/thumbnails/thumbnail_file.h"
#include "core/choice_lists.h"
#include "core/text.h"
#include "desktop/models/browser/browser_model.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "registry/registry.h"

namespace fotomill::desktop {

namespace {

using Opened = ThumbnailDatabase::Opened;
using Compacted = ThumbnailDatabase::Compacted;

constexpr const char* kNoDatabase = "This file is no thumbnail database that can be read. It was left as it is.";
constexpr int kDeepest = 64;  // folders below folders

std::string OutcomeText(Compacted result, int32_t before, int32_t after, uint64_t saved) {
  switch (result) {
    case Compacted::Done:
      if (before == after)
        return "There was nothing to drop: all " + WithThousands(static_cast<uint64_t>(after)) + " records stay.";
      return WithThousands(static_cast<uint64_t>(before - after)) +
             (before - after == 1 ? " record was dropped, " : " records were dropped, ") +
             WithThousands(static_cast<uint64_t>(after)) + " stay. The file is " + SizeText(saved, choice::kSizeFitting) +
             " smaller.";
    case Compacted::Stopped: return "Stopped. The database stays as it was.";
    case Compacted::NotRead: return std::string(StatusMessage(Status::FileReadError)) + " The database stays as it was.";
    case Compacted::Failed: break;
  }
  return std::string(StatusMessage(Status::ErrorWritingFile)) +
         " The database stays as it was. Is the disk full, or the folder protected?";
}

void CollectOrphans(const std::string& folder, int depth, const StopToken& stop, std::vector<std::string>& orphans) {
  const auto entries = platform::ListFolder(folder);
  if (!entries || stop.Asked() || platform::VolumeOf(folder).kind == platform::DriveKind::Optical) return;
  std::vector<std::string> pictures;
  for (const platform::FolderEntry& entry : *entries) {
    if (entry.kind == platform::FileKind::Regular && FindFormatByName(entry.name) != kNoFormat) pictures.push_back(entry.name);
  }
  if (const auto found = OrphanThumbnails(folder, pictures)) orphans.insert(orphans.end(), found->begin(), found->end());
  for (const platform::FolderEntry& entry : *entries) {
    const bool goDown = depth > 0 && entry.kind == platform::FileKind::Folder && !entry.link && !entry.name.starts_with('.');
    if (goDown && !stop.Asked()) CollectOrphans(platform::JoinFolder(folder, entry.name), depth - 1, stop, orphans);
  }
}

}  // namespace

DatabaseCompaction::DatabaseCompaction(std::string path, bool purge, bool hidden)
    : path_(std::move(path)), hidden_(hidden) {
  const auto ended = [this](Status status) {
    if (status != Status::Ok) outcome_ = StatusMessage(status);
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
  if (database.OpenThumbnailDatabase(path_, false, hidden_) != Opened::Done || !database.ReadDatabaseHeader(before)) {
    outcome_ = platform::FileExists(path_) ? kNoDatabase : "There is no thumbnail database of that name.";
  } else {
    const uint64_t size = platform::FactsOf(path_).size;
    const Compacted result = database.CompactThumbnailDatabase(purge, this, stop);
    succeeded_ = result == Compacted::Done && database.ReadDatabaseHeader(after);
    const uint64_t now = platform::FactsOf(path_).size;
    outcome_ = OutcomeText(result, before.count, after.count, size > now ? size - now : 0);
  }
}

std::string DescribeDatabase(const std::string& path) {
  if (path.empty()) return "There is no data folder for it.";
  if (!platform::FileExists(path)) return "There is none yet.";
  ThumbnailDatabase database;
  DatabaseHeader header;
  if (database.OpenThumbnailDatabase(path, false) != Opened::Done || !database.ReadDatabaseHeader(header)) return kNoDatabase;
  return WithThousands(static_cast<uint64_t>(std::max(header.count, 0))) + (header.count == 1 ? " record, " : " records, ") +
         SizeText(platform::FactsOf(path).size, choice::kSizeFitting);
}

std::vector<std::string> FindOrphanThumbnails(const std::string& folder, bool below, const StopToken& stop) {
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
