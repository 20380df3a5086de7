#include "archive/zip_writer.h"

#include <algorithm>
#include <string_view>

#include "archive/archive_library.h"
#include "archive/archive_limits.h"
#include "core/text.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/utf8_locale.h"

namespace fotomill {

namespace {

constexpr std::string_view kCompressed[] = {
    "7z",  "apng", "avif", "bz2",  "docx", "flac", "gif", "gz",   "hdp",  "heic", "heif",
    "jfi", "jfif", "jpe",  "jpeg", "jpg",  "jxl",  "jxr", "lzma", "m4a",  "m4v",  "mkv",
    "mov", "mp3",  "mp4",  "odt",  "ogg",  "opus", "pdf", "png",  "pptx", "rar",  "tgz",
    "wdp", "webm", "webp", "wmv",  "xlsx", "xz",   "zip", "zst"};
static_assert(std::ranges::is_sorted(kCompressed));

constexpr size_t kBlock = 1 << 20;  // bytes per write
constexpr int kPermissions = 0644;

struct EntryCloser {
  void operator()(archive_entry* entry) const { LibArchive().entry_free(entry); }
};

la_ssize_t WriteBytes(archive*, void* file, const void* bytes, size_t size) {
  const bool done =
      static_cast<platform::OutputFile*>(file)->Write({static_cast<const uint8_t*>(bytes), size});
  return done ? static_cast<la_ssize_t>(size) : -1;
}

}  // namespace

struct ZipWriter::State {
  ~State() {
    if (zip != nullptr) LibArchive().write_free(zip);
  }
  platform::OutputFile file;  // must outlive the library's state, which may write when freed
  archive* zip = nullptr;
  bool failed = false;
};

ZipWriter::ZipWriter() = default;
ZipWriter::~ZipWriter() = default;

bool IsStoredUnpacked(const std::string& name) {
  return std::ranges::binary_search(kCompressed, LowerCase(platform::ExtensionOf(name)));
}

Status ZipWriter::Create(const std::string& path, const std::string& password) {
  if (password.size() > kLongestPassword || password.find('\0') != std::string::npos)
    return Status::InvalidPassword;
  const ArchiveLibrary& library = LibArchive();
  if (!library.Whole()) return Status::FeatureDisabled;
  auto state = std::make_unique<State>();
  state->zip = library.write_new();
  if (state->zip == nullptr) return Status::MemoryAllocationError;
  library.write_set_format_zip(state->zip);
  library.write_set_bytes_in_last_block(state->zip, 1);
  if (!password.empty() &&
      (library.write_set_options(state->zip, "zip:encryption=aes256") != ARCHIVE_OK ||
       library.write_set_passphrase(state->zip, password.c_str()) != ARCHIVE_OK))
    return Status::FeatureDisabled;
  if (!state->file.Create(path)) return Status::ErrorCreatingFile;
  if (library.write_open(state->zip, &state->file, nullptr, WriteBytes, nullptr) != ARCHIVE_OK)
    return Status::ErrorWritingFile;
  state_ = std::move(state);
  return Status::Ok;
}

Status ZipWriter::Add(const std::string& path, const std::string& name, const StopToken& stop) {
  const ArchiveLibrary& library = LibArchive();
  platform::FileView file;
  if (!file.Open(path)) return Status::FileOpenError;
  const platform::Utf8Locale names;
  const std::unique_ptr<archive_entry, EntryCloser> entry(library.entry_new());
  if (entry == nullptr) return Status::MemoryAllocationError;
  library.entry_set_pathname(entry.get(), name.c_str());
  library.entry_set_filetype(entry.get(), AE_IFREG);
  library.entry_set_perm(entry.get(), kPermissions);
  library.entry_set_size(entry.get(), static_cast<la_int64_t>(file.FileSize()));
  library.entry_set_mtime(entry.get(), platform::FactsOf(path).modified, 0);
  state_->failed = true;  // until complete
  if (IsStoredUnpacked(name)) {
    library.write_zip_set_compression_store(state_->zip);
  } else {
    library.write_zip_set_compression_deflate(state_->zip);
  }
  if (library.write_header(state_->zip, entry.get()) < ARCHIVE_WARN)
    return Status::ErrorWritingFile;
  const auto bytes = file.Bytes();
  for (size_t done = 0; done < bytes.size();) {
    if (stop.Asked()) return Status::FunctionCancelled;
    const auto block = bytes.subspan(done, std::min(kBlock, bytes.size() - done));
    const auto written = library.write_data(state_->zip, block.data(), block.size());
    if (written < 0 || static_cast<size_t>(written) != block.size())
      return Status::ErrorWritingFile;
    done += block.size();
    file.DropBefore(done);
  }
  if (library.write_finish_entry(state_->zip) < ARCHIVE_WARN) return Status::ErrorWritingFile;
  if (!file.Intact()) return Status::FileReadError;
  state_->failed = false;
  return Status::Ok;
}

platform::CommitResult ZipWriter::Finish(platform::Existing existing) {
  if (state_ == nullptr || state_->failed || LibArchive().write_close(state_->zip) != ARCHIVE_OK) {
    state_.reset();
    return platform::CommitResult::Failed;
  }
  return state_->file.Commit(existing);
}

}  // namespace fotomill
