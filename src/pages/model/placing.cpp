#include "pages/model/placing.h"

#include <algorithm>

namespace fotomill {

Box FittedBox(double width, double height, const Box& box, PictureFit fit) {
  if (fit == PictureFit::Stretch || width <= 0 || height <= 0) return box;
  const double across = box.width / width, down = box.height / height;
  const double scale = fit == PictureFit::Inside ? std::min(across, down) : std::max(across, down);
  const double fittedWidth = width * scale, fittedHeight = height * scale;
  return {box.x + (box.width - fittedWidth) / 2, box.y + (box.height - fittedHeight) / 2,
          fittedWidth, fittedHeight};
}

bool NeedsTurn(double width, double height, const Box& box) {
  return (width > height && box.width < box.height) || (width < height && box.width > box.height);
}

PictureItem PlacePicture(const PagePicture& picture, const Box& box, PictureFit fit, bool turn) {
  const bool turned = turn && NeedsTurn(picture.width, picture.height, box);
  const double width = turned ? picture.height : picture.width,
               height = turned ? picture.width : picture.height;
  const Box area = FittedBox(width, height, box, fit);
  PictureItem item{.picture = picture.id,
                   .corner = {area.x, area.y},
                   .across = {area.width, 0},
                   .down = {0, area.height}};
  if (turned) {
    item.corner = {area.Right(), area.y};
    item.across = {0, area.height};
    item.down = {-area.width, 0};
  }
  if (fit == PictureFit::Cover) item.clip = CornersOf(box);
  return item;
}

std::vector<Point> CornersOf(const Box& box) {
  return {{box.x, box.y}, {box.Right(), box.y}, {box.Right(), box.Bottom()}, {box.x, box.Bottom()}};
}

Box BoundsOf(const std::vector<Point>& points) {
  Point least = points[0], most = points[0];
  for (const Point& point : points) {
    least = {std::min(least.x, point.x), std::min(least.y, point.y)};
    most = {std::max(most.x, point.x), std::max(most.y, point.y)};
  }
  return {least.x, least.y, most.x - least.x, most.y - least.y};
}

std::vector<Point> CornersOf(const PictureItem& item) {
  return {item.corner, item.corner + item.across, item.corner + item.across + item.down,
          item.corner + item.down};
}

// Luma as in Recommendation ITU-R BT.709.
bool IsDark(Color color) {
  const double luma =
      0.2126 * (color & 255) + 0.7152 * (color >> 8 & 255) + 0.0722 * (color >> 16 & 255);
  return luma < 128;
}

PolygonItem FilledBox(const Box& box, Color color) {
  return {.corners = CornersOf(box), .color = color};
}

void AddOutline(const Box& box, double lineWidth, Color color, double dash,
                std::vector<PageItem>& items) {
  const std::vector<Point> corners = CornersOf(box);
  for (size_t i = 0; i < corners.size(); ++i) {
    items.emplace_back(LineItem{.from = corners[i],
                                .to = corners[(i + 1) % corners.size()],
                                .width = lineWidth,
                                .color = color,
                                .dash = dash});
  }
}

void AddCropMarks(const Box& box, double gap, double length, double lineWidth, Color color,
                  std::vector<PageItem>& items) {
  for (const double x : {box.x, box.Right()}) {
    for (const double y : {box.y, box.Bottom()}) {
      const double right = x == box.x ? -1 : 1, down = y == box.y ? -1 : 1;
      items.emplace_back(LineItem{.from = {x + right * gap, y},
                                  .to = {x + right * (gap + length), y},
                                  .width = lineWidth,
                                  .color = color});
      items.emplace_back(LineItem{.from = {x, y + down * gap},
                                  .to = {x, y + down * (gap + length)},
                                  .width = lineWidth,
                                  .color = color});
    }
  }
}

}  // namespace fotomill
