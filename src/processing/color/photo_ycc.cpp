#include "processing/color/photo_ycc.h"

#include <algorithm>
#include <array>
#include <cmath>

namespace fotomill {

namespace {

// Highlights go up to 346, white is 247. Values up to the knee are unchanged; those above are
// compressed into the range up to 255.
constexpr double kBrightest = 346, kKnee = 200, kScreen = 255;

double Shown(double light) {
  if (light <= kKnee) return std::max(light, 0.0);
  const double left = std::max(1 - (light - kKnee) / (kBrightest - kKnee), 0.0);
  return kScreen - (kScreen - kKnee) * std::pow(left, (kBrightest - kKnee) / (kScreen - kKnee));
}

// Sums of the terms below are in 32nds, plus one half. They are offset by kLowest, so that none is
// negative, and stay below kLights.
constexpr int32_t kFraction = 5;
constexpr int32_t kLowest = -352, kLights = 1024;

struct Tables {
  std::array<int32_t, 256> luma, red2, green1, green2, blue1;
  std::array<uint8_t, kLights> shown;
};

Tables MakeTables() {
  Tables tables;
  const auto fixed = [](double value) {
    return static_cast<int32_t>(value * (1 << kFraction) + (value < 0 ? -0.5 : 0.5));
  };
  for (int32_t i = 0; i < 256; ++i) {
    const auto at = static_cast<size_t>(i);
    const double chroma1 = 2.2179 * (i - 156), chroma2 = 1.8215 * (i - 137);
    tables.luma[at] = fixed(1.3584 * i) - kLowest * (1 << kFraction) + (1 << kFraction) / 2;
    tables.red2[at] = fixed(chroma2);
    tables.green1[at] = fixed(-0.194 * chroma1);
    tables.green2[at] = fixed(-0.509 * chroma2);
    tables.blue1[at] = fixed(chroma1);
  }
  for (int32_t i = 0; i < kLights; ++i) {
    tables.shown[static_cast<size_t>(i)] = static_cast<uint8_t>(Shown(i + kLowest) + 0.5);
  }
  return tables;
}

}  // namespace

void PhotoYccToColors(const uint8_t* luma, const uint8_t* chroma1, const uint8_t* chroma2,
                      size_t count, uint8_t* bgr) {
  static const Tables tables = MakeTables();
  const auto shown = [](int32_t sum) {
    return tables.shown[static_cast<size_t>(sum >> kFraction)];
  };
  for (size_t x = 0; x < count; ++x, bgr += 3) {
    const int32_t light = tables.luma[luma[x]];
    bgr[0] = shown(light + tables.blue1[chroma1[x]]);
    bgr[1] = shown(light + tables.green1[chroma1[x]] + tables.green2[chroma2[x]]);
    bgr[2] = shown(light + tables.red2[chroma2[x]]);
  }
}

}  // namespace fotomill
