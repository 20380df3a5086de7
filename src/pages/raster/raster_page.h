#pragma once

#include <map>
#include <memory>
#include <string>
#include <utility>

#include "core/status.h"
#include "drawing/text_font.h"
#include "pages/model/page.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// A picture as it appears on a raster page.
struct RasterPicture {
  Rectangle area;     // pixels of the page; width and height 0: outside of it
  PackedImage image;  // 24 bits
  PackedImage cover;  // an alpha plane; empty: opaque
};

// The size of a page in pixels.
Size PixelSize(const Page& page, double dpi);
// The size at which a picture is drawn, at least 1 x 1 pixels.
Size PixelSize(const PictureItem& item, double dpi);

// Computes how an upright picture appears on a page of `page` pixels, and takes its pixels.
// Thread-safe. Statuses as ScalePicture.
Status PrepareRasterPicture(const PictureItem& item, Size page, double dpi, PictureRecord& record,
                            RasterPicture& prepared);

// Draws pages as 24-bit images. Rectangles and lines along the axes have sharp edges on pixel
// boundaries, everything else is anti-aliased. Not thread-safe.
class RasterPages {
 public:
  explicit RasterPages(double dpi) : dpi_(dpi) {}

  // Begins a page with its background. Statuses as NewPackedImage.
  Status Begin(const Page& page);
  // Draws an item other than a picture; links do not show. ResourceError if there is no font,
  // MemoryAllocationError.
  Status Draw(const PageItem& item);
  void Draw(const RasterPicture& picture);
  // The current page.
  PackedImage& Image() { return image_; }

 private:
  int32_t Pixel(double mm) const;
  Status Fill(const std::vector<Point>& corners, Color color);
  Status DrawLineItem(const LineItem& line);
  Status DrawDash(const LineItem& line, double from, double to, double length);
  Status DrawText(const TextItem& text);

  const double dpi_;
  PackedImage image_;
  // by family and line height in pixels
  std::map<std::pair<std::string, double>, std::unique_ptr<TextFont>> fonts_;
};

}  // namespace fotomill
