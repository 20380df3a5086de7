#include "processing/filters/motion_blur.h"

#include <algorithm>
#include <cmath>
#include <map>
#include <numbers>
#include <utility>
#include <vector>

#include "processing/padded_rows.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 32;
constexpr uint32_t kWhole = 65536;  // sum of the weights

struct Tap {
  int32_t dx, dy;
  uint32_t weight;
};

// The pixels covered by the points of a line, with their weights.
std::vector<Tap> TapsOf(double length, double angle) {
  const double turn = angle * std::numbers::pi / 180;
  const auto points = std::max<int32_t>(1, static_cast<int32_t>(std::lround(length)));
  std::map<std::pair<int32_t, int32_t>, double> weights;
  // Rounded to 1 / 4096 of a pixel, so that rounding errors do not matter.
  const auto place = [&](double way) { return std::floor(way * 4096 + 0.5) / 4096; };
  for (int32_t i = 0; i < points; ++i) {
    const double way = i - (points - 1) / 2.0;
    const double x = place(way * std::cos(turn)), y = place(way * std::sin(turn));
    const double left = std::floor(x), top = std::floor(y), right = x - left, below = y - top;
    const auto column = static_cast<int32_t>(left), row = static_cast<int32_t>(top);
    weights[{row, column}] += (1 - right) * (1 - below);
    weights[{row, column + 1}] += right * (1 - below);
    weights[{row + 1, column}] += (1 - right) * below;
    weights[{row + 1, column + 1}] += right * below;
  }
  std::vector<Tap> taps;
  double sum = 0;
  uint32_t given = 0;
  for (const auto& [where, weight] : weights) {
    sum += weight;
    const auto upTo = static_cast<uint32_t>(std::floor(sum / points * kWhole + 0.5));
    if (upTo > given) taps.push_back({where.second, where.first, upTo - given});
    given = upTo;
  }
  return taps;
}

// Row sums: blue, green, red, or each times alpha, and alpha.
struct MotionBand {
  PaddedRows colors, alpha;
  std::vector<uint32_t> sums;

  void Add(const Tap& tap, int32_t y, bool hasAlpha, size_t width) {
    const uint8_t* bgr = colors.Row(y + tap.dy) + static_cast<std::ptrdiff_t>(3) * tap.dx;
    if (!hasAlpha) {
      for (size_t i = 0; i < 3 * width; ++i) sums[i] += tap.weight * bgr[i];
      return;
    }
    const uint8_t* opacity = alpha.Row(y + tap.dy) + tap.dx;
    for (size_t x = 0; x < width; ++x) {
      const uint32_t weight = tap.weight * opacity[x];
      for (size_t c = 0; c < 3; ++c) sums[4 * x + c] += weight * bgr[3 * x + c];
      sums[4 * x + 3] += weight;
    }
  }
};

uint8_t Rounded(uint32_t sum) { return static_cast<uint8_t>((sum + kWhole / 2) / kWhole); }

void PutAlphaPixel(const uint64_t (&sums)[4], uint64_t whole, uint8_t* bgr, uint8_t& opacity) {
  for (int c = 0; c < 3; ++c)
    bgr[c] = sums[3] == 0 ? uint8_t{0} : static_cast<uint8_t>((sums[c] + sums[3] / 2) / sums[3]);
  opacity = static_cast<uint8_t>((sums[3] + whole / 2) / whole);
}

// Rotation or scaling for a point of a radial blur, relative to the center: x' = c x - s y, y' = s
// x + c y.
struct Turned {
  double c, s;
};
constexpr int32_t kMostPoints = 64;
constexpr size_t kFewPoints = 8;  // up to this many are interpolated, as each one shows
using Points = std::vector<std::vector<Turned>>;  // indexed by the number of points

Points PointsOf(RadialKind kind, double amount) {
  Points points(kMostPoints + 1);
  for (int32_t count = 1; count <= kMostPoints; ++count) {
    for (int32_t i = 0; i < count; ++i) {
      const double share = (i + 0.5) / count - 0.5;
      const double turn = amount * share * std::numbers::pi / 180;
      // Rounded to 2^-24, so that results are the same on every machine.
      const auto exact = [](double v) { return std::floor(v * 16777216 + 0.5) / 16777216; };
      points[static_cast<size_t>(count)].push_back(
          kind == RadialKind::Spin ? Turned{exact(std::cos(turn)), exact(std::sin(turn))}
                                   : Turned{1 + amount / 100 * share, 0});
    }
  }
  return points;
}

struct Radial {
  const PackedImage& image;
  const PackedImage* alpha;
  const Points& points;
  double perPixel, centerX, centerY;  // points per pixel of distance

  // Adds the four pixels around a position, weighted in 1 / 256.
  void Add(double x, double y, uint64_t (&sums)[4]) const {
    const int32_t right = image.Width() - 1, bottom = image.Height() - 1;
    const auto fixedX = static_cast<int64_t>(
        std::floor(std::clamp(x, 0.0, static_cast<double>(right)) * 256 + 0.5));
    const auto fixedY = static_cast<int64_t>(
        std::floor(std::clamp(y, 0.0, static_cast<double>(bottom)) * 256 + 0.5));
    const auto partX = static_cast<uint32_t>(fixedX & 255),
               partY = static_cast<uint32_t>(fixedY & 255);
    const int32_t column = static_cast<int32_t>(fixedX >> 8),
                  row = static_cast<int32_t>(fixedY >> 8);
    const auto pixel = [&](int32_t i, int32_t j, uint32_t weight) {
      const auto at = static_cast<size_t>(std::min(i, right));
      const uint8_t* bgr = image.Row(std::min(j, bottom)).data() + 3 * at;
      if (alpha != nullptr) weight *= alpha->Row(std::min(j, bottom))[at];
      for (int c = 0; c < 3; ++c) sums[c] += weight * bgr[c];
      sums[3] += weight;
    };
    pixel(column, row, (256 - partX) * (256 - partY));
    pixel(column + 1, row, partX * (256 - partY));
    pixel(column, row + 1, (256 - partX) * partY);
    pixel(column + 1, row + 1, partX * partY);
  }

