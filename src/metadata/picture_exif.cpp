#include "metadata/picture_exif.h"

#include "metadata/exif_edit.h"
#include "processing/orient.h"

namespace fotomill {

Status TurnUpright(PictureRecord& picture) {
  std::vector<uint8_t>& exif = picture.metadata.exif;
  const auto orientation = static_cast<Orientation>(ExifOrientation(exif));
  if (orientation == Orientation::Upright) return Status::Ok;
  RETURN_IF_BAD(OrientPicture(picture, orientation));
  DropExifThumbnail(exif);
  SetExifPictureFacts(exif, {.orientation = 1});
  return Status::Ok;
}

void RefreshExif(PictureRecord& picture) {
  if (picture.image.Empty()) return;
  SetExifPictureFacts(picture.metadata.exif, {.width = picture.image.Width(), .height = picture.image.Height()});
}

}  // namespace fotomill
