// Pictures in archives: a page's entry is unpacked to a temporary file, which is read by its own
// format. The archive is read in a worker process; see archive/archive_reader.h.
#include "formats/archive/archive_picture.h"

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "archive/archive_reader.h"
#include "core/limits.h"
#include "core/natural_order.h"
#include "formats/inner_file.h"
#include "platform/file_view.h"
#include "platform/output_file.h"

namespace fotomill {

namespace {

// Hidden files, and the folder with file attributes added by macOS.
bool IsHiddenEntry(std::string_view name) {
  return name.starts_with('.') || name.find("/.") != std::string_view::npos ||
         name.starts_with("__MACOSX/");
}

bool IsPicture(const ArchiveEntry& entry) {
  if (!entry.IsFile() || IsHiddenEntry(entry.name)) return false;
  const FormatEntry* const row = InnerRowOfName(entry.name);
  return row != nullptr && IsInnerRow(*row) && row->extension.view() != "TXT";
}

// Indices of the entries that are pictures, in natural order.
std::vector<size_t> PicturesOf(const std::vector<ArchiveEntry>& entries) {
  std::vector<size_t> pictures;
  for (size_t i = 0; i < entries.size(); ++i) {
    if (IsPicture(entries[i])) pictures.push_back(i);
  }
  std::ranges::stable_sort(pictures, [&](size_t a, size_t b) {
    return CompareNatural(entries[a].name, entries[b].name) < 0;
  });
  return pictures;
}

// Writes the entry to the temporary file, limited to what codecs can use.
class Unpacked final : public EntryReceiver {
 public:
  explicit Unpacked(const std::string& path) : path_(path) {}
  Status Begin(size_t) override {
    return file_.Create(path_) ? Status::Ok : Status::ErrorCreatingFile;
  }
  Status Data(std::span<const uint8_t> bytes) override {
    size_ += bytes.size();
    if (size_ > limits.fileMemoryBytes) return Status::MemoryAllocationError;
    return file_.Write(bytes) ? Status::Ok : Status::ErrorWritingFile;
  }
  void End(size_t, const ArchiveEnd& end) override {
    status = end.status;
    const bool done = status == Status::Ok &&
                      file_.Commit(platform::Existing::Replace) == platform::CommitResult::Done;
    if (status == Status::Ok && !done) status = Status::ErrorWritingFile;
  }
  Status status = Status::FileReadError;  // of the entry

 private:
  const std::string path_;
  platform::OutputFile file_;
  uint64_t size_ = 0;
};

// Unpacks a page and finds its format.
Status Unpack(const ReadRequest& request, int32_t& pages, InnerFile& inner) {
  const ArchiveSource source = {.path = request.fileName, .stop = request.stop};
  std::vector<ArchiveEntry> entries;
  RETURN_IF_BAD(ListArchive(source, entries).status);
  const std::vector<size_t> pictures = PicturesOf(entries);
  pages = static_cast<int32_t>(std::min<size_t>(pictures.size(), limits.filePages));
  if (request.page < 0 || request.page >= pages) return Status::NoImages;
  const size_t index = pictures[static_cast<size_t>(request.page)];
  inner.name = entries[index].name;
  RETURN_IF_BAD(CreateInnerFile(request, inner));
  inner.request.page = 0;
  Unpacked unpacked(inner.request.fileName);
  std::vector<bool> wanted(entries.size());
  wanted[index] = true;
  const Status status = ReadArchive(source, entries, wanted, unpacked).status;
  RETURN_IF_BAD(unpacked.status == Status::FileReadError ? status : unpacked.status);
  RETURN_IF_BAD(unpacked.status);
  return FindInnerRow(inner);
}

void Describe(const InnerFile& inner, const ReadRequest& request, int32_t pages,
              PictureRecord& picture) {
  picture.pageCount = pages;
  std::string type("Archived ");
  picture.typeName.AssignCut(type.append(inner.name));
  platform::FileView archive;
  if (archive.OpenHead(request.fileName.c_str(), 1)) picture.fileSize = archive.FileSize();
}

}  // namespace

Status ArchivePictureInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  InnerFile inner;
  int32_t pages = 0;
  RETURN_IF_BAD(Unpack(request, pages, inner));
  RETURN_IF_BAD(inner.row->info(picture, inner.request));
  Describe(inner, request, pages, picture);
  return Status::Ok;
}

Status ArchivePictureRead(PictureRecord& picture, const ReadRequest& request) {
  picture.image.Free();
  picture.alpha.Free();
  InnerFile inner;
  int32_t pages = 0;
  if (const Status status = Unpack(request, pages, inner); status != Status::Ok) {
    const ProgressScope progress(picture);  // otherwise the inner format has one
    return status;
  }
  // each page is a separate file
  RETURN_IF_BAD(inner.row->info(picture, inner.request));
  if ((inner.row->flags & FMT_RENDERED) == 0)
    RETURN_IF_BAD(inner.row->read(picture, inner.request));
  Describe(inner, request, pages, picture);
  return Status::Ok;
}

}  // namespace fotomill
