#include "pages/raster/raster_page.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "pages/model/placing.h"
#include "pages/raster/polygon_mask.h"
#include "processing/color/blend.h"
#include "processing/color/overlay.h"
#include "processing/geometry/cut.h"
#include "processing/geometry/warp.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr double kSnap = 1024;  // parts of a pixel; smaller differences are rounding errors
// A picture that would be enlarged to more than this many pages is not scaled as a whole.
constexpr int64_t kMostPages = 4;

// Rounds to nearest; halves go to the left or top.
int32_t Nearest(double value) {
  value = std::round(value * kSnap) / kSnap;
  return static_cast<int32_t>(std::clamp(std::ceil(value - 0.5), -1e9, 1e9));
}

double Length(Point vector) { return std::hypot(vector.x, vector.y); }

std::vector<Point> Scaled(std::vector<Point> points, double factor) {
  for (Point& point : points) point = point * factor;
  return points;
}

// Whether a polygon is a rectangle along the axes.
bool IsUprightBox(const std::vector<Point>& corners) {
  if (corners.size() != 4) return false;
  const Box box = BoundsOf(corners);
  const auto onEdge = [&](const Point& point) {
    return (point.x == box.x || point.x == box.Right()) &&
           (point.y == box.y || point.y == box.Bottom());
  };
  return std::ranges::all_of(corners, onEdge);
}

Rectangle PixelBox(const Box& box) {
  const int32_t left = Nearest(box.x), top = Nearest(box.y);
  return {left, top, Nearest(box.Right()) - left, Nearest(box.Bottom()) - top};
}

Rectangle Common(const Rectangle& a, const Rectangle& b) {
  const int32_t left = std::max(a.x, b.x), top = std::max(a.y, b.y),
                right = std::min(a.x + a.width, b.x + b.width),
                bottom = std::min(a.y + a.height, b.y + b.height);
  return {left, top, std::max(right - left, 0), std::max(bottom - top, 0)};
}

// The pixels of an upright item that is neither rotated nor distorted.
Rectangle PixelPlace(const PictureItem& item, double dpi) {
  const Size size = PixelSize(item, dpi);
  const Point center = (item.corner + (item.across + item.down) * 0.5) * (dpi / kMmPerInch);
  return {Nearest(center.x - size.width / 2.0), Nearest(center.y - size.height / 2.0), size.width,
          size.height};
}

Status PrepareScaled(const PictureItem& item, const Rectangle& visible, double dpi,
                     PictureRecord& record, RasterPicture& prepared) {
  const Rectangle place = PixelPlace(item, dpi);
  RETURN_IF_BAD(ScalePicture(record, {place.width, place.height}, ScaleFilter::Lanczos));
  RETURN_IF_BAD(PromotePicture(record));
  prepared.area = Common(place, visible);
  if (prepared.area.width == 0 || prepared.area.height == 0) return Status::Ok;
  if (prepared.area != place) {
    RETURN_IF_BAD(CutPicture(record, {prepared.area.x - place.x, prepared.area.y - place.y,
                                      prepared.area.width, prepared.area.height}));
  }
  prepared.image = std::move(record.image);
  prepared.cover = std::move(record.alpha);
  return Status::Ok;
}

void Multiply(PackedImage& cover, const PackedImage& other) {
  for (int32_t y = 0; y < cover.Height(); ++y) {
    uint8_t* const row = cover.Row(y).data();
    const uint8_t* const factor = other.Row(y).data();
    for (int32_t x = 0; x < cover.Width(); ++x) row[x] = Blend(0, row[x], factor[x]);
  }
}

