#include <algorithm>
#include <cmath>
#include <iterator>
#include <span>

#include "catalog/thumbnails/thumbnail_drawing.h"

namespace fotomill {

namespace {

struct Point {
  float x, y;  // pixels from the left and top
};

// An outline filled with a color. Two points are a circle: its center, and a point on it.
struct Shape {
  uint32_t color;  // 0x00RRGGBB
  std::span<const Point> outline;
};

// A photograph: frame, sky, sun, two hills.
constexpr Point kFrameEdge[] = {{11, 19}, {85, 19}, {85, 77}, {11, 77}},
                kFrame[] = {{12, 20}, {84, 20}, {84, 76}, {12, 76}},
                kSky[] = {{17, 25}, {79, 25}, {79, 71}, {17, 71}}, kSun[] = {{63, 37}, {69, 37}},
                kFarHill[] = {{17, 71}, {17, 60}, {36, 40}, {64, 71}},
                kNearHill[] = {{32, 71}, {56, 49}, {79, 69}, {79, 71}};
constexpr Shape kPhotograph[] = {{0x969696, kFrameEdge}, {0xFAFAFA, kFrame},   {0xBCD7EA, kSky},
                                 {0xF6D873, kSun},       {0x86AB86, kFarHill}, {0x5D8761, kNearHill}};

// A crossed-out sheet of paper with a folded corner.
constexpr Point kSheetEdge[] = {{21, 9}, {61.5F, 9}, {76, 23.5F}, {76, 87}, {21, 87}},
                kSheet[] = {{22, 10}, {61, 10}, {75, 24}, {75, 86}, {22, 86}},
                kCorner[] = {{61, 10}, {75, 24}, {61, 24}},
                kStroke[] = {{36, 44}, {40, 40}, {62, 62}, {58, 66}},
                kCounterStroke[] = {{58, 40}, {62, 44}, {40, 66}, {36, 62}};
constexpr Shape kCrossedSheet[] = {
    {0x969696, kSheetEdge}, {0xFAFAFA, kSheet}, {0xC8C8C8, kCorner}, {0xC0504D, kStroke}, {0xC0504D, kCounterStroke}};

bool IsInside(std::span<const Point> outline, Point point) {
  if (outline.size() == 2) {
    return std::hypot(point.x - outline[0].x, point.y - outline[0].y) <=
           std::hypot(outline[1].x - outline[0].x, outline[1].y - outline[0].y);
  }
  bool inside = false;
  for (size_t i = 0, last = outline.size() - 1; i < outline.size(); last = i++) {
    const Point &a = outline[i], &b = outline[last];
    const bool crosses = (a.y > point.y) != (b.y > point.y) &&
                         point.x < (b.x - a.x) * (point.y - a.y) / (b.y - a.y) + a.x;
    inside = inside != crosses;
  }
  return inside;
}

// How many of the 16 samples of a pixel are inside.
int32_t Coverage(std::span<const Point> outline, int32_t x, int32_t y) {
  int32_t count = 0;
  for (int32_t i = 0; i < 16; ++i) {
    const Point sample{static_cast<float>(x) + (static_cast<float>(i % 4) + 0.5F) / 4,
                       static_cast<float>(y) + (static_cast<float>(i / 4) + 0.5F) / 4};
    count += IsInside(outline, sample);
  }
  return count;
}

void Paint(ThumbnailRecord& record, const Shape& shape) {
  for (int32_t y = 0; y < kSmallThumbnailSide; ++y) {
    uint8_t* pixel = record.StoredRow(kSmallThumbnailSide - 1 - y).data();
    for (int32_t x = 0; x < kSmallThumbnailSide; ++x, pixel += 3) {
      const int32_t covered = Coverage(shape.outline, x, y);
      for (int32_t i = 0; i < 3; ++i) {
        const auto value = static_cast<int32_t>(shape.color >> (8 * i) & 0xff);
        pixel[i] = static_cast<uint8_t>((pixel[i] * (16 - covered) + value * covered + 8) / 16);
      }
    }
  }
}

}  // namespace

bool MakePlaceholderRecord(ThumbnailRecord& record, int32_t which, Color matte) {
  if (which != kPlaceholderNotMade && which != kPlaceholderUnreadable) return false;
  record = ThumbnailRecord();
  record.Sign();
  record.Fill(matte);
  const std::span<const Shape> shapes =
      which == kPlaceholderNotMade ? std::span<const Shape>(kPhotograph) : kCrossedSheet;
  for (const Shape& shape : shapes) Paint(record, shape);
  return true;
}

}  // namespace fotomill
