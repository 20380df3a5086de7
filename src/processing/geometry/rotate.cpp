#include "processing/geometry/rotate.h"

#include <algorithm>
#include <cmath>
#include <numbers>

#include "processing/geometry/orient.h"

namespace fotomill {

namespace {

constexpr double kRadians = std::numbers::pi / 180;
constexpr double kHair = 1e-7;  // tolerance for rounding errors, in pixels

// Clamped far above the limit, so that the size check fails.
int32_t RoundedUp(double length) {
  return static_cast<int32_t>(std::clamp(std::ceil(length - kHair), 1.0, 2e9));
}

Status TurnQuarters(PictureRecord& picture, int32_t quarters, bool grow, const Backdrop& backdrop) {
  constexpr Orientation kQuarters[] = {Orientation::Upright, Orientation::QuarterRight,
                                       Orientation::HalfTurn, Orientation::QuarterLeft};
  const Size before{picture.image.Width(), picture.image.Height()};
  RETURN_IF_BAD(OrientPicture(picture, kQuarters[quarters]));
  if (grow || quarters % 2 == 0) return Status::Ok;
  const int32_t room = before.width - before.height;
  return PlaceOnCanvas(picture, before, room >= 0 ? room / 2 : (room - 1) / 2,
                       room <= 0 ? -room / 2 : (-room - 1) / 2, backdrop);
}

}  // namespace

Status RotatePicture(PictureRecord& picture, double angle, bool grow, const WarpOptions& options,
                     const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const double within = std::fmod(std::fmod(angle, 360) + 360, 360);
  if (std::fmod(within, 90) == 0)
    return TurnQuarters(picture, static_cast<int32_t>(within / 90) % 4, grow, options.backdrop);
  const Size from{picture.image.Width(), picture.image.Height()};
  const double sine = std::sin(angle * kRadians), cosine = std::cos(angle * kRadians);
  Size to = from;
  if (grow) {
    to = {RoundedUp(std::abs(from.width * cosine) + std::abs(from.height * sine)),
          RoundedUp(std::abs(from.width * sine) + std::abs(from.height * cosine))};
  }
  return WarpPicture(picture, to, options,
                     LinearPlaces(MapAboutCenter(from, to, cosine, sine, -sine, cosine)), work);
}

Size StraightenedSize(Size picture, double angle) {
  const double sine = std::abs(std::sin(angle * kRadians)),
               cosine = std::abs(std::cos(angle * kRadians));
  const double width = picture.width, height = picture.height;
  const double shorter = std::min(width, height), longer = std::max(width, height);
  double across = width, down = height;
  if (shorter <= 2 * sine * cosine * longer || std::abs(sine - cosine) < 1e-9) {
    // Two corners touch the longer edges, the other two are inside.
    across = shorter / 2 / (width >= height ? sine : cosine);
    down = shorter / 2 / (width >= height ? cosine : sine);
  } else {
    const double both = cosine * cosine - sine * sine;
    across = (width * cosine - height * sine) / both;
    down = (height * cosine - width * sine) / both;
  }
  const auto whole = [](double length, int32_t most) {
    return std::clamp(static_cast<int32_t>(std::floor(length + kHair)), 1, most);
  };
  const int32_t most = static_cast<int32_t>(std::ceil(longer));
  return {whole(across, most), whole(down, most)};
}

Status StraightenPicture(PictureRecord& picture, double angle, WarpFilter filter,
                         const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  if (angle == 0) return Status::Ok;
  const Size from{picture.image.Width(), picture.image.Height()},
      to = StraightenedSize(from, angle);
  const double sine = std::sin(angle * kRadians), cosine = std::cos(angle * kRadians);
  return WarpPicture(picture, to, {.filter = filter, .edgesRepeat = true},
                     LinearPlaces(MapAboutCenter(from, to, cosine, sine, -sine, cosine)), work);
}

Status ShearPicture(PictureRecord& picture, double across, double down, const WarpOptions& options,
                    const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  if (across == 0 && down == 0) return Status::Ok;
  // x' = x + a y, y' = y + b x'; the determinant is 1.
  const double a = std::tan(across * kRadians), b = std::tan(down * kRadians);
  const Size from{picture.image.Width(), picture.image.Height()};
  const double width = from.width + std::abs(a) * from.height;
  const double height = std::max(std::abs(b * from.width + (1 + a * b) * from.height),
                                 std::abs(b * from.width - (1 + a * b) * from.height));
  const Size to{RoundedUp(width), RoundedUp(height)};
  return WarpPicture(picture, to, options,
                     LinearPlaces(MapAboutCenter(from, to, 1 + a * b, -a, -b, 1)), work);
}

Status UnwarpPicture(PictureRecord& picture, const Corner (&corners)[4], Size size,
                     const WarpOptions& options, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  for (size_t i = 0; i < 4; ++i) {
    const Corner &a = corners[i], &b = corners[(i + 1) % 4], &c = corners[(i + 2) % 4];
    if ((b.x - a.x) * (c.y - b.y) - (b.y - a.y) * (c.x - b.x) <= kHair) return Status::EmptyImage;
  }
  const auto edge = [&](size_t i, size_t j) {
    return std::hypot(corners[i].x - corners[j].x, corners[i].y - corners[j].y);
  };
  const auto whole = [](double length) {
    return static_cast<int32_t>(std::clamp(std::floor(length + 0.5), 1.0, 2e9));
  };
  if (size.width <= 0) size.width = whole(std::max(edge(0, 1), edge(3, 2)));
  if (size.height <= 0) size.height = whole(std::max(edge(0, 3), edge(1, 2)));
  // Maps from the unit square: x = (a u + b v + c) / (g u + h v + 1), y likewise with d, e, f.
  const Corner &p0 = corners[0], &p1 = corners[1], &p2 = corners[2], &p3 = corners[3];
  const double sumX = p0.x - p1.x + p2.x - p3.x, sumY = p0.y - p1.y + p2.y - p3.y;
  const double dx1 = p1.x - p2.x, dy1 = p1.y - p2.y, dx2 = p3.x - p2.x, dy2 = p3.y - p2.y;
  const double det = dx1 * dy2 - dx2 * dy1;
  const double g = (sumX * dy2 - dx2 * sumY) / det, h = (dx1 * sumY - sumX * dy1) / det;
  const double a = p1.x - p0.x + g * p1.x, b = p3.x - p0.x + h * p3.x, d = p1.y - p0.y + g * p1.y,
               e = p3.y - p0.y + h * p3.y;
  const Corner origin = p0;
  return WarpPicture(picture, size, options,
                     [=](int32_t left, int32_t y, std::span<SourcePlace> places) {
                       const double v = (y + 0.5) / size.height;
                       for (SourcePlace& place : places) {
                         const double u = (left++ + 0.5) / size.width,
                                      scale = 1 / (g * u + h * v + 1);
                         place = PlaceAt((a * u + b * v + origin.x) * scale - 0.5,
                                         (d * u + e * v + origin.y) * scale - 0.5);
                       }
                     },
                     work);
}

}  // namespace fotomill
