#include "catalog/thumbnails/thumbnail_file.h"

#include <algorithm>
#include <cstring>
#include <set>

#include "core/text.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "processing/faces/face_finder.h"

namespace fotomill {

namespace {

bool WriteRecord(const ThumbnailRecord& record, const std::string& path) {
  platform::OutputFile file;
  return file.Create(path) && file.Write(record.bytes) &&
         file.Commit(platform::Existing::Replace) == platform::CommitResult::Done;
}

// Reads as many bytes as fit in a record, and zeroes the rest; returns their number, 0 if the file
// cannot be read.
size_t ReadRecord(const std::string& path, ThumbnailRecord& record) {
  platform::FileView file;
  if (!file.OpenHead(path.c_str(), record.bytes.size())) return 0;
  const std::span<const uint8_t> bytes = file.Bytes();
  std::memcpy(record.bytes.data(), bytes.data(), bytes.size());
  return file.Intact() ? bytes.size() : 0;
}

}  // namespace

std::string ThumbnailPathFor(std::string_view picturePath) {
  const platform::PathParts parts = platform::SplitPath(picturePath);
  return platform::JoinPath({parts.drive, parts.folder, parts.base, kThumbnailExtension});
}

bool ReadThumbnailFile(ThumbnailRecord& record, const std::string& path) {
  ThumbnailRecord read;
  const size_t count = ReadRecord(path, read);
  if (count < kSmallThumbnailMagic.size() || !read.HasMagic(kSmallThumbnailMagic)) return false;
  if (count < read.bytes.size() || read.Version() < 2) ExpandOldRecord(read);
  record = read;
  return true;
}

bool ReadThumbnailForPicture(const std::string& picturePath, ThumbnailRecord& record) {
  record = ThumbnailRecord();
  ThumbnailRecord read;
  if (ReadRecord(ThumbnailPathFor(picturePath), read) < read.bytes.size()) return false;
  if (!read.HasMagic(kSmallThumbnailMagic)) return false;
  record = read;
  return true;
}

bool WriteThumbnailFile(ThumbnailRecord& record, const std::string& path, bool hidden) {
  record.Sign();
  const platform::FileFacts facts = platform::FactsOf(path);
  if (facts.kind == platform::FileKind::Regular && !facts.link && !platform::SetNormal(path))
    return false;
  if (!WriteRecord(record, path)) return false;
  if (hidden) (void)platform::SetHidden(path, true);  // ignore errors: the file is complete
  return true;
}

bool WriteThumbnailForPicture(const std::string& picturePath, const PictureRecord& picture,
                              Color background) {
  ThumbnailRecord record;
  return MakeBlendedThumbnailRecord(record, picture, background) &&
         WriteRecord(record, ThumbnailPathFor(picturePath));
}

Status MakeThumbnailOfFile(const std::string& picturePath, const ThumbnailOptions& options,
                           ThumbnailRecord& record, Status* shortfall) {
  PicturePointer picture;
  // The quick scaler's result depends on the source size.
  const int32_t side = options.quick     ? 0
                       : options.onFaces ? kFramingSide
                                         : kSmallThumbnailSide;
  const ReadRequest request{.fileName = picturePath,
                            .thumbnailSide = side,
                            .partial = shortfall != nullptr,
                            .options = options.read};
  RETURN_IF_BAD(LoadPicture(request, picture));
  if (shortfall != nullptr) *shortfall = picture->shortfall;
  if (picture->image.Empty()) return Status::EmptyImage;
  if (options.onFaces) RETURN_IF_BAD(FrameOnFaces(*picture, options.faces, options.onAllFaces));
  return MakeThumbnailRecord(record, *picture, options) ? Status::Ok
                                                        : Status::MemoryAllocationError;
}

std::optional<std::vector<std::string>> OrphanThumbnails(const std::string& folder,
                                                         const std::vector<std::string>& names) {
  const auto entries = platform::ListFolder(folder);
  if (!entries) return std::nullopt;
  std::set<std::string> owned;
  for (const std::string& name : names)
    owned.insert(LowerCase(ThumbnailPathFor(platform::FileNameOf(name))));
  std::vector<std::string> orphans;
  for (const platform::FolderEntry& entry : *entries) {
    const bool thumbnail =
        entry.kind == platform::FileKind::Regular && !entry.link && !entry.name.starts_with('.') &&
        EqualIgnoringCase(platform::SplitPath(entry.name).extension, kThumbnailExtension);
    if (thumbnail && !owned.contains(LowerCase(entry.name)))
      orphans.push_back(platform::JoinFolder(folder, entry.name));
  }
  return orphans;
}

}  // namespace fotomill
