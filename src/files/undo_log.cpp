#include "files/undo_log.h"

#include <string_view>

#include "core/data_folder.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr uint64_t kLongestLog = uint64_t{256} << 20;
constexpr int kMostTries = 1000;  // to open a log that others keep replacing

std::string BytesOf(const UndoRecord& record) {
  std::string bytes = record.first;
  return bytes.append(1, '\0').append(record.second).append(1, '\0');
}

// Splits off the text before the next NUL; false if there is none.
bool TakeText(std::string_view& contents, std::string& text) {
  const size_t end = contents.find('\0');
  if (end == std::string_view::npos) return false;
  text = contents.substr(0, end);
  contents.remove_prefix(end + 1);
  return true;
}

}  // namespace

std::string UndoLog::Path() const { return DataFile(name_); }

// While waiting for the lock, the log may be replaced; then retry.
bool UndoLog::LockFile(bool create) {
  using platform::StoreFile;
  const std::string path = Path();
  for (int tries = 0; tries < kMostTries; ++tries) {
    StoreFile::OpenResult opened = file_.Open(path, StoreFile::Mode::ReadWrite);
    if (opened == StoreFile::OpenResult::Missing && create)
      opened = file_.Open(path, StoreFile::Mode::CreateNew);
    if (opened == StoreFile::OpenResult::Exists) continue;  // another run was faster
    if (opened == StoreFile::OpenResult::Missing) return true;
    if (opened != StoreFile::OpenResult::Done || !file_.Lock()) return false;
    locked_ = file_.IsStill(path);
    if (locked_) return true;
  }
  return false;
}

bool UndoLog::LockForUndo() {
  forUndo_ = true;
  return Path().empty() || LockFile(false);
}

// If the log was replaced by a shortened one meanwhile (`fresh` is false), appends to that.
bool UndoLog::Begin(bool fresh) {
  const std::string path = Path();
  if (path.empty() || !platform::MakeFolders(platform::FolderOf(path)) || !LockFile(true))
    return false;
  if (fresh && !file_.InUseByOthers() && !file_.Resize(0)) return false;
  (void)file_.MarkInUse();  // if it fails, concurrent runs cannot be undone together
  return !heading_ || Append(*heading_);
}

bool UndoLog::Append(const UndoRecord& record) {
  const std::string bytes = BytesOf(record);
  before_ = file_.Size();
  if (file_.WriteAt(before_, {reinterpret_cast<const uint8_t*>(bytes.data()), bytes.size()}))
    return true;
  (void)file_.Resize(before_);  // or the next record would seem to be the rest of this one
  return false;
}

bool UndoLog::Intend(const UndoRecord& record) {
  if (failed_) return false;
  if (forUndo_) return !file_.IsOpen() || Append(record);
  if (!file_.IsOpen()) {
    failed_ = !Begin(true);
  } else {
    locked_ = file_.Lock();
    failed_ = !locked_;
    // undone by another process meanwhile
    if (locked_ && !file_.IsStill(Path())) failed_ = !Begin(false);
  }
  failed_ = failed_ || !Append(record);
  if (failed_) file_.Close();
  return !failed_;
}

void UndoLog::Settle(bool done) {
  if (failed_ || !locked_) return;
  if (!done) failed_ = !file_.Resize(before_);
  if (forUndo_) return;
  file_.Unlock();
  locked_ = false;
}

std::optional<std::vector<UndoRecord>> ReadUndoLog(const char* name) {
  const std::string path = DataFile(name);
  std::vector<UndoRecord> records;
  std::string text;
  if (path.empty()) return records;
  const platform::ReadResult result = platform::ReadWholeFile(path, kLongestLog, text);
  if (result == platform::ReadResult::Missing) return records;
  if (result != platform::ReadResult::Done) return std::nullopt;
  std::string_view rest = text;
  for (UndoRecord record; TakeText(rest, record.first) && TakeText(rest, record.second);)
    records.push_back(record);
  return records;
}

bool WriteUndoLog(const char* name, const std::vector<UndoRecord>& records) {
  const std::string path = DataFile(name);
  if (records.empty()) return !platform::FileExists(path) || platform::DeleteFile(path);
  std::string contents;
  for (const UndoRecord& record : records) contents += BytesOf(record);
  return platform::WriteWholeFile(path, contents);
}

}  // namespace fotomill
