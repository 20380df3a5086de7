#include "files/previous_file.h"

#include <utility>

#include "core/data_folder.h"
#include "core/whole_number.h"
#include "platform/clock.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

// One folder per day, named by its number, to tell leftovers of killed programs from files still in
// use.
constexpr int64_t kSecondsOfDay = 86400, kDaysKept = 30;
int64_t Today() { return platform::Now() / kSecondsOfDay; }
std::string UndoFolder() { return platform::JoinFolder(DataFolder(), "undo"); }
std::string KeptFolder() { return platform::JoinFolder(UndoFolder(), std::to_string(Today())); }

std::vector<platform::FolderEntry> EntriesOf(const std::string& folder) {
  return platform::ListFolder(folder).value_or(std::vector<platform::FolderEntry>());
}

}  // namespace

bool PreviousFile::Keep(const std::string& path) {
  kept_.Delete();
  original_ = platform::StampOf(path);
  return platform::ExistenceOf(path) == platform::Existence::No || kept_.Keep(path, KeptFolder());
}

void PreviousFile::PutBack(const std::string& path, PreviousFile& now) {
  kept_.Swap(now.kept_);
  restored_ = std::exchange(original_, now.original_);
  Replaced(path);
}

bool PreviousFile::HasChanged(const std::string& path) const {
  return !(platform::StampOf(path) == replaced_);
}

bool PreviousFiles::Keep(const std::string& path) {
  auto file = std::make_shared<PreviousFile>();
  if (!file->Keep(path)) return false;
  const std::lock_guard lock(mutex_);
  return kept_.emplace(platform::AbsolutePath(path), std::move(file)).second;
}

void PreviousFiles::Replaced(const std::string& path) {
  const std::lock_guard lock(mutex_);
  const auto kept = kept_.find(platform::AbsolutePath(path));
  if (kept == kept_.end()) return;
  kept->second->Replaced(path);
  replaced_.insert(kept_.extract(kept));
}

FileOperation PreviousFiles::Operation(FileOperationKind kind) {
  const std::lock_guard lock(mutex_);
  FileOperation operation{kind, {}};
  for (auto& [path, file] : replaced_) operation.steps.push_back({path, {}, std::move(file)});
  replaced_.clear();
  kept_.clear();
  return operation;
}

void DeleteOldPreviousFiles() {
  for (const platform::FolderEntry& day : EntriesOf(UndoFolder())) {
    const auto number = ParseNumber<int64_t>(day.name);
    if (day.kind != platform::FileKind::Folder || day.link || !number || *number == Today())
      continue;
    const std::string folder = platform::JoinFolder(UndoFolder(), day.name);
    for (const platform::FolderEntry& file : EntriesOf(folder)) {
      if (*number + kDaysKept < Today())
        (void)platform::DeleteFile(platform::JoinFolder(folder, file.name));
    }
    (void)platform::DeleteFolder(folder);  // not deleted if it still has files
  }
}

}  // namespace fotomill
