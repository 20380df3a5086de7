#include "catalog/similar/hash_store.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "core/byte_reader.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr std::string_view kMagic = "FMWHASH1";
constexpr uint64_t kHeadBytes = 120, kSummedFrom = 8, kDigestBytes = 16;
constexpr uint64_t kMostRecordBytes = kHeadBytes + 4096;
constexpr uint64_t kMostStoreBytes = uint64_t{1} << 30;
constexpr uint32_t kHasHashes = 1, kHasDigest = 2;
constexpr int64_t kFresh = 2;             // seconds
constexpr uint64_t kFewRecords = 10000;   // smaller stores are never rewritten

uint32_t SumOf(std::span<const uint8_t> bytes) {
  uint32_t sum = 0x811c9dc5u;
  for (const uint8_t byte : bytes) sum = (sum ^ byte) * 0x01000193u;
  return sum;
}

void PutLittle(std::vector<uint8_t>& bytes, uint64_t value, int count) {
  for (int i = 0; i < count; ++i) bytes.push_back(static_cast<uint8_t>(value >> (8 * i)));
}

uint8_t Nibble(char c) { return static_cast<uint8_t>(c <= '9' ? c - '0' : c - 'a' + 10); }

void AddRecord(const std::string& path, const HashRecord& record, std::vector<uint8_t>& bytes) {
  const size_t start = bytes.size();
  PutLittle(bytes, kHeadBytes + path.size(), 4);
  PutLittle(bytes, 0, 4);
  PutLittle(bytes, record.size, 8);
  PutLittle(bytes, static_cast<uint64_t>(record.modified), 8);
  PutLittle(bytes, static_cast<uint32_t>(record.width), 4);
  PutLittle(bytes, static_cast<uint32_t>(record.height), 4);
  for (const PictureHash hash : record.hashes) PutLittle(bytes, hash, 8);
  const bool digest = record.digest.size() == 2 * kDigestBytes;
  for (size_t i = 0; i < kDigestBytes; ++i) {
    bytes.push_back(digest ? static_cast<uint8_t>(Nibble(record.digest[2 * i]) << 4 |
                                                  Nibble(record.digest[2 * i + 1]))
                           : uint8_t{0});
  }
  PutLittle(bytes, (record.hasHashes ? kHasHashes : 0) | (digest ? kHasDigest : 0), 4);
  PutLittle(bytes, 0, 4);
  bytes.insert(bytes.end(), path.begin(), path.end());
  const uint32_t sum = SumOf(std::span(bytes).subspan(start + kSummedFrom));
  for (size_t i = 0; i < 4; ++i) bytes[start + 4 + i] = static_cast<uint8_t>(sum >> (8 * i));
}

std::string DigestText(std::span<const uint8_t> bytes) {
  constexpr const char* kDigits = "0123456789abcdef";
  std::string text;
  for (const uint8_t byte : bytes) {
    text += kDigits[byte >> 4];
    text += kDigits[byte & 15];
  }
  return text;
}

// Parses the next record. False at the end, or if it is incomplete.
bool TakeRecord(ByteReader& reader, std::string& path, HashRecord& record) {
  const uint64_t start = reader.Position();
  const uint64_t length = reader.Le32();
  const uint32_t sum = reader.Le32();
  if (length <= kHeadBytes || length > kMostRecordBytes || !reader.Ok()) return false;
  const auto summed = reader.Peek(length - kSummedFrom);
  if (summed.size() != length - kSummedFrom || SumOf(summed) != sum) return false;
  record = {};
  record.size = reader.Le64();
  record.modified = static_cast<int64_t>(reader.Le64());
  record.width = static_cast<int32_t>(reader.Le32());
  record.height = static_cast<int32_t>(reader.Le32());
  for (PictureHash& hash : record.hashes) hash = reader.Le64();
  const auto digest = reader.Take(kDigestBytes);
  const uint32_t flags = reader.Le32();
  reader.Skip(4);
  record.hasHashes = (flags & kHasHashes) != 0;
  if ((flags & kHasDigest) != 0) record.digest = DigestText(digest);
  const auto name = reader.Take(length - kHeadBytes);
  path.assign(name.begin(), name.end());
  return reader.Ok() && reader.Position() == start + length;
}

}  // namespace

HashStore::HashStore(std::string path) : path_(std::move(path)) { writable_ = Load(); }

// False if the store exists but cannot be used.
bool HashStore::Load() {
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
  if (bytes.size() < kMagic.size() ||
      !std::ranges::equal(std::span(bytes).first(kMagic.size()), kMagic))
    return false;
  end_ = kMagic.size();
  end_ += TakeRecords(std::span(bytes).subspan(kMagic.size()));
  return writable;
}

// Adds records; returns the number of bytes parsed.
uint64_t HashStore::TakeRecords(std::span<const uint8_t> bytes) {
  ByteReader reader(bytes);
  std::string path;
  HashRecord record;
  uint64_t whole = 0;
  for (; TakeRecord(reader, path, record); whole = reader.Position()) {
    records_.insert_or_assign(path, record);
    ++parsed_;
  }
  return whole;
}

const HashRecord* HashStore::Find(const std::string& path, uint64_t size, int64_t modified) const {
  for (const auto* const known : {&unsaved_, &records_}) {
    const auto found = known->find(path);
    if (found != known->end() && found->second.size == size && found->second.modified == modified)
      return &found->second;
  }
  return nullptr;
}

void HashStore::Put(const std::string& path, const HashRecord& record) {
  if (path.size() > kMostRecordBytes - kHeadBytes || record.modified + kFresh > platform::Now())
    return;
  unsaved_.insert_or_assign(path, record);
}

bool HashStore::Save() {
  if (unsaved_.empty()) return true;
  // Another program may create or replace the store at any time; then reload it.
  for (int tries = 0; tries < 3 && writable_; ++tries) {
    if (!file_.IsOpen()) {
      if (Rewrite(platform::Existing::Refuse)) return true;
    } else {
      const platform::StoreLock lock(file_);
      if (!lock.Held()) return false;
      if (file_.IsStill(path_)) {
        const uint64_t live = records_.size() + unsaved_.size();
        return parsed_ > kFewRecords && parsed_ > 2 * live ? Rewrite(platform::Existing::Replace)
                                                           : Append();
      }
    }
    writable_ = Load();
  }
  return false;
}

// Needs the lock.
bool HashStore::Append() {
  // After the parsed part there may be records of another program, or an incomplete one.
  const uint64_t size = file_.Size();
  if (size < end_ || size > kMostStoreBytes) return false;
  std::vector<uint8_t> added(size - end_);
  if (!file_.ReadAt(end_, added)) return false;
  end_ += TakeRecords(added);
  std::vector<uint8_t> bytes;
  for (const auto& [path, record] : unsaved_) AddRecord(path, record, bytes);
  if (!file_.Resize(end_) || !file_.WriteAt(end_, bytes) || !file_.Sync()) return false;
  end_ += bytes.size();
  parsed_ += unsaved_.size();
  for (auto& [path, record] : unsaved_) records_.insert_or_assign(path, std::move(record));
  unsaved_.clear();
  return true;
}

bool HashStore::Rewrite(platform::Existing existing) {
  if (!platform::MakeFolders(std::string(platform::SplitPath(path_).folder))) return false;
  std::vector<uint8_t> bytes(kMagic.begin(), kMagic.end());
  for (const auto& [path, record] : unsaved_) records_.insert_or_assign(path, record);
  for (const auto& [path, record] : records_) AddRecord(path, record, bytes);
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
