// Archives are untrusted and read by a C library, so this is done in a worker process: a crash
// affects the archive, not the program, and the worker cannot write files. Data from the worker is
// validated like the contents of a file.
#include "archive/archive_reader.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <new>
#include <string>
#include <unordered_set>
#include <utility>

#include "archive/archive_exchange.h"
#include "archive/archive_library.h"
#include "archive/entry_name.h"
#include "core/byte_reader.h"
#include "platform/file_view.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// CPU time, as damaged data may keep the library busy
constexpr unsigned kSecondsAtLeast = 60;
constexpr uint64_t kBytesPerSecond = 1 << 20;  // of the archive

// Parses the records from a worker.
class Records {
 public:
  virtual ~Records() = default;
  // Return false to end the worker.
  virtual bool Entry(const RawEntry& entry, std::string_view name) = 0;
  virtual bool Data(std::span<const uint8_t> bytes) = 0;
  virtual bool EndEntry(const ArchiveEnd& end) = 0;

  // Parses all records in a block.
  bool Take(std::span<const uint8_t> block) {
    ByteReader bytes(block);
    while (bytes.Left() > 0) {
      RecordHead head;
      if (!Copy(bytes, head)) return false;
      ByteReader record(bytes.Take(head.size));
      if (!bytes.Ok() || !TakeRecord(head.kind, record)) return false;
    }
    return true;
  }
  bool ended = false;  // the end of the archive was received
  ArchiveEnd archiveEnd;

 private:
  template <typename Plain>
  static bool Copy(ByteReader& bytes, Plain& plain) {
    const auto taken = bytes.Take(sizeof plain);
    if (!bytes.Ok()) return false;
    std::memcpy(&plain, taken.data(), sizeof plain);
    return true;
  }
  bool TakeRecord(RecordHead::Kind kind, ByteReader& record) {
    RawEntry entry;
    ArchiveEnd entryEnd;
    switch (kind) {
      case RecordHead::Entry: {
        if (!Copy(record, entry)) return false;
        const auto name = record.Take(record.Left());
        return Entry(entry, {reinterpret_cast<const char*>(name.data()), name.size()});
      }
      case RecordHead::Data: return Data(record.Take(record.Left()));
      case RecordHead::EndEntry: return Copy(record, entryEnd) && EndEntry(entryEnd);
      case RecordHead::End: return ended = Copy(record, archiveEnd);
    }
    return false;
  }
};

using ExchangeBlock = platform::SharedBlock;

ArchiveEnd Run(const ArchiveSource& source, bool data, uint64_t fileSize, ExchangeBlock& block,
               Records& records) {
  auto& exchange = *reinterpret_cast<ArchiveExchange*>(block.Bytes().data());
  if (source.password.size() > kLongestPassword)
    return {Status::InvalidPassword, ArchiveTrouble::WrongPassword};
  const ExchangeRequest head = {archiveLimits.entries, data ? 1u : 0u,
                                static_cast<uint32_t>(source.password.size())};
  std::vector<uint8_t> request(sizeof head);
  std::memcpy(request.data(), &head, sizeof head);
  request.insert(request.end(), source.password.begin(), source.password.end());
  bool goesOn = true;
  const platform::ApartResult result = platform::RunApart(
      {.task = kArchiveTask.name,
       .request = request,
       .inputFile = source.path,
       .reply = block,
       .seconds = kSecondsAtLeast + static_cast<unsigned>(fileSize / kBytesPerSecond),
       .memory = archiveLimits.memoryBytes,
       .goesOn = [&] { return goesOn && !source.stop.Asked(); }},
      [&](int32_t size) {
        const auto filled = static_cast<uint32_t>(size);
        goesOn = goesOn && filled <= kExchangeBlock && records.Take({exchange.block, filled});
        if (goesOn) exchange.taken.fetch_add(1, std::memory_order_release);
      });
  switch (result) {
    case platform::ApartResult::Done:
      return records.ended ? records.archiveEnd : ArchiveEnd{Status::DamagedFile};
    case platform::ApartResult::Failed: return {Status::MemoryAllocationError};
    case platform::ApartResult::Stopped:
      return {source.stop.Asked() ? Status::FunctionCancelled : Status::DamagedFile};
    case platform::ApartResult::NotStarted: return {Status::ResourceError};
    case platform::ApartResult::Broken: break;
  }
  return {Status::DamagedFile};
}

// Checks that the file can be opened, and creates the block.
ArchiveEnd Prepare(const ArchiveSource& source, uint64_t& fileSize, ExchangeBlock& block) {
  platform::FileView file;
  if (!file.OpenHead(source.path.c_str(), 1)) return {Status::FileOpenError};
  fileSize = file.FileSize();
  if (!block.Allocate(sizeof(ArchiveExchange))) return {Status::MemoryAllocationError};
  new (block.Bytes().data()) ArchiveExchange;
  return {};
}

class Lister final : public Records {
 public:
  explicit Lister(std::vector<ArchiveEntry>& entries) : entries_(entries) {}
  bool Entry(const RawEntry& raw, std::string_view name) override {
    ArchiveEntry entry = {ReadableEntryName(name), raw, EntryRefusal::None};
    if (!IsSafeEntryName(entry.name)) {
      entry.refusal = EntryRefusal::UnsafeName;
    } else if (raw.kind == RawEntry::Link) {
      entry.refusal = EntryRefusal::Link;
    } else if (raw.kind != RawEntry::File && raw.kind != RawEntry::Folder) {
      entry.refusal = EntryRefusal::Special;
    } else if (!names_.insert(entry.name).second && raw.kind == RawEntry::File) {
      entry.refusal = EntryRefusal::Duplicate;
    }
    entries_.push_back(std::move(entry));
    return entries_.size() <= archiveLimits.entries;
  }
  bool Data(std::span<const uint8_t>) override { return false; }
  bool EndEntry(const ArchiveEnd&) override { return false; }

