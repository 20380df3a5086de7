#include "desktop/models/edit/slider_scale.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

namespace fotomill::desktop {

namespace {

constexpr double kNoLimit = 1e8, kWide = 500, kPower = 3;

bool IsWide(const Parameter& row) { return row.least >= 0 && row.most - row.least > kWide; }

double Spread(const Parameter& row, double part) {
  return IsWide(row) ? std::pow(part, kPower) : part;
}

double Rounded(const Parameter& row, double value) {
  const double unit = std::pow(10, DigitsOf(row));
  return std::clamp(std::round(value * unit) / unit, row.least, row.most);
}

}  // namespace

bool IsNumber(const Parameter& row) {
  return row.kind == ParameterKind::kInteger || row.kind == ParameterKind::kNumber ||
         row.kind == ParameterKind::kPercent || row.kind == ParameterKind::kAngle;
}

bool HasSlider(const Parameter& row) {
  return IsNumber(row) && row.least > -kNoLimit && row.most < kNoLimit;
}

int32_t SliderPosition(const Parameter& row, double value) {
  const double part = std::clamp((value - row.least) / (row.most - row.least), 0.0, 1.0);
  const double spread = IsWide(row) ? std::pow(part, 1 / kPower) : part;
  return static_cast<int32_t>(std::lround(spread * kSliderEnd));
}

double SliderValue(const Parameter& row, int32_t position) {
  const double part = std::clamp(static_cast<double>(position) / kSliderEnd, 0.0, 1.0);
  return Rounded(row, row.least + Spread(row, part) * (row.most - row.least));
}

int DigitsOf(const Parameter& row) {
  if (row.kind == ParameterKind::kInteger) return 0;
  const double range = row.most - row.least;
  return range <= 100 ? 2 : 1;
}

double StepOf(const Parameter& row) {
  if (row.kind == ParameterKind::kInteger) return 1;
  return row.most - row.least <= 20 || row.least == 0.01 || row.least == 0.1 ? 0.1 : 1;
}

std::string NumberText(const Parameter& row, double value) {
  char text[40];
  std::snprintf(text, sizeof text, "%.10g", Rounded(row, value));
  return text;
}

}  // namespace fotomill::desktop
