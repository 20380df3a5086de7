#include "catalog/records/record_store.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "core/byte_reader.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeadBytes = 24, kSummedFrom = 8;
constexpr uint64_t kMostPathBytes = 4096;
constexpr uint64_t kMostDataBytes = uint64_t{1} << 20;
constexpr uint64_t kMostStoreBytes = uint64_t{1} << 30;
constexpr int64_t kFresh = 2;            // seconds
constexpr uint64_t kFewRecords = 10000;  // smaller stores are never rewritten
constexpr int kMostAside = 100;          // names tried for a file that is moved aside

uint32_t SumOf(std::span<const uint8_t> bytes) {
  uint32_t sum = 0x811c9dc5u;
  for (const uint8_t byte : bytes) sum = (sum ^ byte) * 0x01000193u;
  return sum;
}

void PutLittle(std::vector<uint8_t>& bytes, uint64_t value, int count) {
  for (int i = 0; i < count; ++i) bytes.push_back(static_cast<uint8_t>(value >> (8 * i)));
}

// A record; false if it is too large for a store.
bool AddRecord(const RecordLayout& layout, const std::string& path, const StoredRecord& record,
               std::vector<uint8_t>& bytes) {
  if (path.size() > kMostPathBytes || record.data.size() > kMostDataBytes) return false;
  const size_t start = bytes.size();
  const uint64_t lengthBytes = layout.dataBytes == 0 ? 4 : 0;
  PutLittle(bytes, kHeadBytes + lengthBytes + record.data.size() + path.size(), 4);
  PutLittle(bytes, 0, 4);
  PutLittle(bytes, record.size, 8);
  PutLittle(bytes, static_cast<uint64_t>(record.modified), 8);
  if (lengthBytes > 0) PutLittle(bytes, record.data.size(), 4);
  bytes.insert(bytes.end(), record.data.begin(), record.data.end());
  bytes.insert(bytes.end(), path.begin(), path.end());
  const uint32_t sum = SumOf(std::span(bytes).subspan(start + kSummedFrom));
  for (size_t i = 0; i < 4; ++i) bytes[start + 4 + i] = static_cast<uint8_t>(sum >> (8 * i));
  return true;
}

// Parses the next record. False at the end, or if it is incomplete.
bool TakeRecord(const RecordLayout& layout, ByteReader& reader, std::string& path,
                StoredRecord& record) {
  const uint64_t start = reader.Position();
  const uint64_t length = reader.Le32();
  const uint32_t sum = reader.Le32();
  if (length <= kHeadBytes || !reader.Ok()) return false;
  const auto summed = reader.Peek(length - kSummedFrom);
  if (summed.size() != length - kSummedFrom || SumOf(summed) != sum) return false;
  record.size = reader.Le64();
  record.modified = static_cast<int64_t>(reader.Le64());
  const uint64_t dataBytes = layout.dataBytes == 0 ? reader.Le32() : layout.dataBytes;
  const uint64_t head = reader.Position() - start;
  if (!reader.Ok() || dataBytes > kMostDataBytes || length <= head + dataBytes ||
      length - head - dataBytes > kMostPathBytes)
    return false;
  const auto data = reader.Take(dataBytes);
  const auto name = reader.Take(length - head - dataBytes);
  record.data.assign(data.begin(), data.end());
  path.assign(name.begin(), name.end());
  return reader.Ok();
}

}  // namespace

RecordStore::RecordStore(std::string path, RecordLayout layout)
    : path_(std::move(path)), layout_(layout) {
  writable_ = Load();
}

// False if the store exists but cannot be used.
bool RecordStore::Load() {
  using enum platform::StoreFile::OpenResult;
  records_.clear();
  end_ = parsed_ = 0;
  if (path_.empty()) return false;
  auto opened = file_.Open(path_, platform::StoreFile::Mode::ReadWrite);
  if (opened == Missing) return true;
  const bool writable = opened == Done;
  if (!writable) opened = file_.Open(path_, platform::StoreFile::Mode::Read);
  const uint64_t size = opened == Done ? file_.Size() : 0;
  std::vector<uint8_t> bytes(std::min(size, kMostStoreBytes));
  if (opened != Done || size > kMostStoreBytes || !file_.ReadAt(0, bytes)) return false;
  const auto magic = std::span(bytes).first(std::min(bytes.size(), layout_.magic.size()));
  if (!std::ranges::equal(magic, layout_.magic)) {
    const bool moved = writable && MoveAside();
    file_.Close();
    return moved;
  }
  end_ = layout_.magic.size();
  end_ += TakeRecords(std::span(bytes).subspan(layout_.magic.size()));
  return writable;
}

