#include "metadata/exif/picture_exif.h"

#include "metadata/exif/exif_edit.h"
#include "metadata/xmp/xmp_edit.h"

namespace fotomill {

Orientation OrientationOf(const PictureRecord& picture) {
  return static_cast<Orientation>(ExifOrientation(picture.metadata.exif));
}

Status TurnPicture(PictureRecord& picture, Orientation turn) {
  RETURN_IF_BAD(OrientPicture(picture, turn));
  std::vector<uint8_t>& exif = picture.metadata.exif;
  if (turn != Orientation::Upright) DropExifThumbnail(exif);
  SetExifPictureFacts(exif, {.orientation = 1});
  SetXmpOrientation(picture.metadata.xmp, 1);
  return Status::Ok;
}

Status TurnUpright(PictureRecord& picture) {
  const Orientation orientation = OrientationOf(picture);
  return orientation == Orientation::Upright ? Status::Ok : TurnPicture(picture, orientation);
}

void RefreshExif(PictureRecord& picture) {
  if (picture.image.Empty()) return;
  SetExifPictureFacts(picture.metadata.exif,
                      {.width = picture.image.Width(), .height = picture.image.Height()});
}

}  // namespace fotomill
