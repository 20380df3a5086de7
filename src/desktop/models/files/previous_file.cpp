#include "desktop/models/files/previous_file.h"

#include <utility>

#include "batch/turn_file.h"
#include "core/data_folder.h"
#include "core/whole_number.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// A folder a day, by its number, so that what a killed program left there can be told from what one that runs needs.
constexpr int64_t kSecondsOfDay = 86400, kDaysKept = 30;
int64_t Today() { return platform::Now() / kSecondsOfDay; }
std::string UndoFolder() { return platform::JoinFolder(DataFolder(), "undo"); }
std::string KeptFolder() { return platform::JoinFolder(UndoFolder(), std::to_string(Today())); }

std::vector<platform::FolderEntry> EntriesOf(const std::string& folder) {
  return platform::ListFolder(folder).value_or(std::vector<platform::FolderEntry>());
}

}  // namespace

bool PreviousFile::Keep(const std::string& path) { return kept_.Keep(path, KeptFolder()); }

bool PreviousFile::HasChanged(const std::string& path) const { return !(platform::StampOf(path) == replaced_); }

bool PreviousFiles::Keep(const std::string& path) {
  auto file = std::make_shared<PreviousFile>();
  if (!file->Keep(path)) return false;
  DropThumbnails(platform::AbsolutePath(path));
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

FileDeed PreviousFiles::Deed() {
  const std::lock_guard lock(mutex_);
  FileDeed deed{DeedKind::Turn, {}};
  for (auto& [path, file] : replaced_) deed.steps.push_back({path, {}, std::move(file)});
  replaced_.clear();
  kept_.clear();
  return deed;
}

void DeleteOldPreviousFiles() {
  for (const platform::FolderEntry& day : EntriesOf(UndoFolder())) {
    const auto number = ParseNumber<int64_t>(day.name);
    if (day.kind != platform::FileKind::Folder || day.link || !number || *number == Today()) continue;
    const std::string folder = platform::JoinFolder(UndoFolder(), day.name);
    for (const platform::FolderEntry& file : EntriesOf(folder)) {
      if (*number + kDaysKept < Today()) (void)platform::DeleteFile(platform::JoinFolder(folder, file.name));
    }
    (void)platform::DeleteFolder(folder);  // unless there is still something in it
  }
}

DeedResult TurnOneFile(const std::string& path, Orientation turn) {
  if (platform::FactsOf(path).link)
    return {{DeedKind::Turn, {}}, {{path, Tr("This is a link; rotate the file it points to.")}}};
  PreviousFiles previous;
  WriteOptions options{.encode = EncodeOptionsFromSettings()};
  bool kept = true;
  options.makeWay = [&] { return kept = previous.Keep(path); };
  const TurnRequest request{.turn = turn, .seenByExif = settings.ExifAdjustOrientation != 0};
  const TurnedFile turned = TurnPictureFile(path, path, request, ReadOptionsFromSettings(), options);
  if (turned.changed) previous.Replaced(path);
  DeedResult result{previous.Deed(), {}, turned.note.shown};
  if (turned.status != Status::Ok) {
    const std::string hint = kept ? turned.hint : std::string(Tr("There is not enough disk space to keep the old file for undo."));
    result.failures.push_back({path, Tr(StatusMessage(turned.status)) + (hint.empty() ? "" : " ") + hint});
  }
  return result;
}

}  // namespace fotomill::desktop
