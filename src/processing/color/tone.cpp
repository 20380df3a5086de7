#include "processing/color/tone.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <utility>
#include <vector>

namespace fotomill {

namespace {

// Slopes of a monotone curve at its knots. `steps` are the slopes of the line
// segments between them.
std::vector<double> MonotoneSlopes(std::span<const double> steps) {
  std::vector<double> slopes(steps.size() + 1);
  slopes.front() = steps.front();
  slopes.back() = steps.back();
  for (size_t i = 1; i < steps.size(); ++i)
    slopes[i] = steps[i - 1] * steps[i] <= 0 ? 0 : (steps[i - 1] + steps[i]) / 2;
  for (size_t i = 0; i < steps.size(); ++i) {
    if (steps[i] == 0) {
      slopes[i] = slopes[i + 1] = 0;
      continue;
    }
    const double before = slopes[i] / steps[i], behind = slopes[i + 1] / steps[i];
    const double length = std::hypot(before, behind);
    if (length <= 3) continue;
    slopes[i] = 3 * before / length * steps[i];
    slopes[i + 1] = 3 * behind / length * steps[i];
  }
  return slopes;
}

double CurveAt(std::span<const CurveKnot> knots, std::span<const double> slopes, double v) {
  if (v <= knots.front().x) return knots.front().y;
  if (v >= knots.back().x) return knots.back().y;
  size_t i = 0;
  while (v >= knots[i + 1].x) ++i;
  // Cubic Hermite form.
  const double width = knots[i + 1].x - knots[i].x, t = (v - knots[i].x) / width, u = 1 - t;
  return knots[i].y * (1 + 2 * t) * u * u + width * slopes[i] * t * u * u +
         knots[i + 1].y * t * t * (3 - 2 * t) - width * slopes[i + 1] * t * t * u;
}

}  // namespace

PointEffect BrightnessEffect(double b) {
  return EffectOf([=](double v) { return v + 255 * b / 100; });
}

PointEffect ContrastEffect(double c) {
  // At 100 the tangent is infinite; a factor of 1000 also separates black and white.
  const double k = c >= 100 ? 1000 : std::tan((c + 100) * std::numbers::pi / 400);
  return EffectOf([=](double v) { return (v - 127.5) * k + 127.5; });
}

PointEffect GammaEffect(double g) {
  return EffectOf([=](double v) { return 255 * std::pow(v / 255, 1 / g); });
}

PointEffect InvertEffect() {
  return EffectOf([](double v) { return 255 - v; });
}

PointEffect LevelsEffect(const Levels& levels) {
  return EffectOf([=](double v) {
    const double share = std::clamp((v - levels.black) / (levels.white - levels.black), 0.0, 1.0);
    const double curved = levels.gamma == 1 ? share : std::pow(share, 1 / levels.gamma);
    return levels.outBlack + (levels.outWhite - levels.outBlack) * curved;
  });
}

PointEffect CurveEffect(std::span<const CurveKnot> knots, CurveChannel channel) {
  std::vector<double> steps;
  for (size_t i = 1; i < knots.size(); ++i)
    steps.push_back((knots[i].y - knots[i - 1].y) / (knots[i].x - knots[i - 1].x));
  const std::vector<double> slopes = MonotoneSlopes(steps);
  PointEffect effect = EffectOf([&](double v) { return CurveAt(knots, slopes, v); });
  const PointEffect same = EffectOf([](double v) { return v; });
  for (const auto& [c, own] :
       {std::pair{0u, CurveChannel::Blue}, {1u, CurveChannel::Green}, {2u, CurveChannel::Red}}) {
    if (channel != CurveChannel::All && channel != own) effect.tables[c] = same.tables[c];
  }
  return effect;
}

PointEffect PosterizeEffect(int32_t n) {
  return EffectOf([=](double v) { return std::floor(v * (n - 1) / 255 + 0.5) * 255 / (n - 1); });
}

PointEffect SolarizeEffect(double t) {
  return EffectOf([=](double v) { return v >= t ? 255 - v : v; });
}

PointEffect TemperatureEffect(double t) {
  PointEffect effect = EffectOf([](double v) { return v; });
  effect.tables[2] = EffectOf([=](double v) { return v + v * t / 400; }).tables[2];
  effect.tables[0] = EffectOf([=](double v) { return v - v * t / 400; }).tables[0];
  return effect;
}

PointEffect TintEffect(std::span<const uint8_t, 3> bgr, double percent) {
  PointEffect effect;
  for (size_t c = 0; c < 3; ++c) {
    effect.tables[c] =
        EffectOf([=](double v) { return v + (bgr[c] - v) * percent / 100; }).tables[c];
  }
  return effect;
}

}  // namespace fotomill