// Keeps a file that is not a store under another name. The store is then empty.
bool RecordStore::MoveAside() {
  const platform::StoreLock lock(file_);
  // another program may have done so, and written a store since
  if (!lock.Held() || !file_.IsStill(path_)) return false;
  for (int number = 1; number <= kMostAside; ++number) {
    setAside_ = path_ + (number == 1 ? ".damaged" : ".damaged" + std::to_string(number));
    const auto moved = platform::RenameFile(path_, setAside_, platform::Existing::Refuse);
    if (moved == platform::CommitResult::Done) return true;
    if (moved == platform::CommitResult::Failed) break;
  }
  setAside_.clear();
  return false;
}

// Adds records; returns the number of bytes parsed.
uint64_t RecordStore::TakeRecords(std::span<const uint8_t> bytes) {
  ByteReader reader(bytes);
  std::string path;
  StoredRecord record;
  uint64_t whole = 0;
  for (; TakeRecord(layout_, reader, path, record); whole = reader.Position()) {
    records_.insert_or_assign(path, record);
    ++parsed_;
  }
  return whole;
}

const StoredRecord* RecordStore::Find(const std::string& path, uint64_t size,
                                      int64_t modified) const {
  for (const auto* const known : {&unsaved_, &records_}) {
    const auto found = known->find(path);
    if (found != known->end() && found->second.size == size && found->second.modified == modified)
      return &found->second;
  }
  return nullptr;
}

void RecordStore::Put(const std::string& path, StoredRecord record) {
  if (path.empty() || path.size() > kMostPathBytes || record.data.size() > kMostDataBytes ||
      record.modified + kFresh > platform::Now())
    return;
  unsaved_.insert_or_assign(path, std::move(record));
}

bool RecordStore::Save() {
  if (unsaved_.empty()) return true;
  // Another program may create or replace the store at any time; then reload it.
  for (int tries = 0; tries < 3 && writable_; ++tries) {
    if (!file_.IsOpen()) {
      if (Rewrite(platform::Existing::Refuse)) return true;
    } else {
      const platform::StoreLock lock(file_);
      if (!lock.Held()) return false;
      if (file_.IsStill(path_)) {
        if (!CatchUp()) return false;
        const uint64_t live = records_.size() + unsaved_.size();
        return parsed_ > kFewRecords && parsed_ > 2 * live ? Rewrite(platform::Existing::Replace)
                                                           : Append();
      }
    }
    writable_ = Load();
  }
  return false;
}

// Reads what other programs have appended; the last record may be incomplete. Needs the lock.
bool RecordStore::CatchUp() {
  const uint64_t size = file_.Size();
  if (size < end_ || size > kMostStoreBytes) return false;
  std::vector<uint8_t> added(size - end_);
  if (!file_.ReadAt(end_, added)) return false;
  end_ += TakeRecords(added);
  return true;
}

// Needs the lock.
bool RecordStore::Append() {
  std::vector<uint8_t> bytes;
  for (const auto& [path, record] : unsaved_) (void)AddRecord(layout_, path, record, bytes);
  if (!file_.Resize(end_) || !file_.WriteAt(end_, bytes) || !file_.Sync()) return false;
  end_ += bytes.size();
  parsed_ += unsaved_.size();
  for (auto& [path, record] : unsaved_) records_.insert_or_assign(path, std::move(record));
  unsaved_.clear();
  return true;
}

bool RecordStore::Rewrite(platform::Existing existing) {
  if (!platform::MakeFolders(std::string(platform::SplitPath(path_).folder))) return false;
  std::vector<uint8_t> bytes(layout_.magic.begin(), layout_.magic.end());
  for (const auto& [path, record] : unsaved_) records_.insert_or_assign(path, record);
  for (const auto& [path, record] : records_) (void)AddRecord(layout_, path, record, bytes);
  platform::OutputFile file;
  if (!file.Create(path_) || !file.Write(bytes) ||
      file.Commit(existing, true) != platform::CommitResult::Done)
    return false;
  unsaved_.clear();
  end_ = bytes.size();
  parsed_ = records_.size();
  return true;  // the next Save opens the new file
}

}  // namespace fotomill
