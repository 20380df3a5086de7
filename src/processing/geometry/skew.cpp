#include "processing/geometry/skew.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <numbers>
#include <vector>

#include "processing/geometry/scale.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kSide = 1500;         // longest edge of the picture to analyze
// minimum difference in levels to the pixel below for an edge
constexpr int32_t kLeastContrast = 24;
// degrees: each search covers two steps of the previous one on either side
constexpr double kSteps[] = {0.5, 0.1, 0.02};

struct Dot {
  int32_t x, y;
};

int32_t LumaOf(const uint8_t* bgr) {
  return (114 * bgr[0] + 587 * bgr[1] + 299 * bgr[2] + 500) / 1000;
}

Status FindEdges(const PackedImage& image, std::vector<Dot>& dots) {
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(image));
  std::vector<int32_t> above(static_cast<size_t>(image.Width()));
  for (int32_t y = 0; y < image.Height(); ++y) {
    const uint8_t* bgr = rows.Row(y);
    for (int32_t x = 0; x < image.Width(); ++x, bgr += 3) {
      int32_t& last = above[static_cast<size_t>(x)];
      const int32_t luma = LumaOf(bgr);
      // Only dark-to-light transitions: the lower edges of letters, most of which are
      // on the baseline.
      if (y > 0 && luma - last >= kLeastContrast) dots.push_back({x, y});
      last = luma;
    }
  }
  return Status::Ok;
}

uint64_t Score(const std::vector<Dot>& dots, double degrees, std::vector<uint32_t>& counts,
               int32_t width) {
  const double slope = std::tan(degrees * std::numbers::pi / 180);
  std::ranges::fill(counts, 0u);
  // In 1 / 65536 of a row, so that results are the same on every machine.
  const auto step = static_cast<int64_t>(std::lround(slope * 65536));
  const int64_t start = (static_cast<int64_t>(width) << 16) + 32768;
  for (const Dot& dot : dots) {
    const int64_t row = (start + (static_cast<int64_t>(dot.y) << 16) - step * dot.x) >> 16;
    if (row >= 0 && row < static_cast<int64_t>(counts.size())) ++counts[static_cast<size_t>(row)];
  }
  uint64_t sum = 0;
  for (const uint64_t count : counts) sum += count * count;
  return sum;
}

}  // namespace

Status FindSkew(const PictureRecord& picture, double most, const Work& work, double& angle) {
  angle = 0;
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage small, none;
  const PackedImage* page = &picture.image;
  if (std::max(width, height) > kSide) {
    ScaleOptions options{.filter = ScaleFilter::Bilinear, .work = work};
    const Reach all{static_cast<double>(width), static_cast<double>(height)};
    RETURN_IF_BAD(ScaleFiltered(picture.image, {}, all, FitSize(width, height, kSide), options, small, none));
    page = &small;
  }
  std::vector<Dot> dots;
  RETURN_IF_BAD(FindEdges(*page, dots));
  if (dots.empty()) return Status::Ok;
  std::vector<uint32_t> counts(static_cast<size_t>(page->Height()) +
                               2 * static_cast<size_t>(page->Width()) + 2);
  double best = 0, range = most;
  uint64_t bestScore = Score(dots, 0, counts, page->Width());
  for (const double step : kSteps) {
    const double middle = best;
    const auto count = static_cast<int32_t>(range / step);
    for (int32_t i = -count; i <= count; ++i) {
      if (!work.GoesOn()) return Status::FunctionCancelled;
      const double tried = middle + i * step;
      if (std::abs(tried) > most) continue;
      const uint64_t score = Score(dots, tried, counts, page->Width());
      if (score <= bestScore) continue;
      bestScore = score;
      best = tried;
    }
    range = 2 * step;
  }
  angle = best;
  return Status::Ok;
}

}  // namespace fotomill
