#include "pages/catalog_look.h"

namespace fotomill {

namespace {

// All in pixels.
constexpr int32_t kPictureInset = 2;  // offset from the cell's top left corner
// offset of the right and bottom frame lines from the picture area
constexpr int32_t kFrameReach = 3;
constexpr int32_t kCaptionTop = 3, kCaptionBottom = 18;  // from the bottom of the picture area
// around the grid, for pages without a fixed size
constexpr int32_t kPageMargin = 12;
constexpr Color kWhite = 0xFFFFFF, kBlack = 0, kDarkGray = 0x404040, kGray = 0xA0A0A0;

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

ContactLayout LayoutOf(const CatalogLook& look, const std::string& font) {
  constexpr double kPixel = kMmPerInch / kCatalogDpi;
  const Rectangle page = PageSize(look), first = CellPlace(look, 0);
  const bool raised = look.frame == CellFrame::Raised;
  const Color flat = look.blackText ? kBlack : kGray;
  return {.pageWidth = page.width * kPixel,
          .pageHeight = page.height * kPixel,
          .columns = look.columns,
          .rows = look.rows,
          .left = first.x * kPixel,
          .top = first.y * kPixel,
          .cellWidth = look.cellWidth * kPixel,
          .cellHeight = look.cellHeight * kPixel,
          .stepX = (look.cellWidth + kCellExtraWidth) * kPixel,
          .stepY = (look.cellHeight + kCellExtraHeight) * kPixel,
          .inset = kPictureInset * kPixel,
          .frameReach = kFrameReach * kPixel,
          .frameWidth = kPixel,
          .captionGap = kCaptionTop * kPixel,
          .captionHeight = (kCaptionBottom - kCaptionTop) * kPixel,
          .lineHeight = kCaptionHeight * kPixel,
          .frame = look.frame,
          .light = raised ? kWhite : flat,
          .dark = raised ? kDarkGray : flat,
          .text = look.blackText ? kBlack : kWhite,
          .background = look.background,
          .names = look.names,
          .font = font};
}

}  // namespace fotomill
