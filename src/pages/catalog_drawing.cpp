#include "pages/catalog_drawing.h"

#include <algorithm>
#include <cstring>

#include "processing/flatten.h"
#include "processing/geometry/scale.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kPictureInset = 2;  // offset from the cell's top left corner
// offset of the right and bottom frame lines from the picture area
constexpr int32_t kFrameReach = 3;
constexpr int32_t kCaptionTop = 3, kCaptionBottom = 18;  // from the bottom of the picture area
// around the grid, for pages without a fixed size
constexpr int32_t kPageMargin = 12;
constexpr Color kWhite = 0xFFFFFF, kBlack = 0, kDarkGray = 0x404040, kGray = 0xA0A0A0;

void FillPixels(PackedImage& page, Rectangle area, Color color) {
  const int32_t left = std::max(area.x, 0), right = std::min(area.x + area.width, page.Width());
  const int32_t top = std::max(area.y, 0), bottom = std::min(area.y + area.height, page.Height());
  for (int32_t y = top; y < bottom; ++y) {
    uint8_t* pixel = page.Row(y).data() + static_cast<ptrdiff_t>(left) * 3;
    for (int32_t x = left; x < right; ++x, pixel += 3) {
      pixel[0] = static_cast<uint8_t>(color >> 16);
      pixel[1] = static_cast<uint8_t>(color >> 8);
      pixel[2] = static_cast<uint8_t>(color);
    }
  }
}

void DrawFrame(const CatalogLook& look, const Rectangle& cell, PackedImage& page) {
  if (look.frame == CellFrame::None) return;
  const bool raised = look.frame == CellFrame::Raised;
  const Color flat = look.blackText ? kBlack : kGray;
  const Color light = raised ? kWhite : flat, dark = raised ? kDarkGray : flat;
  const int32_t right = cell.x + cell.width + kFrameReach,
                bottom = cell.y + cell.height + kFrameReach;
  const int32_t width = right - cell.x + 1, height = bottom - cell.y + 1;
  FillPixels(page, {cell.x, cell.y, width, 1}, light);
  FillPixels(page, {cell.x, cell.y, 1, height}, light);
  FillPixels(page, {cell.x, bottom, width, 1}, dark);
  FillPixels(page, {right, cell.y, 1, height}, dark);
}

void PutImage(const PackedImage& image, int32_t left, int32_t top, PackedImage& page) {
  for (int32_t y = std::max(0, -top); y < std::min(image.Height(), page.Height() - top); ++y) {
    const int32_t first = std::max(0, -left), last = std::min(image.Width(), page.Width() - left);
    if (first >= last) return;
    std::memcpy(page.Row(top + y).data() + static_cast<ptrdiff_t>(left + first) * 3,
                image.Row(y).data() + static_cast<ptrdiff_t>(first) * 3,
                static_cast<size_t>(last - first) * 3);
  }
}

// edge * room / other, rounded to nearest.
int32_t Scaled(int32_t edge, int32_t room, int32_t other) {
  const int64_t scaled = (2 * int64_t{edge} * room + other) / (2 * int64_t{other});
  return static_cast<int32_t>(std::max<int64_t>(scaled, 1));
}

}  // namespace

Rectangle PageSize(const CatalogLook& look) {
  const int32_t width =
      look.columns * (look.cellWidth + kCellExtraWidth) - kCellExtraWidth + 2 * kPageMargin;
  const int32_t height = look.rows * (look.cellHeight + kCellExtraHeight) + 2 * kPageMargin;
  return {0, 0, look.pageWidth > 0 ? look.pageWidth : width,
          look.pageHeight > 0 ? look.pageHeight : height};
}

Rectangle CellPlace(const CatalogLook& look, int32_t index) {
  const Rectangle page = PageSize(look);
  const int32_t width = look.cellWidth + kCellExtraWidth,
                height = look.cellHeight + kCellExtraHeight;
  const int32_t left = (page.width - look.columns * width + kCellExtraWidth) / 2;
  const int32_t top = (page.height - look.rows * height) / 2;
  return {left + index % look.columns * width, top + index / look.columns * height, look.cellWidth,
          look.cellHeight};
}

Rectangle PicturePlace(const CatalogLook& look, const Rectangle& cell, int32_t width,
                       int32_t height) {
  const bool wide = int64_t{width} * look.cellHeight >= int64_t{height} * look.cellWidth;
  Rectangle place{0, 0, look.cellWidth, look.cellHeight};
  if (wide) {
    place.height = std::min(Scaled(height, look.cellWidth, width), look.cellHeight);
  } else {
    place.width = std::min(Scaled(width, look.cellHeight, height), look.cellWidth);
  }
  place.x = cell.x + kPictureInset + (look.cellWidth - place.width) / 2;
  place.y = cell.y + kPictureInset + (look.cellHeight - place.height) / 2;
  return place;
}

Status MakeCellImage(PictureRecord& picture, const CatalogLook& look, PackedImage& image) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const Rectangle place = PicturePlace(look, {}, picture.width, picture.height);
  RETURN_IF_BAD(ScalePicture(picture, {place.width, place.height}, ScaleFilter::Lanczos));
  picture.background = look.background;
  picture.alphaFlags |= kFlattenOnBackground;
  RETURN_IF_BAD(FlattenAlpha(picture));
  RETURN_IF_BAD(PromotePicture(picture));
  image = std::move(picture.image);
  return Status::Ok;
}

Status NewCatalogPage(const CatalogLook& look, PackedImage& page) {
  const Rectangle size = PageSize(look);
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, page));
  FillPixels(page, size, look.background);
  return Status::Ok;
}

Status DrawCell(const CatalogLook& look, int32_t index, const PackedImage& image,
                std::string_view name, TextFont* font, PackedImage& page) {
  const Rectangle cell = CellPlace(look, index);
  DrawFrame(look, cell, page);
  PutImage(image, cell.x + kPictureInset + (cell.width - image.Width()) / 2,
           cell.y + kPictureInset + (cell.height - image.Height()) / 2, page);
  if (font == nullptr || !look.names) return Status::Ok;
  const int32_t below = cell.y + kPictureInset + cell.height;
  const Rectangle band{cell.x + kPictureInset, below + kCaptionTop, cell.width,
                       kCaptionBottom - kCaptionTop};
  return font->DrawCentered(page, band, font->Fitted(name, band.width),
                            look.blackText ? kBlack : kWhite);
}

}  // namespace fotomill
