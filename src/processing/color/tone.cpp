#include "processing/color/tone.h"

#include <cmath>
#include <numbers>

namespace fotomill {

PointEffect BrightnessEffect(double b) {
  return EffectOf([=](double v) { return v + 255 * b / 100; });
}

PointEffect ContrastEffect(double c) {
  // At 100 the tangent is beyond all bounds; a factor of 1000 parts black and white as well.
  const double k = c >= 100 ? 1000 : std::tan((c + 100) * std::numbers::pi / 400);
  return EffectOf([=](double v) { return (v - 127.5) * k + 127.5; });
}

PointEffect GammaEffect(double g) {
  return EffectOf([=](double v) { return 255 * std::pow(v / 255, 1 / g); });
}

PointEffect InvertEffect() {
  return EffectOf([](double v) { return 255 - v; });
}

PointEffect GrayEffect() {
  PointEffect effect;
  effect.colors = [](uint8_t* bgr, size_t pixels) {
    for (size_t i = 0; i < pixels; ++i, bgr += 3) bgr[0] = bgr[1] = bgr[2] = Luma(bgr[2], bgr[1], bgr[0]);
  };
  return effect;
}

}  // namespace fotomill
