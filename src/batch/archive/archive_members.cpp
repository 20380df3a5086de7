#include "batch/archive/archive_members.h"

#include "archive/entry_name.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

ArchiveMembers::ArchiveMembers(const std::string& archive, MemberNaming naming)
    : archive_(platform::AbsolutePath(archive)), naming_(std::move(naming)) {}

void ArchiveMembers::Add(const std::string& path) {
  const platform::FileKind kind = platform::FactsOf(path).kind;
  if (kind == platform::FileKind::Folder) {
    AddFolder(path);
  } else if (kind == platform::FileKind::Regular) {
    AddFile(path);
  } else {
    members_.push_back({path, path, Status::FileOpenError});
  }
}

void ArchiveMembers::AddFolder(const std::string& folder) {
  const auto entries = platform::ListFolder(folder);
  if (!entries) {
    members_.push_back({folder, folder, Status::FileOpenError, WithReason("")});
    return;
  }
  for (const platform::FolderEntry& entry : *entries) {
    const std::string path = platform::JoinFolder(folder, entry.name);
    if (entry.kind == platform::FileKind::Folder && !entry.link) AddFolder(path);
    if (entry.kind == platform::FileKind::Regular) AddFile(path);
  }
}

void ArchiveMembers::AddFile(const std::string& path) {
  if (platform::AbsolutePath(path) == archive_) return;
  AddMember(path);
  const std::string thumbnail = ThumbnailPathFor(path);
  if (naming_.addThumbnails && thumbnail != path && platform::IsRegularFile(thumbnail) &&
      !paths_.contains(thumbnail))
    AddMember(thumbnail);
}

std::string ArchiveMembers::NameOf(const std::string& path) const {
  if (!naming_.keepPaths) return std::string(platform::FileNameOf(path));
  std::string base = naming_.base;
  if (!base.empty() && base.back() != platform::kSeparator) base += platform::kSeparator;
  const bool inside = !base.empty() && path.size() > base.size() && path.starts_with(base);
  return StoredEntryName(inside ? path.substr(base.size()) : path);
}

void ArchiveMembers::AddMember(const std::string& path) {
  if (!paths_.insert(path).second) return;  // given twice
  ArchiveMember member{path, ReadableEntryName(NameOf(path))};
  if (!IsSafeEntryName(member.name)) {
    member.status = Status::InvalidDestination;
    member.hint = Tr("Archives cannot hold such names.");
  } else if (!names_.insert(member.name).second) {
    member.status = Status::InvalidDestination;
    member.hint = Tr("Another file has the same name in the archive.");
  }
  members_.push_back(std::move(member));
}

}  // namespace fotomill
