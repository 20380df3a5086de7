#include "processing/changed_area.h"

#include <algorithm>
#include <cstring>
#include <utility>

#include "processing/geometry/cut.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// One row of a canvas.
struct CanvasRow {
  const uint8_t *colors, *alpha;
  CanvasRow(const Canvas& canvas, int32_t y)
      : colors(canvas.image.Row(y).data()), alpha(canvas.alpha.Row(y).data()) {}
};

bool Differs(const CanvasRow& a, const CanvasRow& b, int32_t x) {
  if (a.alpha[x] != b.alpha[x]) return true;
  return a.alpha[x] != 0 &&
         std::memcmp(a.colors + 3 * int64_t{x}, b.colors + 3 * int64_t{x}, 3) != 0;
}

bool SameRow(const CanvasRow& a, const CanvasRow& b, int32_t width) {
  const auto count = static_cast<size_t>(width);
  return std::memcmp(a.alpha, b.alpha, count) == 0 &&
         std::memcmp(a.colors, b.colors, 3 * count) == 0;
}

}  // namespace

Rectangle ChangedArea(const Canvas& before, const Canvas& after) {
  const int32_t width = after.image.Width(), height = after.image.Height();
  int32_t left = width, right = -1, top = height, bottom = -1;
  for (int32_t y = 0; y < height; ++y) {
    const CanvasRow a(before, y), b(after, y);
    if (SameRow(a, b, width)) continue;
    int32_t first = 0;
    while (first < width && !Differs(a, b, first)) ++first;
    if (first == width) continue;
    int32_t last = width - 1;
    while (!Differs(a, b, last)) --last;
    left = std::min(left, first);
    right = std::max(right, last);
    top = std::min(top, y);
    bottom = y;
  }
  if (right < 0) return {0, 0, 1, 1};
  return {left, top, right - left + 1, bottom - top + 1};
}

Status CutToChange(PictureRecord& picture, int32_t grid, Canvas& screen, Rectangle& area) {
  RETURN_IF_BAD(PromoteToAlpha(picture));
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  const bool first = screen.image.Empty();
  if (!first && (width != screen.image.Width() || height != screen.image.Height()))
    return Status::UnsuitableImage;
  Canvas frame{std::move(picture.image), std::move(picture.alpha)};
  area = first ? Rectangle{0, 0, width, height} : ChangedArea(screen, frame);
  const int32_t left = area.x % grid, top = area.y % grid;
  area = {area.x - left, area.y - top, area.width + left, area.height + top};
  RETURN_IF_BAD(CutImage(frame.image, area, picture.image));
  RETURN_IF_BAD(CutImage(frame.alpha, area, picture.alpha));
  screen = std::move(frame);
  return Status::Ok;
}

}  // namespace fotomill
