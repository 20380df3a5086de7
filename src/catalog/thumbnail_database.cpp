#include "catalog/thumbnail_database.h"

#include <algorithm>
#include <cstring>

#include "core/byte_reader.h"
#include "core/settings.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/volumes.h"

namespace fotomill {

namespace {

constexpr size_t kPathOffset = 27912, kVolumeOffset = 28173, kFlagsOffset = 28434, kTextSize = 261;
static_assert(kPathOffset == sizeof(ThumbnailRecord) && kVolumeOffset == kPathOffset + kTextSize &&
              kFlagsOffset == kVolumeOffset + kTextSize && kFlagsOffset + 8 == kDatabaseRecordSize);
constexpr uint8_t kDeletedFlag = 1;
constexpr size_t kKeySize = kDatabaseRecordSize - kPathOffset;

uint64_t OffsetOf(int64_t index) { return kDatabaseHeaderSize + static_cast<uint64_t>(index) * kDatabaseRecordSize; }

void PutLe32(uint8_t* bytes, uint32_t value) {
  for (int i = 0; i < 4; ++i) bytes[i] = static_cast<uint8_t>(value >> (8 * i));
}

std::array<uint8_t, kDatabaseHeaderSize> BytesOf(const DatabaseHeader& header) {
  std::array<uint8_t, kDatabaseHeaderSize> bytes{};
  std::ranges::copy(kDatabaseMagic, bytes.begin());
  PutLe32(&bytes[8], header.version);
  PutLe32(&bytes[12], static_cast<uint32_t>(header.count));
  PutLe32(&bytes[20], header.created);
  PutLe32(&bytes[24], header.appended);
  return bytes;
}

bool BytesOf(const DatabaseRecord& record, std::span<uint8_t> bytes) {
  if (record.path.size() >= kTextSize || record.volume.size() >= kTextSize) return false;
  std::ranges::fill(bytes, uint8_t{0});
  std::ranges::copy(record.thumbnail.bytes, bytes.begin());
  std::ranges::copy(record.path, bytes.begin() + kPathOffset);
  std::ranges::copy(record.volume, bytes.begin() + kVolumeOffset);
  bytes[kFlagsOffset] = record.deleted ? kDeletedFlag : 0;
  return true;
}

// A text that ends at its first zero byte, or with its field.
std::string TextIn(std::span<const uint8_t> field) {
  return {field.begin(), std::find(field.begin(), field.begin() + kTextSize - 1, uint8_t{0})};
}

// From the bytes behind the thumbnail.
template <typename Target>
void TakeKey(std::span<const uint8_t> bytes, Target& target) {
  target.path = TextIn(bytes);
  target.volume = TextIn(bytes.subspan(kVolumeOffset - kPathOffset));
  target.deleted = (bytes[kFlagsOffset - kPathOffset] & kDeletedFlag) != 0;
}

// Gives a database's lock back at the end of a scope.
class Unlocker {
 public:
  explicit Unlocker(platform::StoreFile& file) : file_(file) {}
  ~Unlocker() { file_.Unlock(); }
  Unlocker(const Unlocker&) = delete;
  Unlocker& operator=(const Unlocker&) = delete;

