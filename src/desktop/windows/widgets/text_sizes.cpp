#include "desktop/windows/widgets/text_sizes.h"

#include <wx/window.h>

#include <algorithm>

#include "settings/configuration.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

double scales[] = {1, 1, 1, 1};  // indexed by TextSize

double ScaleOf(int32_t size, int32_t usual) {
  return std::clamp(static_cast<double>(size) / usual, 0.5, 4.0);
}

}  // namespace

void SetTextSizes(const EarlySettings& sizes) {
  scales[0] = ScaleOf(sizes.normalTextFontSize, defaultSettings.NormalTextFontSize);
  scales[1] = ScaleOf(sizes.smallTextFontSize, defaultSettings.SmallTextFontSize);
  scales[2] = ScaleOf(sizes.normalThumbFontSize, defaultSettings.NormalThumbFontSize);
  scales[3] = ScaleOf(settings.LargeThumbFontSize, defaultSettings.LargeThumbFontSize);
}

wxFont FontOf(const wxWindow& window, TextSize size) {
  const wxFont font = window.GetFont();
  return (size == TextSize::Small ? font.Smaller() : font)
      .Scaled(static_cast<float>(scales[static_cast<size_t>(size)]));
}

}  // namespace fotomill::desktop
