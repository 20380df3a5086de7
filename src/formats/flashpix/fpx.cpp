// FlashPix pictures (FPX). For the file layout see fpx_file.cpp.
//
// The picture is the largest resolution of the first object; a smaller one that suffices is used
// for thumbnails. Grays become 8 bits, PhotoYCC and RGB 24. Colors premultiplied by opacity are
// divided by it. Rotation, cropping and color changes of a view are not applied; the record's
// warning says so.
#include "formats/flashpix/fpx.h"

#include <algorithm>
#include <utility>

#include "formats/flashpix/fpx_file.h"
#include "formats/flashpix/fpx_tiles.h"
#include "platform/file_view.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

Status DescribePicture(const FpxFile& fpx, const FpxSize& size, PictureRecord& picture) {
  const bool gray = size.colors == FpxColors::Gray;
  picture.typeName.AssignCut("FlashPix");
  picture.width = size.width;
  picture.height = size.height;
  picture.bitsPerPixel = gray ? 8 : 24;
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (size.opacity ? kHasAlpha : 0));
  if (gray) {
    picture.palette = GrayRamp();
  } else {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  }
  picture.warning.Clear();
  if (fpx.HasTransform())
    picture.warning.AssignCut(
        TrLater("Rotation, crop and color changes of the view are not shown."));
  return Status::Ok;
}

Status OpenPicture(platform::FileView& file, const std::string& name, FpxFile& fpx, bool withTiles,
                   FpxSize& size, PictureRecord& picture) {
  if (!file.Open(name)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  RETURN_IF_BAD(fpx.Open(file.Bytes()));
  RETURN_IF_BAD(fpx.ReadSize(fpx.Sizes() - 1, withTiles, size));
  return DescribePicture(fpx, size, picture);
}

// Selects the smallest resolution that suffices for a thumbnail, if it is the picture halved as
// often as expected.
void ChooseForThumbnail(const FpxFile& fpx, int32_t side, FpxSize& size, PictureRecord& picture) {
  for (int32_t index = 0; index < fpx.Sizes() - 1; ++index) {
    const int32_t halvings = fpx.Sizes() - 1 - index;
    if (halvings > 16) continue;
    const int32_t step = 1 << halvings;
    FpxSize smaller;
    if (fpx.ReadSize(index, true, smaller) != Status::Ok) continue;
    const bool halved = smaller.width == (picture.width + step - 1) / step &&
                        smaller.height == (picture.height + step - 1) / step &&
                        smaller.colors == size.colors && smaller.opacity == size.opacity;
    if (!halved || std::max(smaller.width, smaller.height) / 2 < side) continue;
    size = std::move(smaller);
    picture.reduction = step;
    return;
  }
}

// Copies the last decoded tile to its position.
void PlaceTile(const FpxTileDecoder& decoder, const FpxSize& size, int32_t left, int32_t top,
               PackedImage& image, PackedImage& alpha) {
  const int32_t columns = std::min(size.tileWidth, size.width - left);
  const int32_t rows = std::min(size.tileHeight, size.height - top);
  const size_t bytes = image.Bits() == 24 ? 3 : 1;
  for (int32_t y = 0; y < rows; ++y) {
    std::ranges::copy(decoder.Pixels(y).first(bytes * static_cast<size_t>(columns)),
                      image.Row(top + y).begin() + static_cast<ptrdiff_t>(bytes) * left);
    if (size.opacity)
      std::ranges::copy(decoder.Opacities(y).first(static_cast<size_t>(columns)),
                        alpha.Row(top + y).begin() + left);
  }
}

Status ReadTiles(const FpxFile& fpx, const FpxSize& size, const PictureRecord& picture,
                 PackedImage& image, PackedImage& alpha) {
  FpxTileDecoder decoder(fpx, size);
  const int32_t across = size.TilesAcross();
  for (int32_t i = 0; i < across * size.TilesDown(); ++i) {
    RETURN_IF_BAD(decoder.Decode(size.tiles[static_cast<size_t>(i)]));
    const int32_t top = i / across * size.tileHeight;
    PlaceTile(decoder, size, i % across * size.tileWidth, top, image, alpha);
    const int32_t last = std::min(top + size.tileHeight, size.height);
    for (int32_t y = top; i % across == across - 1 && y < last; ++y)
      RETURN_IF_BAD(picture.ReportRow(y, size.height));
    if (picture.stop.Asked()) return Status::FunctionCancelled;
  }
  return Status::Ok;
}

// Whether the data are large enough for all uncompressed tiles; checked before allocating memory.
bool DataAreThere(const FpxSize& size) {
  const uint64_t plain = static_cast<uint64_t>(size.tileWidth) *
                         static_cast<uint64_t>(size.tileHeight) *
                         static_cast<uint64_t>(size.channels);
  return std::ranges::all_of(size.tiles, [&](const FpxTile& tile) {
    const uint64_t needed = tile.compression == 0 ? plain : tile.compression == 2 ? tile.size : 0;
    return tile.compression == 1 ||
           (needed <= size.data.Size() && tile.offset <= size.data.Size() - needed);
  });
}

}  // namespace

Status FpxInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  FpxFile fpx;
  FpxSize size;
  return OpenPicture(file, request.fileName, fpx, false, size, picture);
}

Status FpxRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  picture.reduction = 1;
  platform::FileView file;
  FpxFile fpx;
  FpxSize size;
  RETURN_IF_BAD(OpenPicture(file, request.fileName, fpx, true, size, picture));
  if (request.thumbnailSide > 0) ChooseForThumbnail(fpx, request.thumbnailSide, size, picture);
  if (!DataAreThere(size)) return Status::FileReadError;
  PackedImage image, alpha;
  RETURN_IF_BAD(
      NewPackedImage(size.width, size.height, &picture.palette, picture.bitsPerPixel, image));
  if (size.opacity) RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, alpha));
  RETURN_IF_BAD(ReadTiles(fpx, size, picture, image, alpha));
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status FpxDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  FpxFile fpx;
  FpxSize size;
  RETURN_IF_BAD(OpenPicture(file, picture.fileName.c_str(), fpx, true, size, picture));
  constexpr const char* kColors[] = {"", "gray", "PhotoYCC", "RGB"};
  int32_t uses[3] = {};
  for (const FpxTile& tile : size.tiles) {
    if (tile.compression < 3) ++uses[tile.compression];
  }
  DetailLines& lines = picture.detailLines;
  lines.AddFormat("       Colors: %s%s", kColors[static_cast<int32_t>(size.colors)],
                  size.opacity ? ", opacity" : "");
  lines.AddFormat("        Sizes: %d", fpx.Sizes());
  lines.AddFormat("        Tiles: %d x %d pixels", size.tileWidth, size.tileHeight);
  if (uses[0] > 0) lines.AddFormat("   Plain tiles: %d", uses[0]);
  if (uses[1] > 0) lines.AddFormat("   One color: %d", uses[1]);
  if (uses[2] > 0) lines.AddFormat("   JPEG tiles: %d", uses[2]);
  return Status::Ok;
}

}  // namespace fotomill