 private:
  std::vector<ArchiveEntry>& entries_;
  std::unordered_set<std::string> names_;
};

class Unpacker final : public Records {
 public:
  Unpacker(std::span<const ArchiveEntry> entries, const std::vector<bool>& wanted,
           uint64_t fileSize, EntryReceiver& receiver)
      : entries_(entries),
        wanted_(wanted),
        receiver_(receiver),
        most_(std::max(archiveLimits.unpackedBytes, fileSize * archiveLimits.ratio)) {}

  bool Entry(const RawEntry&, std::string_view name) override {
    const size_t index = next_++;
    if (index >= entries_.size() || entries_[index].name != ReadableEntryName(name)) {
      trouble = ArchiveTrouble::Changed;
      return false;
    }
    open_ = wanted_[index];
    if (open_) status_ = receiver_.Begin(index);
    return true;
  }
  bool Data(std::span<const uint8_t> bytes) override {
    if (!open_) return false;
    unpacked_ += bytes.size();
    if (unpacked_ > most_) {
      trouble = ArchiveTrouble::Bomb;
      return false;
    }
    if (status_ == Status::Ok) status_ = receiver_.Data(bytes);
    return true;
  }
  bool EndEntry(const ArchiveEnd& end) override {
    if (!open_) return false;
    open_ = false;
    receiver_.End(next_ - 1, status_ != Status::Ok ? ArchiveEnd{status_} : end);
    return true;
  }
  // Ends what is still open when the worker has exited.
  void Close(const ArchiveEnd& end) {
    if (std::exchange(open_, false)) receiver_.End(next_ - 1, end);
  }
  ArchiveTrouble trouble = ArchiveTrouble::None;

 private:
  const std::span<const ArchiveEntry> entries_;
  const std::vector<bool>& wanted_;
  EntryReceiver& receiver_;
  const uint64_t most_;
  uint64_t unpacked_ = 0;
  size_t next_ = 0;
  bool open_ = false;
  Status status_ = Status::Ok;
};

}  // namespace

ArchiveLimits archiveLimits;

bool HasArchiveLibrary() { return LibArchive().Whole(); }

std::string ArchiveLibraryVersion() {
  if (!HasArchiveLibrary()) return "missing";
  const std::string_view text = LibArchive().version_string();  // "libarchive 3.6.2"
  return std::string(text.substr(text.rfind(' ') + 1));
}

ArchiveEnd ListArchive(const ArchiveSource& source, std::vector<ArchiveEntry>& entries) {
  entries.clear();
  uint64_t fileSize = 0;
  ExchangeBlock block;
  if (const ArchiveEnd end = Prepare(source, fileSize, block); end.status != Status::Ok) return end;
  Lister lister(entries);
  return Run(source, false, fileSize, block, lister);
}

ArchiveEnd ReadArchive(const ArchiveSource& source, std::span<const ArchiveEntry> entries,
                       const std::vector<bool>& wanted, EntryReceiver& receiver) {
  uint64_t fileSize = 0;
  ExchangeBlock block;
  if (const ArchiveEnd end = Prepare(source, fileSize, block); end.status != Status::Ok) return end;
  auto& exchange = *reinterpret_cast<ArchiveExchange*>(block.Bytes().data());
  for (size_t i = 0; i < std::min<size_t>(wanted.size(), kMostWanted); ++i) {
    if (wanted[i]) exchange.wanted[i / 8] |= static_cast<uint8_t>(1u << (i % 8));
  }
  Unpacker unpacker(entries, wanted, fileSize, receiver);
  ArchiveEnd end = Run(source, true, fileSize, block, unpacker);
  if (unpacker.trouble == ArchiveTrouble::Bomb) end = {Status::UnsupportedFormat, unpacker.trouble};
  if (unpacker.trouble == ArchiveTrouble::Changed) end = {Status::FileReadError, unpacker.trouble};
  unpacker.Close(end.status == Status::Ok ? ArchiveEnd{Status::FileReadError} : end);
  return end;
}

std::string_view TroubleText(ArchiveTrouble trouble) {
  switch (trouble) {
    case ArchiveTrouble::None: break;
    case ArchiveTrouble::NeedsPassword: return TrLater("It is encrypted and needs a password.");
    case ArchiveTrouble::WrongPassword: return TrLater("The password is wrong.");
    case ArchiveTrouble::LockedRar:
      return TrLater("Encrypted RAR archives cannot be read, with or without the password.");
    case ArchiveTrouble::Volume:
      return TrLater("It is one part of a split archive; join the parts first.");
    case ArchiveTrouble::Method: return TrLater("It is compressed or encrypted in an unknown way.");
    case ArchiveTrouble::TooManyEntries: return TrLater("It has too many entries.");
    case ArchiveTrouble::Bomb:
      return TrLater(
          "It unpacks to far more than its own size, as archives made to fill a disk do.");
    case ArchiveTrouble::Changed: return TrLater("The archive was changed meanwhile.");
  }
  return {};
}

std::string_view RefusalText(EntryRefusal refusal) {
  switch (refusal) {
    case EntryRefusal::None: break;
    case EntryRefusal::UnsafeName:
      return TrLater("Its name is unsafe: it could lead out of the folder.");
    case EntryRefusal::Link: return TrLater("It is a link.");
    case EntryRefusal::Special: return TrLater("It is a device or another special file.");
    case EntryRefusal::Duplicate: return TrLater("An earlier entry has the same name.");
  }
  return {};
}

}  // namespace fotomill
