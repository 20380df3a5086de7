#include "pages/generators/cutout_net.h"

#include <cmath>
#include <numbers>

namespace fotomill {

namespace {

constexpr double kTolerance = 1e-9;

bool Same(Point a, Point b) {
  return std::abs(a.x - b.x) < kTolerance && std::abs(a.y - b.y) < kTolerance;
}

CutoutNet::Face Square(double x, double y, Point up) {
  return {{{x, y}, {x + 1, y}, {x + 1, y + 1}, {x, y + 1}}, up};
}

// The mirror image of a point in the line through two others.
Point Mirrored(Point point, Point from, Point to) {
  const Point along = to - from, out = point - from;
  const double share =
      (out.x * along.x + out.y * along.y) / (along.x * along.x + along.y * along.y);
  return (from + along * share) * 2 - point;
}

}  // namespace

bool CutoutNet::IsFold(size_t face, size_t edge) const {
  const auto ends = [this](size_t f, size_t e) {
    const std::vector<Point>& corners = faces[f].corners;
    return std::pair(corners[e], corners[(e + 1) % corners.size()]);
  };
  const auto [from, to] = ends(face, edge);
  for (size_t f = 0; f < faces.size(); ++f) {
    for (size_t e = 0; f != face && e < faces[f].corners.size(); ++e) {
      const auto [start, end] = ends(f, e);
      if ((Same(from, end) && Same(to, start)) || (Same(from, start) && Same(to, end))) return true;
    }
  }
  return false;
}

CutoutNet CubeNet() {
  constexpr Point kUp{0, -1}, kDown{0, 1};
  constexpr size_t kTop = 0, kBottom = 2, kBack = 3;
  constexpr size_t kTopEdge = 0, kRightEdge = 1, kLeftEdge = 3;
  CutoutNet net;
  net.faces = {Square(1, 0, kUp),   Square(1, 1, kUp), Square(1, 2, kUp),
               Square(1, 3, kDown), Square(0, 1, kUp), Square(2, 1, kUp)};
  net.flaps = {{kTop, kTopEdge},      {kTop, kLeftEdge},  {kTop, kRightEdge}, {kBottom, kLeftEdge},
               {kBottom, kRightEdge}, {kBack, kLeftEdge}, {kBack, kRightEdge}};
  return net;
}

// Petal i is the central pentagon mirrored in its edge i. Its corners begin with that edge, so that
// edges 1 and 4 meet the neighboring petals and edges 2 and 3 the other half.
CutoutNet DodecahedronNet(bool lower) {
  constexpr size_t kSides = 5;
  const double radius = 0.5 / std::sin(std::numbers::pi / kSides);
  std::vector<Point> center;
  for (size_t i = 0; i < kSides; ++i) {
    const double angle =
        -std::numbers::pi / 2 + 2 * std::numbers::pi * static_cast<double>(i) / kSides;
    center.push_back({std::cos(angle) * radius, std::sin(angle) * radius});
  }
  CutoutNet net;
  net.faces.push_back({center, {0, -1}});
  for (size_t i = 0; i < kSides; ++i) {
    const Point from = center[i], to = center[(i + 1) % kSides];
    const auto mirrored = [&](size_t corner) {
      return Mirrored(center[(i + corner) % kSides], from, to);
    };
    CutoutNet::Face petal;
    petal.corners = {to, from, mirrored(4), mirrored(3), mirrored(2)};
    Point out = (from + to) * 0.5;
    out = out * (1 / std::hypot(out.x, out.y));
    petal.up = lower ? out : out * -1;
    net.faces.push_back(petal);
    net.flaps.push_back({i + 1, 4});
    net.flaps.push_back({i + 1, lower ? size_t{3} : size_t{2}});
  }
  return net;
}

}  // namespace fotomill
