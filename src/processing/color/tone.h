#pragma once

#include <cstdint>
#include <span>

#include "processing/color/point_effect.h"

// Effects with independent channels: tables, merged with adjacent ones when applied.
namespace fotomill {

// v + 2.55 b, for b from -100 to 100.
PointEffect BrightnessEffect(double b);
// (v - 127.5) k + 127.5 with k = tan((c + 100) pi / 400), for c from -100 (all gray) to 100 (black
// and white).
PointEffect ContrastEffect(double c);
// 255 (v / 255)^(1 / g), for g above 0.
PointEffect GammaEffect(double g);
// 255 - v.
PointEffect InvertEffect();

// Parameters of LevelsEffect: maps `black` to `outBlack`, `white` (above `black`) to `outWhite`,
// and values in between to outBlack + (outWhite - outBlack) ((v - black) / (white - black))^(1 /
// gamma). Values outside are clamped to that range.
struct Levels {
  double black = 0, white = 255;
  double gamma = 1;
  double outBlack = 0, outWhite = 255;
};
PointEffect LevelsEffect(const Levels& levels);

// A point of a curve: input and output value, 0 to 255.
struct CurveKnot {
  double x, y;
};
// The channels a curve applies to.
enum class CurveChannel : int32_t { All, Red, Green, Blue };
// A smooth monotone curve through two or more knots, sorted by input, without overshoot: cubic
// segments with limited slopes. Constant before the first knot and after the last. Source: Fritsch
// and Carlson, "Monotone Piecewise Cubic Interpolation", SIAM J. Numer. Anal. 17 (1980).
PointEffect CurveEffect(std::span<const CurveKnot> knots, CurveChannel channel);

// round(v (n - 1) / 255) 255 / (n - 1), for n of 2 or more levels.
PointEffect PosterizeEffect(int32_t n);
// 255 - v for v >= t.
PointEffect SolarizeEffect(double t);
// Red times 1 + t / 400 and blue times 1 - t / 400, for t from -100 (cool) to 100 (warm).
PointEffect TemperatureEffect(double t);
// v + (color - v) percent / 100. `bgr` is the color.
PointEffect TintEffect(std::span<const uint8_t, 3> bgr, double percent);

}  // namespace fotomill
