#include "desktop/models/edit/preview_steps.h"

#include <algorithm>
#include <cmath>
#include <string_view>

namespace fotomill::desktop {

namespace {

constexpr double kUsualDpi = 96;

void Reduce(Length& length, double scale) {
  if (length.unit == LengthUnit::Pixels) length.number *= scale;
}

void Reduce(const Parameter& row, Value& value, double scale) {
  const bool pixels = std::string_view(row.unit) == "px";
  switch (row.kind) {
    case ParameterKind::kInteger:
      if (pixels) value.number = std::clamp(std::round(value.number * scale), row.least, row.most);
      break;
    case ParameterKind::kNumber:
      if (pixels) value.number = std::clamp(value.number * scale, row.least, row.most);
      break;
    case ParameterKind::kLength:
    case ParameterKind::kPoint:
      Reduce(value.x, scale);
      Reduce(value.y, scale);
      break;
    case ParameterKind::kSize:
    case ParameterKind::kRectangle:
      if (value.ratio) break;
      for (Length* length : {&value.x, &value.y, &value.width, &value.height})
        Reduce(*length, scale);
      break;
    default: break;
  }
}

}  // namespace

std::vector<Step> ReducedSteps(std::span<const Step> steps, double scale) {
  std::vector<Step> reduced(steps.begin(), steps.end());
  for (Step& step : reduced) {
    for (size_t i = 0; i < step.arguments.Rows().size(); ++i)
      Reduce(step.arguments.Rows()[i], step.arguments.At(i), scale);
  }
  return reduced;
}

void SetReducedSize(PictureRecord& picture, double scale) {
  picture.width = picture.image.Width();
  picture.height = picture.image.Height();
  picture.bitsPerPixel = picture.image.Bits();
  picture.reduction = 1;
  for (double* dpi : {&picture.metadata.dpiX, &picture.metadata.dpiY})
    *dpi = (*dpi > 0 ? *dpi : kUsualDpi) * scale;
}

size_t LocalSteps(std::span<const Step> steps) {
  const auto local = [](const Step& step) {
    return step.operation->works == Works::Point || step.operation->works == Works::Neighborhood;
  };
  size_t count = 0;
  while (count < steps.size() && local(steps[steps.size() - 1 - count])) ++count;
  return count;
}

double NextShare(double share, double seconds) {
  constexpr double kLeast = 0.25, kMostGrowth = 1.1, kMeasurable = 0.001;
  const double fit = std::sqrt(kQuickSeconds / std::max(seconds, kMeasurable));
  return std::clamp(share * std::min(fit, kMostGrowth), kLeast, 1.0);
}

}  // namespace fotomill::desktop
