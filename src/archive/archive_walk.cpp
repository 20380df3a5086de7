#include "archive/archive_walk.h"

#include <array>
#include <memory>

#include "archive/archive_kind.h"
#include "archive/archive_library.h"
#include "archive/archive_limits.h"
#include "platform/utf8_locale.h"

namespace fotomill {

namespace {

constexpr size_t kBlock = 64 * 1024;  // bytes per read

struct Closer {
  void operator()(archive* a) const { LibArchive().read_free(a); }
};
using Reader = std::unique_ptr<archive, Closer>;

class Walk {
 public:
  Walk(const ArchiveKind& kind, bool hasPassword, ArchiveSink& sink)
      : rar_(kind.type != ArchiveKind::Zip), hasPassword_(hasPassword), sink_(sink) {}

  ArchiveEnd Run(std::span<const uint8_t> file, const std::string& password, uint32_t mostEntries) {
    const ArchiveLibrary& library = LibArchive();
    Reader reader(library.read_new());
    if (reader == nullptr) return {Status::MemoryAllocationError};
    if (rar_) {
      library.read_support_format_rar(reader.get());
      library.read_support_format_rar5(reader.get());
    } else {
      // uses the central directory, like other programs
      library.read_support_format_zip_seekable(reader.get());
    }
    if (!password.empty()) library.read_add_passphrase(reader.get(), password.c_str());
    if (library.read_open_memory(reader.get(), file.data(), file.size()) < ARCHIVE_WARN)
      return ErrorOf(reader.get(), false);
    for (uint32_t count = 0;; ++count) {
      archive_entry* entry = nullptr;
      const int result = library.read_next_header(reader.get(), &entry);
      if (result == ARCHIVE_EOF) return {};
      if (result < ARCHIVE_WARN) return ErrorOf(reader.get(), false);
      if (count == mostEntries) return {Status::UnsupportedFormat, ArchiveTrouble::TooManyEntries};
      TakeEntry(reader.get(), entry);
    }
  }

 private:
  void TakeEntry(archive* reader, archive_entry* entry) {
    const ArchiveLibrary& library = LibArchive();
    RawEntry raw;
    const auto type = library.entry_filetype(entry);
    raw.kind = library.entry_hardlink(entry) != nullptr || type == AE_IFLNK ? RawEntry::Link
               : type == AE_IFDIR                                           ? RawEntry::Folder
               : type == AE_IFREG                                           ? RawEntry::File
                                                                            : RawEntry::Other;
    raw.sizeKnown = library.entry_size_is_set(entry) != 0 && library.entry_size(entry) >= 0;
    raw.size = raw.sizeKnown ? static_cast<uint64_t>(library.entry_size(entry)) : 0;
    raw.modified = library.entry_mtime_is_set(entry) != 0 ? library.entry_mtime(entry) : 0;
    raw.encrypted = library.entry_is_data_encrypted(entry) != 0;
    const char* const name = library.entry_pathname(entry);
    if (sink_.Entry(raw, name == nullptr ? std::string_view() : name))
      sink_.EndEntry(PassData(reader, raw));
  }

  ArchiveEnd PassData(archive* reader, const RawEntry& raw) {
    // the library would return encrypted bytes
    if (rar_ && raw.encrypted) return {Status::InvalidPassword, ArchiveTrouble::LockedRar};
    const bool empty = raw.sizeKnown && raw.size == 0;
    while (!empty) {
      const auto size = LibArchive().read_data(reader, block_.data(), block_.size());
      if (size < 0) return ErrorOf(reader, raw.encrypted);
      if (size == 0) break;
      sink_.Data({block_.data(), static_cast<size_t>(size)});
    }
    passwordFits_ = passwordFits_ || (raw.encrypted && !empty);
    return {};
  }

  // The library distinguishes most errors only by their texts.
  ArchiveEnd ErrorOf(archive* reader, bool encrypted) const {
    const char* const text = LibArchive().error_string(reader);
    const std::string_view error = text == nullptr ? "" : text;
    const auto says = [&](std::string_view word) {
      return error.find(word) != std::string_view::npos;
    };
    if (says("ncrypt")) {
      return rar_ ? ArchiveEnd{Status::InvalidPassword, ArchiveTrouble::LockedRar}
                  : ArchiveEnd{Status::UnsupportedFormat, ArchiveTrouble::Method};
    }
    if (says("nsupported")) return {Status::UnsupportedFormat, ArchiveTrouble::Method};
    // The old encryption does not detect all wrong passwords; with the others, decompression fails.
    if (says("assphrase") || (encrypted && !passwordFits_))
      return {Status::InvalidPassword,
              hasPassword_ ? ArchiveTrouble::WrongPassword : ArchiveTrouble::NeedsPassword};
    if (says("memory")) return {Status::MemoryAllocationError};
    return {says("runcated") ? Status::FileReadError : Status::DamagedFile};
  }

  const bool rar_, hasPassword_;
  ArchiveSink& sink_;
  bool passwordFits_ = false;  // it has decrypted an entry
  std::array<uint8_t, kBlock> block_{};
};

}  // namespace

ArchiveEnd WalkArchive(std::span<const uint8_t> file, const std::string& password,
                       uint32_t mostEntries, ArchiveSink& sink) {
  const ArchiveKind kind = ArchiveKindOf(file);
  if (kind.type == ArchiveKind::None) return {Status::DamagedFile};
  if (kind.volume) return {Status::UnsupportedFormat, ArchiveTrouble::Volume};
  if (kind.namesLocked) return {Status::InvalidPassword, ArchiveTrouble::LockedRar};
  if (!LibArchive().Whole()) return {Status::FeatureDisabled};
  const platform::Utf8Locale names;
  const auto walk = std::make_unique<Walk>(kind, !password.empty(), sink);
  return walk->Run(file, password, mostEntries);
}

}  // namespace fotomill