 private:
  platform::StoreFile& file_;
};

// A copy that an interrupted compaction left: it begins as one of ours, or is empty.
bool IsLeftover(const std::string& path) {
  const platform::FileFacts facts = platform::FactsOf(path);
  if (facts.kind != platform::FileKind::Regular || facts.link) return false;
  platform::StoreFile file;
  std::array<uint8_t, kDatabaseMagic.size()> magic{};
  if (facts.size == 0) return true;
  return file.Open(path, platform::StoreFile::Mode::Read) == platform::StoreFile::OpenResult::Done &&
         file.ReadAt(0, magic) && std::ranges::equal(magic, kDatabaseMagic, {}, {}, [](char c) { return static_cast<uint8_t>(c); });
}

bool MakeEmptyDatabase(const std::string& path, bool& taken) {
  const auto now = static_cast<uint32_t>(platform::Now());
  platform::OutputFile file;
  if (!file.Create(path) || !file.Write(BytesOf(DatabaseHeader{kDatabaseVersion, 0, now, now}))) return false;
  const platform::CommitResult result = file.Commit(platform::Existing::Refuse, true);
  taken = result == platform::CommitResult::Taken;
  if (result == platform::CommitResult::Done && settings.WriteHiddenThumbnails != 0) (void)platform::SetHidden(path, true);
  return taken || result == platform::CommitResult::Done;
}

}  // namespace

std::string VolumeKeyFor(const std::string& path) {
  const platform::Volume volume = platform::VolumeOf(path);
  if (!volume.available) return "Unknown";
  std::string suffix(1, ':');
  suffix += std::to_string(volume.serial);
  return volume.label.size() + suffix.size() < kTextSize - 1 ? volume.label + suffix : volume.label.substr(0, kTextSize - 1);
}

bool PurgesMissing(const DatabaseKey& key) {
  // The volume of the nearest folder that is there: of a drive that is not plugged in, another one's.
  std::string nearest = key.path;
  while (platform::FactsOf(nearest).kind == platform::FileKind::Missing) {
    const platform::PathParts parts = platform::SplitPath(nearest);
    std::string folder = std::string(parts.drive) + std::string(parts.folder);
    while (folder.size() > 1 && folder.ends_with(platform::kSeparator)) folder.pop_back();
    if (folder.empty() || folder == nearest) break;
    nearest = std::move(folder);
  }
  const platform::DriveKind kind = platform::VolumeOf(nearest).kind;
  return kind != platform::DriveKind::Network && kind != platform::DriveKind::Optical &&
         kind != platform::DriveKind::Removable && VolumeKeyFor(nearest) == key.volume;
}

ThumbnailDatabase::Opened ThumbnailDatabase::Open(const std::string& path, bool create) {
  using platform::StoreFile;
  path_ = path;
  indexedCount_ = -1;
  StoreFile::OpenResult result = file_.Open(path, StoreFile::Mode::ReadWrite);
  if (result == StoreFile::OpenResult::Missing) {
    bool taken = false;
    if (!create) return Opened::Missing;
    if (!MakeEmptyDatabase(path, taken)) return Opened::Failed;
    result = file_.Open(path, StoreFile::Mode::ReadWrite);
  }
  DatabaseHeader header;
  if (result == StoreFile::OpenResult::Done && ReadHeader(header)) return Opened::Done;
  file_.Close();
  return Opened::NotRead;
}

bool ThumbnailDatabase::ReadHeader(DatabaseHeader& header) const {
  std::array<uint8_t, kDatabaseHeaderSize> bytes;
  if (!file_.ReadAt(0, bytes)) return false;
  ByteReader reader(bytes);
  if (!reader.Match(kDatabaseMagic)) return false;
  header.version = reader.Le32();
  header.count = static_cast<int32_t>(reader.Le32());
  reader.Skip(4);
  header.created = reader.Le32();
  header.appended = reader.Le32();
  return true;
}

bool ThumbnailDatabase::WriteHeader(const DatabaseHeader& header) {
  return file_.WriteAt(0, BytesOf(header)) && file_.Sync();
}

int64_t ThumbnailDatabase::RecordCount(const DatabaseHeader& header) const {
  const uint64_t size = file_.Size();
  const auto most = static_cast<int64_t>(size < kDatabaseHeaderSize ? 0 : (size - kDatabaseHeaderSize) / kDatabaseRecordSize);
  return std::clamp<int64_t>(header.count, 0, most);
}

bool ThumbnailDatabase::ReadRecord(int64_t index, DatabaseRecord& record) const {
  std::vector<uint8_t> bytes(kDatabaseRecordSize);
  if (index < 0 || !file_.ReadAt(OffsetOf(index), bytes)) return false;
  std::copy_n(bytes.begin(), record.thumbnail.bytes.size(), record.thumbnail.bytes.begin());
  TakeKey(std::span<const uint8_t>(bytes).subspan(kPathOffset), record);
  return record.thumbnail.HasMagic(kSmallThumbnailMagic);
}

bool ThumbnailDatabase::ReadKey(int64_t index, DatabaseKey& key) const { return TryKey(index, key) == KeyRead::Done; }

ThumbnailDatabase::KeyRead ThumbnailDatabase::TryKey(int64_t index, DatabaseKey& key) const {
  std::array<uint8_t, kSmallThumbnailMagic.size()> magic;
  std::array<uint8_t, kKeySize> bytes;
  const bool read = index >= 0 && file_.ReadAt(OffsetOf(index), magic) && file_.ReadAt(OffsetOf(index) + kPathOffset, bytes);
  if (!read) return KeyRead::Failed;
  TakeKey(std::span<const uint8_t>(bytes), key);
  return ByteReader(magic).Match(kSmallThumbnailMagic) ? KeyRead::Done : KeyRead::NoThumbnail;
}

std::string ThumbnailDatabase::IndexKey(std::string_view path, std::string_view volume) {
  return std::string(path).append(1, '\0').append(volume);
}

// Takes the lock; where another process has put a new file in the old one's place meanwhile, that of the new one.
bool ThumbnailDatabase::LockAndCheck(DatabaseHeader& header) {
  while (file_.Lock()) {
    if (file_.IsStill(path_)) {
      if (ReadHeader(header)) return true;
      file_.Unlock();
      return false;
    }
    file_.Unlock();
    if (Open(path_, false) != Opened::Done) return false;
  }
  return false;
}

bool ThumbnailDatabase::UpdateIndex(const DatabaseHeader& header) {
  const int64_t count = RecordCount(header);
  if (indexedCount_ == count && indexedSize_ == file_.Size() && indexedTime_ == file_.Modified()) return true;
  index_.clear();
  indexedCount_ = -1;
  bool complete = true;
  DatabaseKey key;
  for (int64_t i = 0; i < count; ++i) {
    const KeyRead read = TryKey(i, key);
    complete = complete && read != KeyRead::Failed;
    if (read == KeyRead::Done && !key.deleted) index_[IndexKey(key.path, key.volume)].push_back(i);
  }
  if (!complete) return false;
  indexedCount_ = count;
  indexedSize_ = file_.Size();
  indexedTime_ = file_.Modified();
  return true;
}

bool ThumbnailDatabase::MarkDeleted(int64_t index) {
  uint8_t flags = 0;
  if (!file_.ReadAt(OffsetOf(index) + kFlagsOffset, {&flags, 1})) return false;
  flags |= kDeletedFlag;
  return file_.WriteAt(OffsetOf(index) + kFlagsOffset, {&flags, 1});
}

bool ThumbnailDatabase::Append(std::span<const DatabaseRecord> records, bool replace) {
  DatabaseHeader header;
  if (!LockAndCheck(header)) return false;
  const Unlocker unlocker(file_);
  if (header.count != RecordCount(header) || INT32_MAX - header.count < static_cast<int64_t>(records.size())) return false;
  if (replace && !UpdateIndex(header)) return false;
  indexedCount_ = -1;  // until all is done
  std::vector<uint8_t> bytes(kDatabaseRecordSize);
  std::vector<int64_t> replaced;
  for (size_t i = 0; i < records.size(); ++i) {
    if (!BytesOf(records[i], bytes)) return false;
    const int64_t index = header.count + static_cast<int64_t>(i);
    if (!file_.WriteAt(OffsetOf(index), bytes)) return false;
    if (!replace) continue;
    std::vector<int64_t>& same = index_[IndexKey(records[i].path, records[i].volume)];
    replaced.insert(replaced.end(), same.begin(), same.end());
    same.assign(1, index);
  }
  header.count += static_cast<int32_t>(records.size());
  header.appended = static_cast<uint32_t>(platform::Now());
  if (!file_.Sync() || !WriteHeader(header)) return false;
  // Only now, as a record that is counted must never be lost.
  for (const int64_t index : replaced) {
    if (!MarkDeleted(index)) return false;
  }
  if (!replaced.empty() && !file_.Sync()) return false;
  if (replace) {
    indexedCount_ = header.count;
    indexedSize_ = file_.Size();
    indexedTime_ = file_.Modified();
  }
  return true;
}

bool ThumbnailDatabase::Find(const std::string& path, const std::string& volume, ThumbnailRecord& thumbnail) {
  DatabaseHeader header;
  if (!file_.IsStill(path_) && Open(path_, false) != Opened::Done) return false;  // it was compacted meanwhile
  if (!ReadHeader(header)) return false;
  (void)UpdateIndex(header);  // what cannot be read is passed over
  const auto found = index_.find(IndexKey(path, volume));
  if (found == index_.end()) return false;
  for (const int64_t index : found->second) {
    DatabaseRecord record;
    if (!ReadRecord(index, record) || record.deleted) continue;
    thumbnail = record.thumbnail;
    return true;
  }
  return false;
}

int64_t ThumbnailDatabase::Delete(const std::string& path) {
  DatabaseHeader header;
  if (!LockAndCheck(header)) return -1;
  const Unlocker unlocker(file_);
  indexedCount_ = -1;
  const int64_t count = RecordCount(header);
  int64_t deleted = 0;
  DatabaseKey key;
  for (int64_t i = 0; i < count; ++i) {
    const KeyRead read = TryKey(i, key);
    if (read == KeyRead::Failed) return -1;
    if (read != KeyRead::Done || key.deleted || key.path != path) continue;
    if (!MarkDeleted(i)) return -1;
    ++deleted;
  }
  return deleted > 0 && !file_.Sync() ? -1 : deleted;
}

ThumbnailDatabase::Compacted ThumbnailDatabase::CopyLiveRecords(platform::StoreFile& to, DatabaseHeader header, bool purge,
                                                                ProgressSink* progress, const std::atomic<bool>* stop) {
  const int32_t count = header.count;
  header.count = 0;
  // The header comes first, so that what an interrupted pass leaves is known as ours by its first bytes.
  if (!to.WriteAt(0, BytesOf(header))) return Compacted::Failed;
  std::vector<uint8_t> bytes(kDatabaseRecordSize);
  for (int32_t i = 0; i < count; ++i) {
    if (progress != nullptr) progress->Step(i, count);
    if (platform::PendingExit() != 0) return Compacted::Failed;
    if (stop != nullptr && *stop) return Compacted::Stopped;
    if (!file_.ReadAt(OffsetOf(i), bytes) || !ByteReader(bytes).Match(kSmallThumbnailMagic)) return Compacted::NotRead;
    DatabaseKey key;
    TakeKey(std::span<const uint8_t>(bytes).subspan(kPathOffset), key);
    if (key.deleted) continue;
    if (purge && platform::FactsOf(key.path).kind == platform::FileKind::Missing && PurgesMissing(key)) continue;
    if (!to.WriteAt(OffsetOf(header.count), bytes)) return Compacted::Failed;
    ++header.count;
  }
  if (header.count > 0) header.appended = static_cast<uint32_t>(platform::Now());
  return to.WriteAt(0, BytesOf(header)) && to.Sync() ? Compacted::Done : Compacted::Failed;
}

ThumbnailDatabase::Compacted ThumbnailDatabase::Compact(bool purge, ProgressSink* progress, const std::atomic<bool>* stop) {
  const Compacted result = CompactLocked(purge, progress, stop);
  if (result == Compacted::Done && Open(path_, false) != Opened::Done) return Compacted::NotRead;
  return result;
}

ThumbnailDatabase::Compacted ThumbnailDatabase::CompactLocked(bool purge, ProgressSink* progress,
                                                              const std::atomic<bool>* stop) {
  using platform::StoreFile;
  DatabaseHeader header;
  if (!LockAndCheck(header)) return Compacted::NotRead;
  const Unlocker unlocker(file_);
  if (header.count != RecordCount(header)) return Compacted::NotRead;
  const std::string copy = path_ + ".BAK";
  if (IsLeftover(copy) && !platform::DeleteFile(copy)) return Compacted::Failed;
  StoreFile to;
  if (to.Open(copy, StoreFile::Mode::CreateNew) != StoreFile::OpenResult::Done) return Compacted::Failed;
  Compacted result = CopyLiveRecords(to, header, purge, progress, stop);
  if (result == Compacted::Done &&
      platform::RenameFile(copy, path_, platform::Existing::Replace) != platform::CommitResult::Done) {
    result = Compacted::Failed;
  }
  to.Close();
  if (result != Compacted::Done) {
    (void)platform::DeleteFile(copy);
  } else if (settings.WriteHiddenThumbnails != 0) {
    (void)platform::SetHidden(path_, true);
  }
  return result;
}

}  // namespace fotomill
