#include "processing/geometry/filter_windows.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace fotomill {

namespace {

double Sinc(double x) {
  if (x == 0) return 1;
  x *= std::numbers::pi;
  return std::sin(x) / x;
}

double Triangle(double x) { return std::max(0.0, 1 - std::abs(x)); }

double Cubic(double x) {
  constexpr double a = -0.5;
  x = std::abs(x);
  if (x < 1) return ((a + 2) * x - (a + 3)) * x * x + 1;
  if (x < 2) return (((x - 5) * x + 8) * x - 4) * a;
  return 0;
}

double Lanczos(double x) { return std::abs(x) < 3 ? Sinc(x) * Sinc(x / 3) : 0; }

double Box(double x) { return x > -0.5 && x <= 0.5 ? 1 : 0; }

double Mitchell(double x) {
  x = std::abs(x);
  if (x < 1) return ((7 * x - 12) * x * x + 16.0 / 3) / 6;
  if (x < 2) return (((-7.0 / 3 * x + 12) * x - 20) * x + 32.0 / 3) / 6;
  return 0;
}

struct FilterShape {
  double (*value)(double);
  double support;  // filter radius in source pixels, unless shrinking
};

constexpr FilterShape ShapeOf(ScaleFilter filter) {
  switch (filter) {
    case ScaleFilter::Bilinear: return {Triangle, 1};
    case ScaleFilter::Bicubic: return {Cubic, 2};
    case ScaleFilter::Box: return {Box, 0.5};
    case ScaleFilter::Mitchell: return {Mitchell, 2};
    default: return {Lanczos, 3};
  }
}

// Positions and weights of the windows, before rounding.
struct Plan {
  FilterShape shape;
  SourceEdge edge;
  double scale;  // source pixels per output pixel
  double widen;  // factor by which the filter is widened

  double Center(int32_t i) const { return edge.begin + (i + 0.5) * scale; }
  int32_t First(int32_t i) const {
    return std::clamp(static_cast<int32_t>(std::floor(Center(i) - shape.support * widen + 0.5)), 0,
                      edge.count - 1);
  }
  int32_t End(int32_t i) const {
    return std::clamp(static_cast<int32_t>(std::floor(Center(i) + shape.support * widen + 0.5)),
                      First(i) + 1, edge.count);
  }
  // The weights of the source pixels in window i, normalized to 1.
  void Shares(int32_t i, double* shares) const {
    const int32_t first = First(i), taps = End(i) - first;
    double sum = 0;
    // For pixels exactly on a box's border, the summation order matters; it is the same as
    // in other libraries.
    for (int32_t t = 0; t < taps; ++t)
      sum += shares[t] = shape.value((t + first - Center(i) + 0.5) * (1 / widen));
    for (int32_t t = 0; t < taps; ++t) shares[t] = sum != 0 ? shares[t] / sum : 1.0 / taps;
  }
};

// Rounds weights so that their sum is exact: rounding errors are carried to the next weight.
void RoundShares(const double* shares, int32_t taps, int32_t shift, int16_t* weights) {
  const double one = std::ldexp(1, shift);
  double sum = 0;
  long given = 0;
  for (int32_t t = 0; t < taps; ++t) {
    sum += shares[t];
    const long upToHere = t + 1 < taps ? std::lround(sum * one) : static_cast<long>(one);
    weights[t] = static_cast<int16_t>(upToHere - given);
    given = upToHere;
  }
}

}  // namespace

Status FilterWindows::Make(const SourceEdge& edge, int32_t count, ScaleFilter filter,
                           int32_t mostShift) {
  const double scale = edge.extent / count;
  const Plan plan{ShapeOf(filter), edge, scale, std::max(1.0, scale)};
  const auto most = std::min(
      static_cast<int32_t>(std::ceil(plan.shape.support * plan.widen)) * 2 + 1, edge.count);
  mostTaps_ = (most + kTapGroup - 1) / kTapGroup * kTapGroup;
  const uint64_t numbers = static_cast<uint64_t>(count) * static_cast<uint64_t>(mostTaps_);
  platform::MemoryBlock shareBlock;
  if (!shareBlock.Allocate(numbers * sizeof(double)) ||
      !weights_.Allocate(numbers * sizeof(int16_t)) ||
      !windows_.Allocate(static_cast<uint64_t>(count) * sizeof(FilterWindow))) {
    return Status::MemoryAllocationError;
  }
  double* shares = shareBlock.Items<double>().data();
  double largest = 0;
  for (int32_t i = 0; i < count; ++i) {
    double* window = shares + static_cast<size_t>(i) * static_cast<size_t>(mostTaps_);
    plan.Shares(i, window);
    for (int32_t t = 0; t < mostTaps_; ++t) largest = std::max(largest, std::abs(window[t]));
  }
  shift_ = mostShift;
  while (shift_ > 1 && std::ldexp(largest, shift_) > INT16_MAX - 1) --shift_;

  // The two halves of an edge get exactly mirrored windows. The box filter is asymmetric: of two
  // pixels on its borders it uses the left one.
  const bool mirrored = filter != ScaleFilter::Box && 2 * edge.begin + edge.extent == edge.count;
  for (int32_t i = 0; i < count; ++i) {
    const size_t place = static_cast<size_t>(i) * static_cast<size_t>(mostTaps_);
    int16_t* weights = weights_.Items<int16_t>().data() + place;
    FilterWindow& window = windows_.Items<FilterWindow>()[static_cast<size_t>(i)];
    const int32_t twin = count - 1 - i;
    const bool isMirror = mirrored && twin < i;
    const int32_t source = isMirror ? twin : i;
    const int32_t taps = plan.End(source) - plan.First(source);
    RoundShares(shares + static_cast<size_t>(source) * static_cast<size_t>(mostTaps_), taps, shift_,
                weights);
    if (isMirror) std::reverse(weights, weights + taps);
    window.first = isMirror ? edge.count - plan.End(source) : plan.First(source);
    window.taps = (taps + kTapGroup - 1) / kTapGroup * kTapGroup;
    window.weights = weights;
  }
  return Status::Ok;
}

}  // namespace fotomill
