#include "catalog/thumbnails/picture_changes.h"

#include <algorithm>
#include <map>
#include <vector>

#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "catalog/thumbnails/thumbnail_store.h"
#include "core/data_folder.h"
#include "core/text.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// What to mark in one database.
struct Marks {
  std::vector<std::string> paths, folders;
};

// Whether a path may have been a folder. For removed ones, guessed from the name: those of pictures
// are not folders.
bool MayHaveBeenFolder(const PictureChange& change) {
  if (!change.to.empty()) return platform::IsFolder(change.to);
  return platform::FactsOf(change.path).kind == platform::FileKind::Missing &&
         FindFormatByName(change.path) == kNoFormat;
}

// Whether a file really is a thumbnail file, not just by name.
bool IsThumbnailFile(const std::string& path) {
  ThumbnailRecord record;
  return !platform::FactsOf(path).link && ReadThumbnailFile(record, path);
}

// Whether a path has the name of a thumbnail file, which has no thumbnail file of its own.
bool HasThumbnailName(const std::string& path) {
  return EqualIgnoringCase(platform::SplitPath(path).extension, kThumbnailExtension);
}

}  // namespace

void MarkChangedRecords(std::span<const PictureChange> changes) {
  std::map<std::string, Marks> marks;
  const std::string global = ThumbnailDatabasePath({});
  const auto markFile = [&](const std::string& path) {
    marks[global].paths.push_back(path);
    marks[ThumbnailDatabasePath(std::string(platform::FolderOf(path)))].paths.push_back(path);
  };
  for (const PictureChange& change : changes) {
    const bool folder = MayHaveBeenFolder(change);
    if (folder) marks[global].folders.push_back(change.path);
    if (folder && !change.to.empty()) {  // its local database moved with it
      marks[ThumbnailDatabasePath(change.to)].folders.push_back(change.path);
      continue;
    }
    markFile(change.path);
    if (!change.to.empty()) markFile(change.to);
  }
  marks.erase(std::string());  // no data folder
  for (const auto& [database, marked] : marks)
    (void)SharedThumbnailStore().Delete(database, marked.paths, marked.folders);
}

void FollowThumbnailFile(const std::string& from, const std::string& to) {
  const std::string old = ThumbnailPathFor(from), wanted = ThumbnailPathFor(to);
  if (old == wanted || HasThumbnailName(from) || HasThumbnailName(to) || platform::IsFolder(to))
    return;
  const bool follows = IsThumbnailFile(old);
  if (!follows) return DeleteMisleadingThumbnailFile(to);
  if (platform::RenameFile(old, wanted, platform::Existing::Refuse) == platform::CommitResult::Done)
    return;
  // With two candidates, neither is known to be right.
  (void)platform::DeleteFile(old);
  DeleteMisleadingThumbnailFile(to);
}

bool WentWithPicture(const std::string& path, std::span<const PictureChange> changes) {
  if (!HasThumbnailName(path) || platform::ExistenceOf(path) != platform::Existence::No)
    return false;
  // Files are usually in the order of their names, so the picture is one of the last.
  return std::any_of(changes.rbegin(), changes.rend(), [&](const PictureChange& change) {
    return ThumbnailPathFor(change.path) == path;
  });
}

void DeleteThumbnailFile(const std::string& path) {
  const std::string file = ThumbnailPathFor(path);
  if (!HasThumbnailName(path) && IsThumbnailFile(file)) (void)platform::DeleteFile(file);
}

void DeleteMisleadingThumbnailFile(const std::string& path) {
  const std::string file = ThumbnailPathFor(path);
  const platform::FileFacts facts = platform::FactsOf(file), picture = platform::FactsOf(path);
  if (facts.kind == platform::FileKind::Regular && picture.kind == platform::FileKind::Regular &&
      facts.modified >= picture.modified)
    DeleteThumbnailFile(path);
}

}  // namespace fotomill
