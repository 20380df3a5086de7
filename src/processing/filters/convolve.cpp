#include "processing/filters/convolve.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <vector>

#include "processing/color/point_effect.h"
#include "processing/filters/tap_rows.h"

namespace fotomill {

namespace {

struct Gradient {
  std::vector<int32_t> across, down;
  explicit Gradient(size_t samples) : across(samples), down(samples) {}

  // Eight times the slope.
  void Measure(TapRows& taps) {
    std::ranges::fill(across, 0);
    std::ranges::fill(down, 0);
    for (int32_t dy = -1; dy <= 1; ++dy) {
      for (int32_t dx = -1; dx <= 1; ++dx) {
        const int32_t right = dx * (2 - dy * dy), below = dy * (2 - dx * dx);
        if (right == 0 && below == 0) continue;
        const uint8_t* levels = taps.At(dx, dy);
        for (size_t i = 0; i < across.size(); ++i) {
          across[i] += right * levels[i];
          down[i] += below * levels[i];
        }
      }
    }
  }
};

// Fixed point, 1 / 65536, so that results are the same on every machine.
int64_t DirectionOf(double value) { return std::llround(value * 65536); }

}  // namespace

int32_t KernelReach(size_t weights) {
  int32_t side = 1;
  while (static_cast<size_t>(side) * static_cast<size_t>(side) < weights) side += 2;
  return side / 2;
}

Status ConvolvePicture(PictureRecord& picture, std::span<const double> weights, double divisor,
                       double bias, const Work& work) {
  const int32_t reach = KernelReach(weights.size());
  const size_t samples = 3 * static_cast<size_t>(picture.image.Width());
  return FilterRows(picture, reach, work, [&](TapRows& taps, uint8_t* out) {
    std::vector<double> sums(samples);
    size_t place = 0;
    for (int32_t dy = -reach; dy <= reach; ++dy) {
      for (int32_t dx = -reach; dx <= reach; ++dx) {
        const double weight = weights[place++];
        if (weight == 0) continue;
        const uint8_t* levels = taps.At(dx, dy);
        for (size_t i = 0; i < samples; ++i) sums[i] += weight * levels[i];
      }
    }
    for (size_t i = 0; i < samples; ++i) out[i] = RoundedLevel(sums[i] / divisor + bias);
  });
}

Status FindPictureEdges(PictureRecord& picture, double amount, const Work& work) {
  const size_t samples = 3 * static_cast<size_t>(picture.image.Width());
  return FilterRows(picture, 1, work, [&](TapRows& taps, uint8_t* out) {
    Gradient gradient(samples);
    gradient.Measure(taps);
    for (size_t i = 0; i < samples; ++i) {
      const double square =
          gradient.across[i] * gradient.across[i] + gradient.down[i] * gradient.down[i];
      out[i] = RoundedLevel(amount * std::sqrt(square));
    }
  });
}

Status EmbossPicture(PictureRecord& picture, double angle, double depth, const Work& work) {
  const size_t samples = 3 * static_cast<size_t>(picture.image.Width());
  const double turn = angle * std::numbers::pi / 180;
  const int64_t right = DirectionOf(-std::sin(turn)), below = DirectionOf(std::cos(turn));
  return FilterRows(picture, 1, work, [&](TapRows& taps, uint8_t* out) {
    Gradient gradient(samples);
    gradient.Measure(taps);
    for (size_t i = 0; i < samples; ++i) {
      const auto rise = static_cast<double>(right * gradient.across[i] + below * gradient.down[i]);
      out[i] = RoundedLevel(127.5 + depth * rise / (8 * 65536));
    }
  });
}

}  // namespace fotomill