// Any parallelogram and any visible part: each pixel of the page takes its color from the picture.
Status PrepareMapped(const PictureItem& item, Size page, double dpi, PictureRecord& record,
                     RasterPicture& prepared) {
  const double scale = dpi / kMmPerInch;
  PolygonMask mask;
  RETURN_IF_BAD(FillPolygon(Scaled(item.clip.empty() ? CornersOf(item) : item.clip, scale),
                            page.width, page.height, mask));
  prepared.area = mask.area;
  if (mask.area.width == 0) return Status::Ok;
  const Size size = PixelSize(item, dpi);
  const Size from{std::min(size.width, record.image.Width()),
                  std::min(size.height, record.image.Height())};
  if (from.width < record.image.Width() || from.height < record.image.Height() ||
      record.reduction > 1)
    RETURN_IF_BAD(ScalePicture(record, from, ScaleFilter::Lanczos));
  const Point across = item.across * scale, down = item.down * scale, corner = item.corner * scale;
  const double area = across.x * down.y - across.y * down.x;
  if (area == 0) return Status::UnsuitableImage;
  const double width = record.image.Width(), height = record.image.Height();
  // (s, t) of the center of the area's first pixel, in pixels of the picture
  const Point first = Point{mask.area.x + 0.5, mask.area.y + 0.5} - corner;
  const LinearMap map{.xx = down.y / area * width,
                      .xy = -down.x / area * width,
                      .x0 = (first.x * down.y - first.y * down.x) / area * width - 0.5,
                      .yx = -across.y / area * height,
                      .yy = across.x / area * height,
                      .y0 = (first.y * across.x - first.x * across.y) / area * height - 0.5};
  WarpOptions options;
  options.edgesRepeat = true;
  RETURN_IF_BAD(
      WarpPicture(record, {mask.area.width, mask.area.height}, options, LinearPlaces(map), {}));
  prepared.image = std::move(record.image);
  if (!record.alpha.Empty()) Multiply(mask.cover, record.alpha);
  prepared.cover = std::move(mask.cover);
  return Status::Ok;
}

}  // namespace

Size PixelSize(const Page& page, double dpi) {
  const double scale = dpi / kMmPerInch;
  return {std::max(Nearest(page.width * scale), 1), std::max(Nearest(page.height * scale), 1)};
}

Size PixelSize(const PictureItem& item, double dpi) {
  const auto side = [dpi](Point edge) {
    const double pixels = std::round(Length(edge) * dpi / kMmPerInch * kSnap) / kSnap;
    return static_cast<int32_t>(std::clamp(std::floor(pixels + 0.5), 1.0, 1e9));
  };
  return {side(item.across), side(item.down)};
}

Status PrepareRasterPicture(const PictureItem& item, Size page, double dpi, PictureRecord& record,
                            RasterPicture& prepared) {
  if (record.image.Empty()) return Status::EmptyImage;
  const bool upright = item.across.y == 0 && item.down.x == 0 && item.across.x > 0 &&
                       item.down.y > 0 && (item.clip.empty() || IsUprightBox(item.clip));
  const Size size = PixelSize(item, dpi);
  const int64_t most = kMostPages * page.width * page.height;
  if (!upright || int64_t{size.width} * size.height > most)
    return PrepareMapped(item, page, dpi, record, prepared);
  Rectangle visible{0, 0, page.width, page.height};
  if (!item.clip.empty())
    visible = Common(visible, PixelBox(BoundsOf(Scaled(item.clip, dpi / kMmPerInch))));
  return PrepareScaled(item, visible, dpi, record, prepared);
}

int32_t RasterPages::Pixel(double mm) const { return Nearest(mm * dpi_ / kMmPerInch); }

Status RasterPages::Begin(const Page& page) {
  const Size size = PixelSize(page, dpi_);
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, image_));
  return Fill(CornersOf(Box{0, 0, page.width, page.height}), page.background);
}

Status RasterPages::Fill(const std::vector<Point>& corners, Color color) {
  const std::vector<Point> pixels = Scaled(corners, dpi_ / kMmPerInch);
  const Backdrop ink{static_cast<uint8_t>(color >> 16), static_cast<uint8_t>(color >> 8),
                     static_cast<uint8_t>(color)};
  if (!IsUprightBox(corners)) {
    PolygonMask mask;
    RETURN_IF_BAD(FillPolygon(pixels, image_.Width(), image_.Height(), mask));
    if (mask.area.width > 0) PaintThroughMask(image_, mask.cover, mask.area.x, mask.area.y, ink);
    return Status::Ok;
  }
  const Rectangle area =
      Common(PixelBox(BoundsOf(pixels)), {0, 0, image_.Width(), image_.Height()});
  for (int32_t y = area.y; y < area.y + area.height; ++y) {
    uint8_t* pixel = image_.Row(y).data() + static_cast<ptrdiff_t>(area.x) * 3;
    for (int32_t x = 0; x < area.width; ++x, pixel += 3) {
      pixel[0] = ink.blue;
      pixel[1] = ink.green;
      pixel[2] = ink.red;
    }
  }
  return Status::Ok;
}

