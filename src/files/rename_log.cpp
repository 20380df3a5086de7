#include "files/rename_log.h"

#include <string_view>

#include "core/data_folder.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr const char* kLogName = "FMWRenameUndo.dat";
constexpr uint64_t kLongestLog = uint64_t{256} << 20;

std::string RecordOf(const RenamedFile& file) {
  std::string record = file.from;
  record.append(1, '\0').append(file.to).append(1, '\0');
  return record;
}

// Takes a text up to its zero byte off; false if there is none.
bool TakeText(std::string_view& contents, std::string& text) {
  const size_t end = contents.find('\0');
  if (end == std::string_view::npos) return false;
  text = contents.substr(0, end);
  contents.remove_prefix(end + 1);
  return true;
}

}  // namespace

bool RenameLog::Begin() {
  using platform::StoreFile;
  const std::string path = DataFile(kLogName);
  if (path.empty() || !platform::MakeFolders(std::string(platform::SplitPath(path).folder))) return false;
  if (platform::FileExists(path) && !platform::DeleteFile(path)) return false;
  return file_.Open(path, StoreFile::Mode::CreateNew) == StoreFile::OpenResult::Done;
}

bool RenameLog::Add(const RenamedFile& file) {
  if (!file_.IsOpen() && !failed_) failed_ = !Begin();
  if (failed_) return false;
  const std::string record = RecordOf(file);
  failed_ = !file_.WriteAt(size_, {reinterpret_cast<const uint8_t*>(record.data()), record.size()});
  size_ += record.size();
  return !failed_;
}

std::optional<std::vector<RenamedFile>> ReadRenameLog() {
  const std::string path = DataFile(kLogName);
  std::string text;
  std::vector<RenamedFile> files;
  if (path.empty()) return files;
  const platform::ReadResult result = platform::ReadWholeFile(path, kLongestLog, text);
  if (result == platform::ReadResult::Missing) return files;
  if (result != platform::ReadResult::Done) return std::nullopt;
  std::string_view contents = text;
  for (RenamedFile file; TakeText(contents, file.from) && TakeText(contents, file.to);) files.push_back(file);
  return files;
}

bool WriteRenameLog(std::span<const RenamedFile> files) {
  const std::string path = DataFile(kLogName);
  if (files.empty()) return !platform::FileExists(path) || platform::DeleteFile(path);
  std::string contents;
  for (const RenamedFile& file : files) contents += RecordOf(file);
  return platform::WriteWholeFile(path, contents);
}

}  // namespace fotomill
