#include "desktop/models/browser/thumbnail_side.h"

#include <algorithm>
#include <cmath>
#include <iterator>

#include "core/choice_lists.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int32_t kSteps[] = {48, 64, 96, 128, 176, 256, 384, 512};
constexpr int32_t kNormalFrom = 72, kLargeFrom = 136;
constexpr int32_t kGrid = 8;  // sides on the slider are multiples of this

int32_t UsualSide(int32_t view) {
  return view == choice::kViewSmall ? 48 : view == choice::kViewLarge ? 176 : 96;
}

}  // namespace

int32_t ViewOfSide(int32_t side) {
  if (side < kNormalFrom) return choice::kViewSmall;
  return side < kLargeFrom ? choice::kViewNormal : choice::kViewLarge;
}

int32_t SideInView(int32_t view, int32_t wanted) {
  const bool usable = wanted >= kSmallestSide && wanted <= kLargestSide;
  return usable && ViewOfSide(wanted) == view ? wanted : UsualSide(view);
}

int32_t SteppedSide(int32_t side, int32_t steps) {
  const auto last = static_cast<int32_t>(std::size(kSteps)) - 1;
  // up from the step below, down from the one above
  const auto* const from = steps > 0 ? std::upper_bound(std::begin(kSteps), std::end(kSteps), side)
                                     : std::lower_bound(std::begin(kSteps), std::end(kSteps), side);
  const auto place = static_cast<int32_t>(from - std::begin(kSteps)) - (steps > 0 ? 1 : 0);
  return kSteps[std::clamp(place + steps, 0, last)];
}

int32_t SideAtSlider(int32_t position) {
  const double part = static_cast<double>(position) / kSliderEnd;
  const double side =
      kSmallestSide * std::pow(static_cast<double>(kLargestSide) / kSmallestSide, part);
  return std::clamp(static_cast<int32_t>(std::lround(side / kGrid)) * kGrid, kSmallestSide,
                    kLargestSide);
}

int32_t SliderAtSide(int32_t side) {
  const double part = std::log(static_cast<double>(side) / kSmallestSide) /
                      std::log(static_cast<double>(kLargestSide) / kSmallestSide);
  return std::clamp(static_cast<int32_t>(std::lround(part * kSliderEnd)), 0, kSliderEnd);
}

CellTrouble TroubleOf(Status status) {
  switch (status) {
    case Status::Ok: return CellTrouble::None;
    case Status::FileOpenError: return CellTrouble::NoAccess;
    case Status::UnsupportedFunction:
    case Status::UnsupportedFormat:
    case Status::FeatureDisabled: return CellTrouble::Unsupported;
    default: return CellTrouble::Damaged;
  }
}

const char* TroubleText(CellTrouble trouble) {
  switch (trouble) {
    case CellTrouble::Damaged: return TrLater("Damaged");
    case CellTrouble::NoAccess: return TrLater("No access");
    case CellTrouble::Unsupported: return TrLater("Not supported");
    case CellTrouble::None: break;
  }
  return "";
}

}  // namespace fotomill::desktop
