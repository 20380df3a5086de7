#include "files/cropped_jpeg.h"

#include <algorithm>
#include <utility>

#include "containers/jpeg_segments.h"
#include "metadata/exif/exif_edit.h"
#include "metadata/exif/exif_walk.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// The start of a mirrored range.
int32_t Mirrored(bool flip, int32_t start, int32_t length, int32_t whole) {
  return flip ? whole - start - length : start;
}

int32_t Nearest(int32_t place, int32_t block) { return (place + block / 2) / block * block; }

}  // namespace

Rectangle StoredArea(const Rectangle& shown, Size stored, Orientation orientation) {
  const Turn turn = TurnOf(orientation);
  Rectangle area = shown;
  if (turn.swap) area = {shown.y, shown.x, shown.height, shown.width};
  area.x = Mirrored(turn.flipX, area.x, area.width, stored.width);
  area.y = Mirrored(turn.flipY, area.y, area.height, stored.height);
  return area;
}

Rectangle ShownArea(const Rectangle& stored, Size size, Orientation orientation) {
  const Turn turn = TurnOf(orientation);
  Rectangle area = stored;
  area.x = Mirrored(turn.flipX, area.x, area.width, size.width);
  area.y = Mirrored(turn.flipY, area.y, area.height, size.height);
  if (turn.swap) area = {area.y, area.x, area.height, area.width};
  return area;
}

Rectangle LosslessArea(const Rectangle& shown, const JpegGrid& grid, Orientation orientation) {
  Rectangle area = StoredArea(shown, grid.picture, orientation);
  const int32_t right = area.x + area.width, bottom = area.y + area.height;
  area.x = Nearest(area.x, grid.block.width);
  area.y = Nearest(area.y, grid.block.height);
  // a narrow area must not become empty
  if (area.x >= right) area.x -= grid.block.width;
  if (area.y >= bottom) area.y -= grid.block.height;
  area.width = right - area.x;
  area.height = bottom - area.y;
  return ShownArea(area, grid.picture, orientation);
}

Status MakeCroppedJpeg(std::span<const uint8_t> file, const Rectangle& shown, const StopToken& stop,
                       std::vector<uint8_t>& made, RecordedText& obstacle) {
  made.clear();
  JpegHead head;
  RETURN_IF_BAD(ParseJpegHead(file, head));
  if (head.HasMorePictures() || head.HasSplitExif()) {
    obstacle = TrRecorded("The file has embedded pictures that depend on its size.");
    return Status::Ok;
  }
  std::vector<uint8_t> exif(head.Exif().begin(), head.Exif().end());
  const std::vector<uint8_t> xmp(head.Xmp().begin(), head.Xmp().end());
  const auto orientation = static_cast<Orientation>(ExifOrientation(exif));
  JpegGrid grid;
  RETURN_IF_BAD(ReadJpegGrid(file, grid));
  TurnedJpeg cropped;
  RETURN_IF_BAD(CropJpeg(file, StoredArea(shown, grid.picture, orientation), stop, cropped));
  obstacle = cropped.obstacle;
  if (cropped.file.empty()) return Status::Ok;
  DropExifThumbnail(exif);
  SetExifPictureFacts(exif, {.width = cropped.width, .height = cropped.height});
  return AssembleJpeg(
      file, head,
      {.exif = exif, .xmp = xmp, .pixels = cropped.file, .rest = file.subspan(cropped.end)}, made);
}

}  // namespace fotomill
