#include "processing/palette/fit_palette.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numeric>
#include <span>

namespace fotomill {

namespace {

using Point = std::array<double, 3>;

constexpr int kMostRounds = 12;          // of Lloyd's algorithm
constexpr double kWorthAnother = 0.002;  // minimum relative error reduction for another round

// A range of bins with its mean, and its principal axis.
struct Group {
  size_t begin, end;
  Point mean;
  Point axis;
  double spread;  // squared error along the axis
};

// The principal axis of a symmetric matrix and its eigenvalue, by power iteration.
double LongestAxis(const double (&matrix)[3][3], Point& axis) {
  int widest = 0;
  for (int i = 1; i < 3; ++i) {
    if (matrix[i][i] > matrix[widest][widest]) widest = i;
  }
  axis = {matrix[widest][0], matrix[widest][1], matrix[widest][2]};
  double value = 0;
  for (int round = 0; round < 12; ++round) {
    const double length = std::sqrt(axis[0] * axis[0] + axis[1] * axis[1] + axis[2] * axis[2]);
    if (length <= 0) return 0;
    for (double& a : axis) a /= length;
    Point next{};
    for (size_t i = 0; i < 3; ++i) {
      for (size_t j = 0; j < 3; ++j) next[i] += matrix[i][j] * axis[j];
    }
    value = length;
    axis = next;
  }
  const double length = std::sqrt(axis[0] * axis[0] + axis[1] * axis[1] + axis[2] * axis[2]);
  if (length <= 0) return 0;
  for (double& a : axis) a /= length;
  return std::max(value, length);
}

Group MakeGroup(std::span<const ColorBin> bins, size_t begin, size_t end) {
  Group group{begin, end, {}, {}, 0};
  double weight = 0, products[3][3] = {};
  for (const ColorBin& bin : bins.subspan(begin, end - begin)) {
    weight += bin.weight;
    for (size_t i = 0; i < 3; ++i) {
      const double weighted = static_cast<double>(bin.weight) * bin.channel[i];
      group.mean[i] += weighted;
      for (size_t j = 0; j <= i; ++j) products[i][j] += weighted * bin.channel[j];
    }
  }
  for (double& m : group.mean) m /= weight;
  for (size_t i = 0; i < 3; ++i) {
    for (size_t j = 0; j <= i; ++j) {
      products[i][j] -= weight * group.mean[i] * group.mean[j];
      products[j][i] = products[i][j];
    }
  }
  if (end - begin > 1) group.spread = LongestAxis(products, group.axis);
  return group;
}

// Splits the group in two at its mean; false if all its bins are on one side.
bool Split(std::span<ColorBin> bins, Group& group, Group& other) {
  const auto first = bins.begin() + static_cast<std::ptrdiff_t>(group.begin);
  const auto last = bins.begin() + static_cast<std::ptrdiff_t>(group.end);
  const auto middle = std::partition(first, last, [&](const ColorBin& bin) {
    double along = 0;
    for (size_t i = 0; i < 3; ++i) along += (bin.channel[i] - group.mean[i]) * group.axis[i];
    return along < 0;
  });
  if (middle == first || middle == last) return false;
  const auto cut = static_cast<size_t>(middle - bins.begin());
  other = MakeGroup(bins, cut, group.end);
  group = MakeGroup(bins, group.begin, cut);
  return true;
}

std::vector<Point> CutIntoGroups(std::span<ColorBin> bins, size_t colors) {
  std::vector<Group> groups{MakeGroup(bins, 0, bins.size())};
  while (groups.size() < colors) {
    const auto worst =
        std::max_element(groups.begin(), groups.end(),
                         [](const Group& a, const Group& b) { return a.spread < b.spread; });
    if (worst->spread <= 0) break;
    Group other;
    if (Split(bins, *worst, other)) {
      groups.push_back(other);
    } else {
      worst->spread = 0;
    }
  }
  std::vector<Point> means;
  for (const Group& group : groups) means.push_back(group.mean);
  return means;
}

// A bin as a point for NearestColor.
std::array<int32_t, 3> PointOf(const ColorBin& bin) {
  std::array<int32_t, 3> point;
  for (size_t c = 0; c < 3; ++c)
    point[c] = static_cast<int32_t>(bin.channel[c] * ColorPoints::kUnits + 0.5f);
  return point;
}

// One round of Lloyd's algorithm: assigns every bin to the nearest color, then moves every color to
// the mean of its bins. Returns the squared error before the move.
double MoveToMeans(std::span<const ColorBin> bins, NearestColor& nearest, ColorPoints& points) {
  struct Sum {
    double channel[3] = {}, weight = 0;
  };
  std::array<Sum, 256> sums{};
  double error = 0;
  nearest.SetColors(points);
  for (const ColorBin& bin : bins) {
    const auto at = PointOf(bin);
    const uint8_t index = nearest.FindPoint(at);
    Sum& sum = sums[index];
    sum.weight += bin.weight;
    double distance = 0;
    for (size_t c = 0; c < 3; ++c) {
      sum.channel[c] += static_cast<double>(bin.weight) * bin.channel[c];
      const int32_t difference = points.channel[index][c] - at[c];
      distance += kChannelWeight[c] * static_cast<double>(difference * difference);
    }
    error += distance * bin.weight;
  }
  for (size_t i = 0; i < static_cast<size_t>(points.count); ++i) {
    if (sums[i].weight <= 0) continue;
    for (size_t c = 0; c < 3; ++c) {
      points.channel[i][c] = static_cast<int32_t>(
          std::lround(sums[i].channel[c] / sums[i].weight * ColorPoints::kUnits));
    }
  }
  return error;
}

}  // namespace

Status FitPalette(const std::vector<ColorBin>& bins, int32_t colors, ColorPoints& points) {
  points.count = 0;
  if (bins.empty()) return Status::Ok;
  std::vector<ColorBin> weighed = bins;  // scaled by the channel weights
  for (ColorBin& bin : weighed) {
    for (size_t c = 0; c < 3; ++c)
      bin.channel[c] *= std::sqrt(static_cast<float>(kChannelWeight[c]));
  }
  for (const Point& mean : CutIntoGroups(weighed, static_cast<size_t>(colors))) {
    auto& point = points.channel[static_cast<size_t>(points.count++)];
    for (size_t c = 0; c < 3; ++c) {
      point[c] = static_cast<int32_t>(
          std::lround(mean[c] / std::sqrt(kChannelWeight[c]) * ColorPoints::kUnits));
    }
  }
  NearestColor nearest;
  RETURN_IF_BAD(nearest.Open(false));
  double last = MoveToMeans(bins, nearest, points);
  for (int round = 1; round < kMostRounds; ++round) {
    const double error = MoveToMeans(bins, nearest, points);
    if (error > last * (1 - kWorthAnother)) break;
    last = error;
  }
  return Status::Ok;
}

void ColorMeans::AddRow(const uint8_t* bgr, const uint8_t* indices, int32_t width) {
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    Sum& sum = sums_[indices[x]];
    for (int c = 0; c < 3; ++c) sum.channel[c] += bgr[c];
    ++sum.count;
  }
}

void ColorMeans::Move(ColorPoints& points) const {
  for (size_t i = 0; i < static_cast<size_t>(points.count); ++i) {
    if (sums_[i].count == 0) continue;
    for (size_t c = 0; c < 3; ++c) {
      points.channel[i][c] = static_cast<int32_t>(
          (sums_[i].channel[c] * ColorPoints::kUnits + sums_[i].count / 2) / sums_[i].count);
    }
  }
}

}  // namespace fotomill
