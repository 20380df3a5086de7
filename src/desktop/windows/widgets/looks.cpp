#include "desktop/windows/widgets/looks.h"

#include <wx/settings.h>

#include <algorithm>
#include <cmath>

namespace fotomill::desktop {

namespace {

Shade SystemShade(wxSystemColour index) {
  const wxColour color = wxSystemSettings::GetColour(index);
  return {color.Red(), color.Green(), color.Blue()};
}

}  // namespace

ListPalette CurrentPalette() {
  return PaletteOf(SystemShade(wxSYS_COLOUR_LISTBOX), SystemShade(wxSYS_COLOUR_LISTBOXTEXT),
                   SystemShade(wxSYS_COLOUR_HIGHLIGHT), SystemShade(wxSYS_COLOUR_HIGHLIGHTTEXT));
}

wxColour FaultColor() {
  const Shade window = SystemShade(wxSYS_COLOUR_BTNFACE);
  return ToWx(PaletteOf(window, SystemShade(wxSYS_COLOUR_BTNTEXT), window, window).fault);
}

double TextScale(const wxWindow& window) {
  constexpr double kUsualHeight = 17;  // line height in device-independent pixels
  return std::max(window.GetCharHeight() / (kUsualHeight * window.FromDIP(1)), 1.0);
}

int TextWidth(const wxWindow& window, int width) {
  return static_cast<int>(std::lround(window.FromDIP(width) * TextScale(window)));
}

wxColour BarColor() {
  return ToWx(
      Blend(SystemShade(wxSYS_COLOUR_WINDOW), SystemShade(wxSYS_COLOUR_HIGHLIGHT), 1.0 / 7));
}

}  // namespace fotomill::desktop
