#include "catalog/thumbnails/exif_thumbnail.h"

#include "platform/file_view.h"
#include "platform/temporary_file.h"
#include "registry/registry.h"

namespace fotomill {

Status DecodeExifThumbnail(std::span<const uint8_t> bytes, PicturePointer& picture) {
  picture.reset();
  if (bytes.empty()) return Status::EmptyImage;
  platform::TemporaryFile file;
  if (!file.Create(".JPG")) return Status::ErrorCreatingFile;
  if (!file.Write(bytes)) return Status::ErrorWritingFile;
  return LoadPicture({.fileName = file.Path()}, picture);
}

Status EncodeExifThumbnail(PictureRecord& picture, const EncodeOptions& options,
                           std::vector<uint8_t>& bytes) {
  bytes.clear();
  platform::TemporaryFile file;
  if (!file.Create(".JPG")) return Status::ErrorCreatingFile;
  RETURN_IF_BAD(WritePicture(picture, file.Path(), {.encode = options}));
  platform::FileView view;
  if (!view.Open(file.Path())) return Status::FileOpenError;
  bytes.assign(view.Bytes().begin(), view.Bytes().end());
  return Status::Ok;
}

}  // namespace fotomill
