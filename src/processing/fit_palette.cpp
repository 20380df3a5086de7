#include "processing/fit_palette.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numeric>
#include <span>

namespace fotomill {

namespace {

using Point = std::array<double, 3>;

constexpr int kMostRounds = 12;          // of moving the colours
constexpr double kWorthAnother = 0.002;  // least share by which a round must reduce the error

// A run of bins with its mean, and the axis along which it is widest.
struct Group {
  size_t begin, end;
  Point mean;
  Point axis;
  double spread;  // squared error along the axis
};

// The longest axis of a symmetric matrix and its eigenvalue, by power iteration.
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

// Cuts the group in two at its mean; false when all its bins lie on one side.
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
    const auto worst = std::max_element(groups.begin(), groups.end(),
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

double Distance(const Point& a, const float (&b)[3]) {
  double sum = 0;
  for (size_t i = 0; i < 3; ++i) sum += (a[i] - b[i]) * (a[i] - b[i]);
  return sum;
}

// One round: every bin goes to the colour nearest to it, then every colour to the mean of its bins. Returns the squared
// error before the move.
double MoveToMeans(std::span<const ColorBin> bins, std::vector<Point>& colors, std::vector<uint8_t>& nearest) {
  struct Sum {
    Point channel{};
    double weight = 0;
  };
  std::vector<Sum> sums(colors.size());
  double error = 0;
  for (size_t i = 0; i < bins.size(); ++i) {
    size_t best = nearest[i];
    double bestDistance = Distance(colors[best], bins[i].channel);
    for (size_t c = 0; c < colors.size(); ++c) {
      const double distance = Distance(colors[c], bins[i].channel);
      if (distance < bestDistance) {
        bestDistance = distance;
        best = c;
      }
    }
    nearest[i] = static_cast<uint8_t>(best);
    error += bestDistance * bins[i].weight;
    sums[best].weight += bins[i].weight;
    for (size_t k = 0; k < 3; ++k) {
      sums[best].channel[k] += static_cast<double>(bins[i].weight) * bins[i].channel[k];
    }
  }
  for (size_t c = 0; c < colors.size(); ++c) {
    if (sums[c].weight <= 0) continue;
    for (size_t k = 0; k < 3; ++k) colors[c][k] = sums[c].channel[k] / sums[c].weight;
  }
  return error;
}

}  // namespace

int32_t FitPalette(std::vector<ColorBin>& bins, int32_t colors, Palette& palette) {
  palette.fill(0);
  if (bins.empty()) return 0;
  std::vector<Point> points = CutIntoGroups(bins, static_cast<size_t>(colors));
  std::vector<uint8_t> nearest(bins.size(), 0);
  double last = MoveToMeans(bins, points, nearest);
  for (int round = 1; round < kMostRounds; ++round) {
    const double error = MoveToMeans(bins, points, nearest);
    if (error > last * (1 - kWorthAnother)) break;
    last = error;
  }
  std::sort(points.begin(), points.end(), [](const Point& a, const Point& b) {
    return 114 * a[0] + 587 * a[1] + 299 * a[2] < 114 * b[0] + 587 * b[1] + 299 * b[2];
  });
  for (size_t i = 0; i < points.size(); ++i) {
    for (size_t c = 0; c < 3; ++c) palette[3 * i + c] = static_cast<uint8_t>(std::lround(points[i][2 - c]));
  }
  return static_cast<int32_t>(points.size());
}

}  // namespace fotomill
