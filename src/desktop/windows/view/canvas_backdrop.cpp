#include "desktop/windows/view/canvas_backdrop.h"

#include <wx/settings.h>

#include <algorithm>
#include <cmath>

#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kSquareSide = 8;  // of the checkerboard
constexpr Color kLightSquares[] = {0xffffff, 0xcccccc};
constexpr Color kDarkSquares[] = {0x666666, 0x444444};
// The default of ViewModeBackground, and what a dark appearance uses instead, as it would dazzle.
constexpr Color kUsualAround = 0xC0C0C0, kDarkAround = 0x2A2A2A;

}  // namespace

Backdrop BackdropFor(const wxWindow& window) {
  Backdrop backdrop{.around = static_cast<Color>(settings.ViewModeBackground)};
  const bool dark = wxSystemSettings::GetAppearance().IsDark();
  if (dark && backdrop.around == kUsualAround) backdrop.around = kDarkAround;
  backdrop.squares = settings.ViewModeCheckerboard != 0;
  std::ranges::copy(dark ? kDarkSquares : kLightSquares, backdrop.square);
  const double side = window.FromDIP(kSquareSide) * window.GetContentScaleFactor();
  backdrop.side = std::max(static_cast<int>(std::lround(side)), 1);
  return backdrop;
}

}  // namespace fotomill::desktop