  // Adds the pixel nearest to a position.
  void AddNearest(double x, double y, uint64_t (&sums)[4]) const {
    const int32_t right = image.Width() - 1, bottom = image.Height() - 1;
    const auto column = static_cast<size_t>(std::clamp(x, 0.0, static_cast<double>(right)) + 0.5);
    const auto row = static_cast<int32_t>(std::clamp(y, 0.0, static_cast<double>(bottom)) + 0.5);
    const uint8_t* bgr = image.Row(row).data() + 3 * column;
    const uint64_t weight = alpha == nullptr ? 65536 : uint64_t{65536} * alpha->Row(row)[column];
    for (int c = 0; c < 3; ++c) sums[c] += weight * bgr[c];
    sums[3] += weight;
  }

  void Row(int32_t y, uint8_t* bgr, uint8_t* opacity) const {
    const double dy = y - centerY;
    for (int32_t x = 0; x < image.Width(); ++x, bgr += 3) {
      const double dx = x - centerX, distance = std::sqrt(dx * dx + dy * dy);
      const auto count = static_cast<size_t>(
          std::clamp(std::ceil(distance * perPixel), 1.0, static_cast<double>(kMostPoints)));
      uint64_t sums[4] = {};
      for (const Turned& point : points[count]) {
        const double fromX = centerX + point.c * dx - point.s * dy,
                     fromY = centerY + point.s * dx + point.c * dy;
        if (count <= kFewPoints) {
          Add(fromX, fromY, sums);
        } else {
          AddNearest(fromX, fromY, sums);
        }
      }
      uint8_t seen = 255;
      PutAlphaPixel(sums, 65536 * uint64_t{count}, bgr, opacity != nullptr ? opacity[x] : seen);
    }
  }
};

// Creates the result images of a blur, has `band` fill their rows, and stores them in the picture.
template <typename Band>
Status Replace(PictureRecord& picture, int32_t leastRows, const Work& work, Band band) {
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  if (!picture.alpha.Empty()) RETURN_IF_BAD(NewAlphaPlane(width, height, alpha));
  RETURN_IF_BAD(ForBands(height, leastRows, work, [&](int32_t first, int32_t end) { return band(first, end, image, alpha); }));
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

}  // namespace

int32_t MotionReach(double length) { return static_cast<int32_t>(std::ceil(length / 2)) + 1; }

Status MotionBlurPicture(PictureRecord& picture, double length, double angle, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const std::vector<Tap> taps = TapsOf(length, angle);
  const bool hasAlpha = !picture.alpha.Empty();
  const auto width = static_cast<size_t>(picture.image.Width());
  const int32_t reach = MotionReach(length);
  return Replace(picture, std::max(kLeastRows, 2 * reach), work,
                 [&](int32_t first, int32_t end, PackedImage& image, PackedImage& alpha) {
                   MotionBand band;
                   RETURN_IF_BAD(band.colors.Open(picture.image, reach));
                   if (hasAlpha) RETURN_IF_BAD(band.alpha.Open(picture.alpha, reach));
                   for (int32_t y = first; y < end; ++y) {
                     band.sums.assign((hasAlpha ? 4 : 3) * width, 0);
                     for (const Tap& tap : taps) band.Add(tap, y, hasAlpha, width);
                     uint8_t* bgr = image.Row(y).data();
                     if (!hasAlpha) {
                       std::ranges::transform(band.sums, bgr, Rounded);
                       continue;
                     }
                     uint8_t* opacity = alpha.Row(y).data();
                     for (size_t x = 0; x < width; ++x) {
                       const uint32_t* sum = band.sums.data() + 4 * x;
                       PutAlphaPixel({sum[0], sum[1], sum[2], sum[3]}, kWhole, bgr + 3 * x,
                                     opacity[x]);
                     }
                   }
                   return Status::Ok;
                 });
}

Status RadialBlurPicture(PictureRecord& picture, RadialKind kind, double amount, double centerX,
                         double centerY, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const Points points = PointsOf(kind, amount);
  const double perPixel =
      std::abs(amount) * (kind == RadialKind::Spin ? std::numbers::pi / 180 : 0.01);
  const Radial radial{picture.image, picture.alpha.Empty() ? nullptr : &picture.alpha,
                      points,        perPixel,
                      centerX - 0.5, centerY - 0.5};
  return Replace(picture, kLeastRows, work,
                 [&](int32_t first, int32_t end, PackedImage& image, PackedImage& alpha) {
                   for (int32_t y = first; y < end; ++y) {
                     radial.Row(y, image.Row(y).data(),
                                alpha.Empty() ? nullptr : alpha.Row(y).data());
                   }
                   return Status::Ok;
                 });
}

}  // namespace fotomill
