#include "desktop/models/metadata/strip_preview.h"

#include <algorithm>

#include "metadata/edit/picture_edit.h"
#include "metadata/edit/strip.h"
#include "platform/file_view.h"
#include "texts/status_text.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

using Names = std::vector<const char*>;

std::string ListOf(const Names& names) {
  std::string list;
  for (const char* name : names) list.append(list.empty() ? "" : ", ").append(Tr(name));
  return list.empty() ? Tr("nothing") : list;
}

size_t TagCount(std::span<const uint8_t> file) {
  const ExifDirectories exif = GatherPictureExif(file);
  return exif.first.size() + exif.exif.size();
}

}  // namespace

StripPreview PreviewStrip(const std::string& path, const StripRequest& strip) {
  StripPreview preview;
  platform::FileView file;
  if (!file.Open(path)) {
    preview.problem = WithReason(Tr("It cannot be read."));
    return preview;
  }
  FilePieces made;
  const Status status = strip.placesOnly
                            ? StripPlaces(file.Bytes(), made, preview.problem)
                            : StripPicture(file.Bytes(), strip.kept, made, preview.problem);
  if (status != Status::Ok) {
    if (preview.problem.empty()) preview.problem = StatusText(status);
    return preview;
  }
  const std::vector<uint8_t> stripped = made.Joined();
  const Names before = MetadataLeft(file.Bytes()), after = MetadataLeft(stripped);
  Names removed;
  for (const char* name : before) {
    if (std::ranges::find(after, name) == after.end()) removed.push_back(name);
  }
  if (removed.empty() && TagCount(stripped) < TagCount(file.Bytes()))
    removed.push_back(TrLater("some EXIF tags"));
  if (removed.empty() && strip.placesOnly && !made.Are(file.Bytes()))
    removed.push_back(TrLater("parts of these"));
  preview.removed = ListOf(removed);
  preview.left = ListOf(after);
  return preview;
}

std::string MetadataInFile(const std::string& path) {
  platform::FileView file;
  return file.Open(path) ? ListOf(MetadataLeft(file.Bytes()))
                         : WithReason(Tr("It cannot be read."));
}

}  // namespace fotomill::desktop
