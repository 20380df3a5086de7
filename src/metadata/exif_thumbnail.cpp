#include "metadata/exif_thumbnail.h"

#include "picture/registry.h"
#include "platform/temporary_file.h"

namespace fotomill {

Status DecodeExifThumbnail(std::span<const uint8_t> bytes, PicturePointer& picture) {
  picture.reset();
  if (bytes.empty()) return Status::EmptyImage;
  platform::TemporaryFile file;
  if (!file.Create(".JPG")) return Status::ErrorCreatingFile;
  if (!file.Write(bytes)) return Status::ErrorWritingFile;
  return LoadPicture(file.Path().c_str(), picture);
}

}  // namespace fotomill
