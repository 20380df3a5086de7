#include "pages/generators/cutout.h"

#include <algorithm>
#include <cmath>

#include "pages/model/placing.h"

namespace fotomill {

namespace {

constexpr double kFlapShare = 0.2, kMostFlap = 10;  // of an edge; millimeters
constexpr double kLine = 0.2, kDash = 1.5;
constexpr double kNoteHeight = 3.5, kNoteGap = 3;
constexpr double kMostEdge = 1000;

std::vector<Point> FaceCorners(const CutoutNet::Face& face, double edge, Point shift) {
  std::vector<Point> corners;
  for (const Point& corner : face.corners) corners.push_back(corner * edge + shift);
  return corners;
}

Point CenterOf(const std::vector<Point>& corners) {
  Point sum;
  for (const Point& corner : corners) sum = sum + corner;
  return sum * (1.0 / static_cast<double>(corners.size()));
}

// A flap: from the ends of an edge outward, narrower at its far side.
std::vector<Point> FlapCorners(const std::vector<Point>& corners, size_t edge) {
  const Point from = corners[edge], to = corners[(edge + 1) % corners.size()];
  const Point along = to - from;
  const double length = std::hypot(along.x, along.y);
  const Point unit = along * (1 / length);
  Point out{-unit.y, unit.x};
  const Point inward = CenterOf(corners) - from;
  if (out.x * inward.x + out.y * inward.y > 0) out = out * -1;
  const double depth = std::min(length * kFlapShare, kMostFlap);
  return {from, from + (out + unit) * depth, to + (out - unit) * depth, to};
}

Box BoundsOf(const CutoutNet& net, double edge) {
  std::vector<Point> points;
  for (const CutoutNet::Face& face : net.faces) {
    const std::vector<Point> corners = FaceCorners(face, edge, {});
    points.insert(points.end(), corners.begin(), corners.end());
  }
  for (const CutoutNet::Flap& flap : net.flaps) {
    const auto corners = FlapCorners(FaceCorners(net.faces[flap.face], edge, {}), flap.edge);
    points.insert(points.end(), corners.begin(), corners.end());
  }
  return fotomill::BoundsOf(points);
}

Box RoomOf(const CutoutOptions& options) {
  const double note = options.note.empty() ? 0 : kNoteHeight + kNoteGap;
  return {options.margin, options.margin, options.paper.width - 2 * options.margin,
          options.paper.height - 2 * options.margin - note};
}

bool Fits(const CutoutOptions& options, const CutoutNet& net, double edge) {
  const Box bounds = BoundsOf(net, edge), room = RoomOf(options);
  return bounds.width <= room.width + 1e-6 && bounds.height <= room.height + 1e-6;
}

// A picture that covers a face, upright in the face's own direction.
PictureItem FacePicture(const PagePicture& picture, const std::vector<Point>& corners, Point up) {
  const Point right{-up.y, up.x}, down = up * -1;
  std::vector<Point> turned;
  for (const Point& corner : corners) {
    turned.push_back(
        {corner.x * right.x + corner.y * right.y, corner.x * down.x + corner.y * down.y});
  }
  const Box box =
      FittedBox(picture.width, picture.height, fotomill::BoundsOf(turned), PictureFit::Cover);
  return {.picture = picture.id,
          .corner = right * box.x + down * box.y,
          .across = right * box.width,
          .down = down * box.height,
          .clip = corners};
}

Page NetPage(const CutoutOptions& options, const CutoutNet& net, double edge,
             std::span<const PagePicture> pictures, size_t first) {
  Page page{.width = options.paper.width, .height = options.paper.height};
  const Box bounds = BoundsOf(net, edge), room = RoomOf(options);
  const Point shift{room.x + (room.width - bounds.width) / 2 - bounds.x,
                    room.y + (room.height - bounds.height) / 2 - bounds.y};
  std::vector<PageItem>& items = page.items;
  const auto line = [&](Point from, Point to, bool fold) {
    items.emplace_back(LineItem{.from = from,
                                .to = to,
                                .width = kLine,
                                .color = options.foreground,
                                .dash = fold && options.dashed ? kDash : 0});
  };
  std::vector<std::vector<Point>> faces;
  for (size_t i = 0; i < net.faces.size(); ++i) {
    faces.push_back(FaceCorners(net.faces[i], edge, shift));
    items.emplace_back(PolygonItem{.corners = faces[i], .color = options.background});
    items.emplace_back(
        FacePicture(pictures[(first + i) % pictures.size()], faces[i], net.faces[i].up));
  }
  for (size_t i = 0; i < faces.size(); ++i) {
    for (size_t side = 0; side < faces[i].size(); ++side) {
      const auto flap = std::ranges::find_if(
          net.flaps, [&](const CutoutNet::Flap& f) { return f.face == i && f.edge == side; });
      const bool glued = flap != net.flaps.end();
      line(faces[i][side], faces[i][(side + 1) % faces[i].size()], glued || net.IsFold(i, side));
      if (!glued) continue;
      const std::vector<Point> corners = FlapCorners(faces[i], side);
      for (size_t k = 0; k + 1 < corners.size(); ++k) line(corners[k], corners[k + 1], false);
    }
  }
  if (!options.note.empty()) {
    items.emplace_back(
        TextItem{.text = options.note,
                 .box = {room.x, room.Bottom() + kNoteGap, room.width, kNoteHeight * 1.2},
                 .font = options.font,
                 .lineHeight = kNoteHeight,
                 .color = 0x808080});
  }
  return page;
}

}  // namespace

double LargestEdge(const CutoutOptions& options, std::span<const CutoutNet> nets) {
  double fits = 0, most = kMostEdge;
  for (int step = 0; step < 50; ++step) {
    const double middle = (fits + most) / 2;
    const bool all =
        std::ranges::all_of(nets, [&](const CutoutNet& net) { return Fits(options, net, middle); });
    (all ? fits : most) = middle;
  }
  return fits;
}

std::vector<Page> CutoutPages(const CutoutOptions& options, std::span<const CutoutNet> nets,
                              std::span<const PagePicture> pictures) {
  const double largest = LargestEdge(options, nets);
  const double edge = options.edge > 0 ? options.edge : largest;
  if (edge <= 0 || edge > largest + 1e-3 || pictures.empty()) return {};
  std::vector<Page> pages;
  size_t first = 0;
  for (const CutoutNet& net : nets) {
    pages.push_back(NetPage(options, net, edge, pictures, first));
    first += net.faces.size();
  }
  return pages;
}

}  // namespace fotomill
