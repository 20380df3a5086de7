#include "catalog/thumbnails/thumbnail_database.h"

#include <algorithm>
#include <array>
#include <map>
#include <utility>

#include "core/byte_reader.h"
#include "core/data_folder.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/volumes.h"

namespace fotomill {

namespace {

constexpr size_t kPathOffset = 27912, kVolumeOffset = 28173, kFlagsOffset = 28434, kTextSize = 261;
constexpr size_t kTimeOffset = 28435, kSizeOffset = 28439, kSizeBytes = 3;
static_assert(kPathOffset == sizeof(ThumbnailRecord) && kVolumeOffset == kPathOffset + kTextSize &&
              kFlagsOffset == kVolumeOffset + kTextSize && kTimeOffset == kFlagsOffset + 1 &&
              kSizeOffset == kTimeOffset + 4 && kSizeOffset + kSizeBytes == kDatabaseRecordSize);
constexpr uint8_t kDeletedFlag = 1;
constexpr size_t kKeySize = kDatabaseRecordSize - kPathOffset;
// records; a smaller index is rebuilt faster than loaded from a file
constexpr int64_t kLargeIndex = 1000;

std::string IndexPath(const std::string& databasePath) { return databasePath + ".index"; }

uint64_t OffsetOf(int64_t index) {
  return kDatabaseHeaderSize + static_cast<uint64_t>(index) * kDatabaseRecordSize;
}

void PutLe(uint8_t* bytes, uint32_t value, size_t count) {
  for (size_t i = 0; i < count; ++i) bytes[i] = static_cast<uint8_t>(value >> (8 * i));
}
void PutLe32(uint8_t* bytes, uint32_t value) { PutLe(bytes, value, 4); }
uint32_t Le(const uint8_t* bytes, size_t count) {
  uint32_t value = 0;
  for (size_t i = 0; i < count; ++i) value |= uint32_t{bytes[i]} << (8 * i);
  return value;
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

// The bytes after the thumbnail.
using KeyBytes = std::array<uint8_t, kKeySize>;

bool BytesOf(const DatabaseRecord& record, KeyBytes& bytes) {
  if (record.path.size() >= kTextSize || record.volume.size() >= kTextSize) return false;
  bytes.fill(0);
  std::ranges::copy(record.path, bytes.begin());
  std::ranges::copy(record.volume, bytes.begin() + kVolumeOffset - kPathOffset);
  bytes[kFlagsOffset - kPathOffset] = record.deleted ? kDeletedFlag : 0;
  PutLe32(&bytes[kTimeOffset - kPathOffset], record.stamp.modified);
  PutLe(&bytes[kSizeOffset - kPathOffset], record.stamp.size, kSizeBytes);
  return true;
}

// A text that ends at the first NUL or the end of the field.
std::string_view TextViewIn(std::span<const uint8_t> field) {
  const std::string_view text(reinterpret_cast<const char*>(field.data()), kTextSize - 1);
  return text.substr(0, text.find('\0'));
}

// The hash of a record in an index.
uint32_t IndexedHash(const DatabaseRecord& record) {
  const bool findable = !record.deleted && record.thumbnail.HasMagic(kSmallThumbnailMagic);
  return findable ? ThumbnailIndex::HashOf(record.path) : 0;
}

// Paths with the same key belong to the same picture.
std::string_view ComparisonKey(std::string_view path) {
  if ((browserOptions & kCompareExtensions) != 0) return path;
  return path.substr(0, path.size() - platform::SplitPath(path).extension.size());
}

// Parses the bytes after the thumbnail.
template <typename Target>
void TakeKey(std::span<const uint8_t> bytes, Target& target) {
  target.path = TextViewIn(bytes);
  target.volume = TextViewIn(bytes.subspan(kVolumeOffset - kPathOffset));
  target.deleted = (bytes[kFlagsOffset - kPathOffset] & kDeletedFlag) != 0;
  target.stamp = {Le(&bytes[kTimeOffset - kPathOffset], 4),
                  Le(&bytes[kSizeOffset - kPathOffset], kSizeBytes)};
}

bool ReadHeaderOf(const platform::StoreFile& file, DatabaseHeader& header) {
  std::array<uint8_t, kDatabaseHeaderSize> bytes;
  if (!file.ReadAt(0, bytes)) return false;
  ByteReader reader(bytes);
  if (!reader.Match(kDatabaseMagic)) return false;
  header.version = reader.Le32();
  header.count = static_cast<int32_t>(reader.Le32());
  reader.Skip(4);
  header.created = reader.Le32();
  header.appended = reader.Le32();
  return true;
}

// The number of counted records in a file of this size.
int64_t RecordsIn(const DatabaseHeader& header, uint64_t size) {
  const auto most = static_cast<int64_t>(
      size < kDatabaseHeaderSize ? 0 : (size - kDatabaseHeaderSize) / kDatabaseRecordSize);
  return std::clamp<int64_t>(header.count, 0, most);
}

// Unlocks a database at the end of a scope.
class Unlocker {
 public:
  explicit Unlocker(platform::StoreFile& file) : file_(file) {}
  ~Unlocker() { file_.Unlock(); }
  Unlocker(const Unlocker&) = delete;
  Unlocker& operator=(const Unlocker&) = delete;

 private:
  platform::StoreFile& file_;
};

// Whether a file is left over from an interrupted compaction: it starts like a database, or is
// empty.
bool IsLeftover(const std::string& path) {
  const platform::FileFacts facts = platform::FactsOf(path);
  if (facts.kind != platform::FileKind::Regular || facts.link) return false;
  platform::StoreFile file;
  std::array<uint8_t, kDatabaseMagic.size()> magic{};
  if (facts.size == 0) return true;
  return file.Open(path, platform::StoreFile::Mode::Read) ==
             platform::StoreFile::OpenResult::Done &&
         file.ReadAt(0, magic) && std::ranges::equal(magic, kDatabaseMagic, {}, {}, [](char c) {
           return static_cast<uint8_t>(c);
         });
}

bool MakeEmptyDatabase(const std::string& path, bool hidden, bool& taken) {
  const auto now = static_cast<uint32_t>(platform::Now());
  platform::OutputFile file;
  if (!file.Create(path) || !file.Write(BytesOf(DatabaseHeader{kDatabaseVersion, 0, now, now})))
    return false;
  const platform::CommitResult result = file.Commit(platform::Existing::Refuse, true);
  taken = result == platform::CommitResult::Taken;
  if (result == platform::CommitResult::Done && hidden) (void)platform::SetHidden(path, true);
  return taken || result == platform::CommitResult::Done;
}

}  // namespace

PictureStamp PictureStampOf(int64_t modified, uint64_t size) {
  return {static_cast<uint32_t>(modified), static_cast<uint32_t>(size & 0xffffff)};
}

PictureStamp PictureStampOf(const std::string& path) {
  const platform::FileFacts facts = platform::FactsOf(path);
  return facts.kind == platform::FileKind::Regular ? PictureStampOf(facts.modified, facts.size)
                                                   : PictureStamp();
}

std::string VolumeKeyFor(const std::string& path) {
  const platform::Volume volume = platform::VolumeOf(path);
  if (!volume.available) return "Unknown";
  std::string suffix(1, ':');
  suffix += std::to_string(volume.serial);
  return volume.label.size() + suffix.size() < kTextSize - 1
             ? volume.label + suffix
             : volume.label.substr(0, kTextSize - 1);
}

bool PurgesMissing(const DatabaseKey& key) {
  // The volume of the nearest existing folder; for a drive that is not mounted, a different volume.
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

std::string ThumbnailDatabasePath(const std::string& folder) {
  return folder.empty() ? DataFile(kDatabaseName) : platform::JoinFolder(folder, kDatabaseName);
}

ThumbnailDatabase::Opened ThumbnailDatabase::OpenThumbnailDatabase(const std::string& path,
                                                                   bool create, bool hidden) {
  hidden_ = hidden;
  return OpenFile(path, create, false);
}

ThumbnailDatabase::Opened ThumbnailDatabase::OpenToRead(const std::string& path, bool hidden) {
  hidden_ = hidden;
  return OpenFile(path, false, true);
}

ThumbnailDatabase::Opened ThumbnailDatabase::OpenFile(const std::string& path, bool create,
                                                      bool readOnlyToo) {
  using platform::StoreFile;
  CloseThumbnailDatabase();
  path_ = path;
  readOnlyToo_ = readOnlyToo;
  StoreFile::OpenResult result = file_.Open(path, StoreFile::Mode::ReadWrite);
  if (result == StoreFile::OpenResult::Missing) {
    bool taken = false;
    if (!create) return Opened::Missing;
    if (!MakeEmptyDatabase(path, hidden_, taken)) return Opened::Failed;
    result = file_.Open(path, StoreFile::Mode::ReadWrite);
  }
  readOnly_ = result == StoreFile::OpenResult::Failed && readOnlyToo &&
              platform::FactsOf(path).kind == platform::FileKind::Regular &&
              !platform::FactsOf(path).link;
  if (readOnly_) result = file_.Open(path, StoreFile::Mode::Read);
  DatabaseHeader header;
  if (result == StoreFile::OpenResult::Done && ReadDatabaseHeader(header)) return Opened::Done;
  file_.Close();
  return Opened::NotRead;
}

void ThumbnailDatabase::CloseThumbnailDatabase() {
  // Only if the file still has the state known to the index.
  const bool worthSaving = file_.IsOpen() && indexed_.count >= kLargeIndex && indexed_ != saved_;
  if (worthSaving && indexed_.size == file_.Size() && indexed_.modified == file_.Modified() &&
      file_.IsStill(path_)) {
    index_.Save(IndexPath(path_), indexed_);
    if (hidden_) (void)platform::SetHidden(IndexPath(path_), true);
  }
  file_.Close();
  index_.Clear();
  indexed_ = saved_ = {};
  triedFile_ = false;
}

bool ThumbnailDatabase::ReadDatabaseHeader(DatabaseHeader& header) const {
  return ReadHeaderOf(file_, header);
}

bool ThumbnailDatabase::WriteDatabaseHeader(const DatabaseHeader& header) {
  return file_.WriteAt(0, BytesOf(header)) && file_.Sync();
}

int64_t ThumbnailDatabase::RecordCount(const DatabaseHeader& header) const {
  return RecordsIn(header, file_.Size());
}

bool ThumbnailDatabase::ReadDatabaseRecord(int64_t index, DatabaseRecord& record) const {
  KeyBytes key;
  if (index < 0 || !file_.ReadAt(OffsetOf(index), record.thumbnail.bytes, key)) return false;
  TakeKey(key, record);
  return record.thumbnail.HasMagic(kSmallThumbnailMagic);
}

bool ThumbnailDatabase::ReadKey(int64_t index, DatabaseKey& key) const {
  return TryKey(index, key) == KeyRead::Done;
}

ThumbnailDatabase::KeyRead ThumbnailDatabase::TryKey(int64_t index, DatabaseKey& key) const {
  std::array<uint8_t, kSmallThumbnailMagic.size()> magic;
  std::array<uint8_t, kKeySize> bytes;
  const bool read = index >= 0 && file_.ReadAt(OffsetOf(index), magic) &&
                    file_.ReadAt(OffsetOf(index) + kPathOffset, bytes);
  if (!read) return KeyRead::Failed;
  TakeKey(std::span<const uint8_t>(bytes), key);
  return ByteReader(magic).Match(kSmallThumbnailMagic) ? KeyRead::Done : KeyRead::NoThumbnail;
}

// Locks the file; if another process has replaced it meanwhile, opens and locks the new one.
bool ThumbnailDatabase::LockAndCheck(DatabaseHeader& header) {
  while (!readOnly_ && file_.Lock()) {
    if (file_.IsStill(path_)) {
      if (ReadDatabaseHeader(header)) return true;
      file_.Unlock();
      return false;
    }
    file_.Unlock();
    if (OpenFile(path_, false, readOnlyToo_) != Opened::Done) return false;
  }
  return false;
}

ThumbnailIndex::State ThumbnailDatabase::StateOf(const DatabaseHeader& header) const {
  const uint64_t size = file_.Size();
  return {RecordsIn(header, size), size, file_.Modified()};
}

// Updates the index to the current file. False if a record could not be read; the index then lacks
// it and is rebuilt the next time.
bool ThumbnailDatabase::UpdateIndex(const ThumbnailIndex::State& state) {
  if (indexed_ == state) return true;
  indexed_ = {};
  const bool large = state.count >= kLargeIndex;
  const bool loaded = large && index_.Load(IndexPath(path_), state);
  if (!loaded && !BuildIndex(state.count)) return false;
  indexed_ = state;
  if (loaded) saved_ = state;
  return true;
}

// Reads only the keys, together with the magic of the next record, which is adjacent.
bool ThumbnailDatabase::BuildIndex(int64_t count) {
  index_.Clear();
  std::array<uint8_t, kKeySize + kSmallThumbnailMagic.size()> bytes;
  const std::span<uint8_t> nextMagic = std::span(bytes).subspan(kKeySize);
  bool complete = count == 0 || file_.ReadAt(OffsetOf(0), nextMagic);
  for (int64_t i = 0; i < count; ++i) {
    const bool thumbnail = ByteReader(nextMagic).Match(kSmallThumbnailMagic);
    const std::span<uint8_t> wanted =
        std::span(bytes).first(i + 1 < count ? bytes.size() : kKeySize);
    const bool read = file_.ReadAt(OffsetOf(i) + kPathOffset, wanted);
    complete = complete && read;
    const bool deleted = (bytes[kFlagsOffset - kPathOffset] & kDeletedFlag) != 0;
    index_.Append(read && thumbnail && !deleted ? ThumbnailIndex::HashOf(TextViewIn(bytes)) : 0);
  }
  return complete;
}

bool ThumbnailDatabase::MarkDeleted(int64_t index) {
  uint8_t flags = 0;
  if (!file_.ReadAt(OffsetOf(index) + kFlagsOffset, {&flags, 1})) return false;
  flags |= kDeletedFlag;
  return file_.WriteAt(OffsetOf(index) + kFlagsOffset, {&flags, 1});
}

// Finds records with the same paths and volumes as new ones, which start at `first`: existing ones,
// and new ones repeated later. False if one cannot be read.
bool ThumbnailDatabase::FindRecordsToReplace(std::span<const DatabaseRecord> records, int64_t first,
                                             std::vector<int64_t>& replaced) const {
  std::map<std::pair<std::string_view, std::string_view>, int64_t> added;
  DatabaseKey key;
  for (size_t i = 0; i < records.size(); ++i) {
    const auto number = first + static_cast<int64_t>(i);
    const auto [same, fresh] = added.try_emplace({records[i].path, records[i].volume}, number);
    if (!fresh) {
      replaced.push_back(std::exchange(same->second, number));
      continue;
    }
    const bool failed = index_.Find(ThumbnailIndex::HashOf(records[i].path), [&](size_t index) {
      const KeyRead read = TryKey(static_cast<int64_t>(index), key);
      const bool wanted = read == KeyRead::Done && !key.deleted && key.path == records[i].path &&
                          key.volume == records[i].volume;
      if (wanted) replaced.push_back(static_cast<int64_t>(index));
      return read == KeyRead::Failed;
    });
    if (failed) return false;
  }
  return true;
}

bool ThumbnailDatabase::WriteRecords(std::span<const DatabaseRecord> records, int64_t first) {
  KeyBytes key;
  for (const DatabaseRecord& record : records) {
    if (!BytesOf(record, key) || !file_.WriteAt(OffsetOf(first++), record.thumbnail.bytes, key))
      return false;
  }
  return file_.Sync();
}

bool ThumbnailDatabase::AppendDatabaseRecords(std::span<const DatabaseRecord> records,
                                              bool replace) {
  DatabaseHeader header;
  if (!LockAndCheck(header)) return false;
  const Unlocker unlocker(file_);
  const int64_t first = header.count;
  if (first != RecordCount(header) || INT32_MAX - first < static_cast<int64_t>(records.size()))
    return false;
  if (replace && !UpdateIndex(StateOf(header))) return false;
  const bool indexed = indexed_ == StateOf(header);
  indexed_ = {};  // until all is done
  std::vector<int64_t> replaced;
  if (replace && !FindRecordsToReplace(records, first, replaced)) return false;
  if (!WriteRecords(records, first)) return false;
  header.count += static_cast<int32_t>(records.size());
  header.appended = static_cast<uint32_t>(platform::Now());
  if (!WriteDatabaseHeader(header)) return false;
  // Must come last, so that a counted record is never lost.
  for (const int64_t index : replaced) {
    if (!MarkDeleted(index)) return false;
  }
  if (!replaced.empty() && !file_.Sync()) return false;
  if (!indexed) return true;
  for (const DatabaseRecord& record : records) index_.Append(IndexedHash(record));
  for (const int64_t index : replaced) index_.Change(static_cast<size_t>(index), 0);
  indexed_ = StateOf(header);
  return true;
}

bool ThumbnailDatabase::WriteDatabaseRecord(int64_t index, const DatabaseRecord& record) {
  DatabaseHeader header;
  if (!LockAndCheck(header)) return false;
  const Unlocker unlocker(file_);
  if (index < 0 || index >= RecordCount(header)) return false;
  const bool indexed = indexed_ == StateOf(header);
  indexed_ = {};
  if (!WriteRecords({&record, 1}, index)) return false;
  if (!indexed) return true;
  index_.Change(static_cast<size_t>(index), IndexedHash(record));
  indexed_ = StateOf(header);
  return true;
}

// The parameters of a lookup.
struct ThumbnailDatabase::Wanted {
  std::string_view path, volume;
  PictureStamp stamp;
};

bool ThumbnailDatabase::Find(const std::string& path, const std::string& volume,
                             ThumbnailRecord& thumbnail, const PictureStamp& stamp) {
  ThumbnailIndex::State state;
  DatabaseHeader header;
  if (!file_.IsStill(path_, state.size, state.modified)) {  // compacted meanwhile
    if (OpenFile(path_, false, readOnlyToo_) != Opened::Done ||
        !file_.IsStill(path_, state.size, state.modified))
      return false;
  }
  if (!ReadDatabaseHeader(header)) return false;
  state.count = RecordsIn(header, state.size);
  const uint32_t hash = ThumbnailIndex::HashOf(path);
  const auto isIt = [&](size_t index) {
    return TakeThumbnail(static_cast<int64_t>(index), {path, volume, stamp}, thumbnail);
  };
  // The first lookup after opening uses the index file directly; loading it is worthwhile only for
  // the next one.
  if (state != indexed_ && state.count >= kLargeIndex && !std::exchange(triedFile_, true)) {
    if (const std::optional<bool> found =
            ThumbnailIndex::FindInFile(IndexPath(path_), state, hash, isIt))
      return *found;
  }
  (void)UpdateIndex(state);  // ignore unreadable records
  return index_.Find(hash, isIt);
}

// Loads the thumbnail of a record if it matches.
bool ThumbnailDatabase::TakeThumbnail(int64_t index, const Wanted& wanted,
                                      ThumbnailRecord& thumbnail) const {
  KeyBytes bytes;
  DatabaseKey key;
  if (!file_.ReadAt(OffsetOf(index), thumbnail.bytes, bytes) ||
      !thumbnail.HasMagic(kSmallThumbnailMagic))
    return false;
  TakeKey(bytes, key);
  return !key.deleted && key.volume == wanted.volume && key.stamp.Suits(wanted.stamp) &&
         ComparisonKey(key.path) == ComparisonKey(wanted.path);
}

int64_t ThumbnailDatabase::Delete(std::span<const std::string> paths) {
  DatabaseHeader header;
  if (!LockAndCheck(header)) return -1;
  const Unlocker unlocker(file_);
  if (!UpdateIndex(StateOf(header))) return -1;
  std::vector<size_t> deleted;
  DatabaseKey key;
  for (const std::string& path : paths) {
    const bool failed = index_.Find(ThumbnailIndex::HashOf(path), [&](size_t index) {
      const KeyRead read = TryKey(static_cast<int64_t>(index), key);
      if (read == KeyRead::Done && !key.deleted && key.path == path) deleted.push_back(index);
      return read == KeyRead::Failed;
    });
    if (failed) return -1;
  }
  return MarkAllDeleted(deleted, header);
}

int64_t ThumbnailDatabase::DeleteBelow(std::span<const std::string> folders) {
  DatabaseHeader header;
  if (!LockAndCheck(header)) return -1;
  const Unlocker unlocker(file_);
  if (!UpdateIndex(StateOf(header))) return -1;
  std::vector<std::string> beginnings;
  for (const std::string& folder : folders)
    beginnings.push_back(platform::JoinFolder(folder, std::string_view()));
  std::vector<size_t> deleted;
  DatabaseKey key;
  for (int64_t i = 0; i < RecordCount(header); ++i) {
    const KeyRead read = TryKey(i, key);
    if (read == KeyRead::Failed) return -1;
    const auto isBelow = [&](const std::string& beginning) {
      return key.path.starts_with(beginning);
    };
    if (read == KeyRead::Done && !key.deleted && std::ranges::any_of(beginnings, isBelow))
      deleted.push_back(static_cast<size_t>(i));
  }
  return MarkAllDeleted(deleted, header);
}

// Needs the lock and an up-to-date index.
int64_t ThumbnailDatabase::MarkAllDeleted(const std::vector<size_t>& records,
                                          const DatabaseHeader& header) {
  indexed_ = {};  // until all is done
  for (const size_t index : records) {
    if (!MarkDeleted(static_cast<int64_t>(index))) return -1;
    index_.Change(index, 0);
  }
  if (!records.empty() && !file_.Sync()) return -1;
  indexed_ = StateOf(header);
  return static_cast<int64_t>(records.size());
}

ThumbnailDatabase::Compacted ThumbnailDatabase::CopyLiveRecords(platform::StoreFile& to,
                                                                DatabaseHeader header, bool purge,
                                                                ProgressSink* progress,
                                                                const StopToken& stop) {
  const int32_t count = header.count;
  header.count = 0;
  // Write the header first, so that leftovers of an interrupted run can be recognized.
  if (!to.WriteAt(0, BytesOf(header))) return Compacted::Failed;
  std::vector<uint8_t> bytes(kDatabaseRecordSize);
  for (int32_t i = 0; i < count; ++i) {
    if (progress != nullptr) progress->Step(i, count);
    if (stop.Asked()) return Compacted::Stopped;
    if (!file_.ReadAt(OffsetOf(i), bytes) || !ByteReader(bytes).Match(kSmallThumbnailMagic))
      return Compacted::NotRead;
    DatabaseKey key;
    TakeKey(std::span<const uint8_t>(bytes).subspan(kPathOffset), key);
    if (key.deleted) continue;
    if (purge && platform::FactsOf(key.path).kind == platform::FileKind::Missing &&
        PurgesMissing(key))
      continue;
    if (!to.WriteAt(OffsetOf(header.count), bytes)) return Compacted::Failed;
    ++header.count;
  }
  if (header.count > 0) header.appended = static_cast<uint32_t>(platform::Now());
  return to.WriteAt(0, BytesOf(header)) && to.Sync() ? Compacted::Done : Compacted::Failed;
}

ThumbnailDatabase::Compacted ThumbnailDatabase::CompactThumbnailDatabase(bool purge,
                                                                         ProgressSink* progress,
                                                                         const StopToken& stop) {
  const Compacted result = CompactLocked(purge, progress, stop);
  if (result == Compacted::Done && OpenThumbnailDatabase(path_, false, hidden_) != Opened::Done)
    return Compacted::NotRead;
  return result;
}

ThumbnailDatabase::Compacted ThumbnailDatabase::CompactLocked(bool purge, ProgressSink* progress,
                                                              const StopToken& stop) {
  using platform::StoreFile;
  DatabaseHeader header;
  if (!LockAndCheck(header)) return Compacted::NotRead;
  const Unlocker unlocker(file_);
  if (header.count != RecordCount(header)) return Compacted::NotRead;
  const std::string copy = path_ + ".BAK";
  if (IsLeftover(copy) && !platform::DeleteFile(copy)) return Compacted::Failed;
  StoreFile to;
  if (to.Open(copy, StoreFile::Mode::CreateNew) != StoreFile::OpenResult::Done)
    return Compacted::Failed;
  Compacted result = CopyLiveRecords(to, header, purge, progress, stop);
  if (result == Compacted::Done && platform::RenameFile(copy, path_, platform::Existing::Replace) !=
                                       platform::CommitResult::Done) {
    result = Compacted::Failed;
  }
  to.Close();
  if (result != Compacted::Done) {
    (void)platform::DeleteFile(copy);
  } else if (hidden_) {
    (void)platform::SetHidden(path_, true);
  }
  return result;
}

bool FindDatabaseThumbnail(ThumbnailRecord& thumbnail, const std::string& path,
                           const std::string& databasePath) {
  platform::StoreFile file;
  DatabaseHeader header;
  std::vector<uint8_t> bytes(kDatabaseRecordSize);
  if (file.Open(databasePath, platform::StoreFile::Mode::Read) !=
      platform::StoreFile::OpenResult::Done)
    return false;
  if (!ReadHeaderOf(file, header)) return false;
  for (int64_t i = 0; i < header.count; ++i) {
    if (!file.ReadAt(OffsetOf(i), bytes) || !ByteReader(bytes).Match(kSmallThumbnailMagic))
      return false;
    if (TextViewIn(std::span(bytes).subspan(kPathOffset)) != path) continue;
    std::copy_n(bytes.begin(), thumbnail.bytes.size(), thumbnail.bytes.begin());
    return true;
  }
  return false;
}

}  // namespace fotomill
