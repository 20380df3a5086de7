#include "files/rename_log.h"

#include <algorithm>
#include <string_view>

#include "core/data_folder.h"
#include "core/whole_number.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr const char* kLogName = "FMWRenameUndo.dat";
constexpr uint64_t kLongestLog = uint64_t{256} << 20;
constexpr int kMostTries = 1000;  // to open a log that others keep replacing

std::string RecordOf(const RenamedFile& file) {
  std::string record = file.from;
  record.append(1, '\0').append(file.to).append(1, '\0');
  return record;
}

// Splits off the text before the next NUL; false if there is none.
bool TakeText(std::string_view& contents, std::string& text) {
  const size_t end = contents.find('\0');
  if (end == std::string_view::npos) return false;
  text = contents.substr(0, end);
  contents.remove_prefix(end + 1);
  return true;
}

RenameHistory Parsed(std::string_view contents) {
  RenameHistory history;
  for (RenamedFile file; TakeText(contents, file.from) && TakeText(contents, file.to);) {
    if (!file.from.empty()) {
      history.files.push_back(file);
    } else if (const auto number = ParseNumber<uint32_t>(file.to)) {
      history.number = std::min(*number, history.number.value_or(UINT32_MAX));
    }
  }
  return history;
}

std::string ContentsOf(const RenameHistory& history) {
  std::string contents;
  if (history.number) contents = RecordOf({{}, std::to_string(*history.number)});
  for (const RenamedFile& file : history.files) contents += RecordOf(file);
  return contents;
}

}  // namespace

// While waiting for the lock, the log may be replaced; then retry.
bool RenameLog::LockFile(bool create) {
  using platform::StoreFile;
  const std::string path = DataFile(kLogName);
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

bool RenameLog::LockForUndo() {
  forUndo_ = true;
  return DataFile(kLogName).empty() || LockFile(false);
}

// If the log was replaced by a shortened one meanwhile (`fresh` is false), appends to that.
bool RenameLog::Begin(bool fresh) {
  const std::string path = DataFile(kLogName);
  if (path.empty() || !platform::MakeFolders(platform::FolderOf(path)) || !LockFile(true))
    return false;
  if (fresh && !file_.InUseByOthers() && !file_.Resize(0)) return false;
  (void)file_.MarkInUse();  // if it fails, concurrent runs cannot be undone together
  return !number_ || Append({{}, std::to_string(*number_)});
}

bool RenameLog::Append(const RenamedFile& file) {
  const std::string record = RecordOf(file);
  before_ = file_.Size();
  return file_.WriteAt(before_, {reinterpret_cast<const uint8_t*>(record.data()), record.size()});
}

bool RenameLog::Intend(const RenamedFile& file) {
  if (failed_) return false;
  if (forUndo_) return !file_.IsOpen() || Append(file);
  if (!file_.IsOpen()) {
    failed_ = !Begin(true);
  } else {
    locked_ = file_.Lock();
    failed_ = !locked_;
    // undone by another process meanwhile
    if (locked_ && !file_.IsStill(DataFile(kLogName))) failed_ = !Begin(false);
  }
  failed_ = failed_ || !Append(file);
  if (failed_) file_.Close();
  return !failed_;
}

void RenameLog::Settle(bool renamed) {
  if (failed_ || !locked_) return;
  if (!renamed) failed_ = !file_.Resize(before_);
  if (forUndo_) return;
  file_.Unlock();
  locked_ = false;
}

std::optional<RenameHistory> ReadRenameLog() {
  const std::string path = DataFile(kLogName);
  std::string text;
  if (path.empty()) return RenameHistory();
  const platform::ReadResult result = platform::ReadWholeFile(path, kLongestLog, text);
  if (result == platform::ReadResult::Missing) return RenameHistory();
  if (result != platform::ReadResult::Done) return std::nullopt;
  return Parsed(text);
}

bool WriteRenameLog(const RenameHistory& history) {
  const std::string path = DataFile(kLogName);
  if (history.files.empty()) return !platform::FileExists(path) || platform::DeleteFile(path);
  return platform::WriteWholeFile(path, ContentsOf(history));
}

}  // namespace fotomill