Status RasterPages::DrawDash(const LineItem& line, double from, double to, double length) {
  const double pixel = kMmPerInch / dpi_;
  const Point along = (line.to - line.from) * (1 / length);
  const double width = std::max(line.width, pixel);
  Point start = line.from + along * from, end = line.from + along * to;
  if (along.x == 0 || along.y == 0) {
    // whole pixels, so that all lines of a page look alike
    const int32_t pixels = std::max(Nearest(width / pixel), 1);
    const bool level = along.y == 0;
    const double middle = level ? start.y : start.x;
    const double low = Nearest(middle / pixel - pixels / 2.0) * pixel, high = low + pixels * pixel;
    const double first = level ? std::min(start.x, end.x) : std::min(start.y, end.y),
                 last = level ? std::max(start.x, end.x) : std::max(start.y, end.y);
    const Box box = level ? Box{first, low, last - first, high - low}
                          : Box{low, first, high - low, last - first};
    return Fill(CornersOf(box), line.color);
  }
  const Point side = Point{-along.y, along.x} * (width / 2);
  return Fill({start + side, end + side, end - side, start - side}, line.color);
}

Status RasterPages::DrawLineItem(const LineItem& line) {
  const double length = Length(line.to - line.from);
  if (length <= 0) return Status::Ok;
  if (line.dash <= 0) return DrawDash(line, 0, length, length);
  for (double from = 0; from < length; from += 2 * line.dash)
    RETURN_IF_BAD(DrawDash(line, from, std::min(from + line.dash, length), length));
  return Status::Ok;
}

Status RasterPages::DrawText(const TextItem& text) {
  const Rectangle band{Pixel(text.box.x), Pixel(text.box.y),
                       Nearest(text.box.width * dpi_ / kMmPerInch),
                       Nearest(text.box.height * dpi_ / kMmPerInch)};
  if (text.text.empty() || band.width <= 0 || band.height <= 0) return Status::Ok;
  const double height = std::round(text.lineHeight * dpi_ / kMmPerInch * kSnap) / kSnap;
  std::unique_ptr<TextFont>& font = fonts_[{text.font, height}];
  if (font == nullptr) {
    auto opened = std::make_unique<TextFont>();
    RETURN_IF_BAD(opened->OpenForLine(text.font, height));
    font = std::move(opened);
  }
  return font->DrawIn(image_, band, text.align, font->Fitted(text.text, band.width), text.color);
}

Status RasterPages::Draw(const PageItem& item) {
  if (const auto* const line = std::get_if<LineItem>(&item)) return DrawLineItem(*line);
  if (const auto* const text = std::get_if<TextItem>(&item)) return DrawText(*text);
  if (const auto* const polygon = std::get_if<PolygonItem>(&item))
    return Fill(polygon->corners, polygon->color);
  return Status::Ok;
}

void RasterPages::Draw(const RasterPicture& picture) {
  const Rectangle& area = picture.area;
  if (picture.image.Empty()) return;
  for (int32_t y = 0; y < area.height; ++y) {
    uint8_t* to = image_.Row(area.y + y).data() + static_cast<ptrdiff_t>(area.x) * 3;
    const uint8_t* from = picture.image.Row(y).data();
    if (picture.cover.Empty()) {
      std::memcpy(to, from, static_cast<size_t>(area.width) * 3);
      continue;
    }
    const uint8_t* const cover = picture.cover.Row(y).data();
    for (int32_t x = 0; x < area.width; ++x) {
      for (int part = 0; part < 3; ++part, ++to, ++from) *to = Blend(*to, *from, cover[x]);
    }
  }
}

}  // namespace fotomill
