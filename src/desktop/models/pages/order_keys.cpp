#include "desktop/models/pages/order_keys.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>

#include "core/choice_lists.h"
#include "pages/model/page.h"
#include "pages/model/paper.h"
#include "printing/value_parsing.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr double kPixelsPerInch = 300;  // of sizes in pixels

std::string FlagText(bool on) { return on ? "yes" : ""; }

// The place of a named size, from 0; -1 if there is none.
int32_t PlaceOf(std::span<const NamedSize> sizes, const std::string& text) {
  const auto size = ParseSize(text, sizes);
  if (!size) return -1;
  const auto place = std::ranges::find(sizes, *size, &NamedSize::size);
  return place == sizes.end() ? -1 : static_cast<int32_t>(place - sizes.begin());
}

// --- the paper ---

// PrintSize: 0 is A4, others are places from 1.
std::string LoadPaper() {
  const auto place = static_cast<size_t>(settings.PrintSize);
  return place >= 1 && place <= Papers().size() ? Papers()[place - 1].name : "A4";
}
void StorePaper(const std::string& value) {
  const int32_t place = PlaceOf(Papers(), value);
  if (place >= 0) settings.PrintSize = place + 1;
}

// --- the size of single prints: a mode and what it needs ---

enum SizeMode : int32_t { kFit, kFill, kActual, kPercent, kGiven };
constexpr const char* kWords[] = {"fit", "fill", "actual"};

std::string LoadGivenSize() {
  const int32_t width = settings.PrintWorkshopSizeWidth, height = settings.PrintWorkshopSizeDepth;
  if (width <= 0 || height <= 0) return "fit";
  char text[64];
  const auto pair = [&](const char* form, auto across, auto down) {
    std::snprintf(text, sizeof text, form, across, down);
    return std::string(text);
  };
  switch (settings.PrintWorkshopUnits) {
    case choice::kInches: return pair("%dx%din", width, height);
    case choice::kCentimeters: return pair("%dx%dcm", width, height);
    default: break;
  }
  const double mm = kMmPerInch / kPixelsPerInch;
  return pair("%.1fx%.1fmm", width * mm, height * mm);
}

std::string LoadSize() {
  const int32_t mode = std::clamp<int32_t>(settings.NewPrintSizeMode, kFit, kGiven);
  if (mode < kPercent) return kWords[mode];
  return mode == kPercent ? std::to_string(settings.PrintWorkshopSizeFactor) + "%"
                          : LoadGivenSize();
}

// In the first unit in which both sides are whole.
void StoreGivenSize(const PaperSize& size) {
  constexpr struct {
    int32_t unit;
    double mm;
  } kUnits[] = {{choice::kCentimeters, 10},
                {choice::kInches, kMmPerInch},
                {choice::kPixels, kMmPerInch / kPixelsPerInch}};
  for (const auto& row : kUnits) {
    const double width = size.width / row.mm, height = size.height / row.mm;
    const bool whole =
        std::abs(width - std::round(width)) < 1e-6 && std::abs(height - std::round(height)) < 1e-6;
    if (!whole && row.unit != choice::kPixels) continue;
    settings.PrintWorkshopUnits = row.unit;
    settings.PrintWorkshopSizeWidth = static_cast<int32_t>(std::lround(width));
    settings.PrintWorkshopSizeDepth = static_cast<int32_t>(std::lround(height));
    return;
  }
}

void StoreSize(const std::string& value) {
  const auto* const word = std::ranges::find(kWords, value);
  if (word != std::end(kWords) || value.empty()) {
    settings.NewPrintSizeMode = value.empty() ? kFit : static_cast<int32_t>(word - kWords);
  } else if (value.ends_with('%')) {
    const auto percent = ParseLength(value.substr(0, value.size() - 1));
    if (!percent || *percent < 1 || *percent > 10000) return;
    settings.NewPrintSizeMode = kPercent;
    settings.PrintWorkshopSizeFactor = static_cast<int32_t>(std::lround(*percent));
  } else if (const auto size = ParseSize(value, PrintSizes())) {
    settings.NewPrintSizeMode = kGiven;
    StoreGivenSize(*size);
  }
}

// --- the position of single prints ---

std::string LoadPosition() {
  const int32_t across = settings.PrintWorkshopPosH, down = settings.PrintWorkshopPosV;
  if (across == 0 && down == 0) return settings.CentrePrintedImages != 0 ? "center" : "top-left";
  const std::string side = across == 1 ? "left" : across == 2 ? "right" : "";
  const std::string end = down == 1 ? "top" : down == 2 ? "bottom" : "";
  return end + (!side.empty() && !end.empty() ? "-" : "") + side;
}
void StorePosition(const std::string& value) {
  settings.PrintWorkshopPosH = value.ends_with("left") ? 1 : value.ends_with("right") ? 2 : 0;
  settings.PrintWorkshopPosV = value.starts_with("top") ? 1 : value.starts_with("bottom") ? 2 : 0;
  if (value == "center") settings.CentrePrintedImages = 1;
}

// --- others ---

std::string LoadRule() {
  return settings.PrintWorkshopRuleUse != 0 ? std::to_string(settings.PrintWorkshopRuleSize) + "pt"
                                            : std::string();
}
void StoreRule(const std::string& value) {
  const double points = ParseLength(value, kMmPerPoint).value_or(0) / kMmPerPoint;
  settings.PrintWorkshopRuleUse = points > 0 ? 1 : 0;
  if (points > 0)
    settings.PrintWorkshopRuleSize = std::clamp(static_cast<int32_t>(std::lround(points)), 1, 1000);
}

std::string LoadPhotoSize() {
  const auto last = static_cast<int32_t>(PrintSizes().size()) - 1;
  return PrintSizes()[static_cast<size_t>(std::clamp(settings.PhotoPrnFormat, 0, last))].name;
}
void StorePhotoSize(const std::string& value) {
  const int32_t place = PlaceOf(PrintSizes(), value);
  if (place >= 0) settings.PhotoPrnFormat = place;
}

std::string LoadPhotoMargin() {
  return settings.PhotoPrnMargin > 0 ? std::to_string(settings.PhotoPrnMargin) + "mm" : "";
}
void StorePhotoMargin(const std::string& value) {
  const double margin = ParseLength(value).value_or(0);
  settings.PhotoPrnMargin = static_cast<int32_t>(std::lround(std::min(margin, kMostSide)));
}

// The grid of contact sheets, for the orientation in force.
struct GridKeys {
  int32_t &columns, &rows;
};
GridKeys GridKeysInForce() {
  return settings.NewPrintOrientation != 0
             ? GridKeys{settings.CatalogLandscapeWide, settings.CatalogLandscapeDeep}
             : GridKeys{settings.CatalogPortraitWide, settings.CatalogPortraitDeep};
}
std::string LoadGrid() {
  const GridKeys keys = GridKeysInForce();
  if (keys.columns <= 0 || keys.rows <= 0) return {};
  return std::to_string(keys.columns) + "x" + std::to_string(keys.rows);
}
void StoreGrid(const std::string& value) {
  int32_t columns = 0, rows = 0;
  if (!ReadGrid(value, columns, rows).empty()) return;
  const GridKeys keys = GridKeysInForce();
  keys.columns = columns;
  keys.rows = rows;
}

void StoreFooter(const std::string& value) {
  if (CheckMacros(value).empty()) settings.GrafcatFooter.AssignCut(value);
}

template <int32_t Settings::*key, bool reversed = false>
std::string LoadFlag() {
  return FlagText((settings.*key != 0) != reversed);
}
template <int32_t Settings::*key, bool reversed = false>
void StoreFlag(const std::string& value) {
  settings.*key = value.empty() == reversed ? 1 : 0;
}

// clang-format off
constexpr struct OptionKey {
  std::string_view kind, option;
  std::string (*load)();
  void (*store)(const std::string& value);
} kKeys[] = {
    {"", "paper", LoadPaper, StorePaper},
    {"", "landscape", LoadFlag<&Settings::NewPrintOrientation>, StoreFlag<&Settings::NewPrintOrientation>},
    {"contact", "grid", LoadGrid, StoreGrid},
    {"catalog", "footer", [] { return std::string(settings.GrafcatFooter.view()); }, StoreFooter},
    {"photo", "size", LoadPhotoSize, StorePhotoSize},
    {"photo", "margin", LoadPhotoMargin, StorePhotoMargin},
    {"photo", "no-cut-lines", LoadFlag<&Settings::PhotoPrnCutlineEnable, true>, StoreFlag<&Settings::PhotoPrnCutlineEnable, true>},
    {"print", "size", LoadSize, StoreSize},
    {"print", "position", LoadPosition, StorePosition},
    {"print", "no-turn", LoadFlag<&Settings::PrintWorkshopAutoRotate, true>, StoreFlag<&Settings::PrintWorkshopAutoRotate, true>},
    {"print", "names", LoadFlag<&Settings::PrintFileNames>, StoreFlag<&Settings::PrintFileNames>},
    {"print", "rule", LoadRule, StoreRule},
    {"print", "crop-marks", LoadFlag<&Settings::PrintWorkshopCropmarks>, StoreFlag<&Settings::PrintWorkshopCropmarks>},
    {"poster", "no-sketch", LoadFlag<&Settings::PrintPosterPreview, true>, StoreFlag<&Settings::PrintPosterPreview, true>},
};
// clang-format on

const OptionKey* Find(std::string_view kind, std::string_view option) {
  const auto* const row = std::ranges::find_if(
      kKeys, [&](const OptionKey& key) { return key.kind == kind && key.option == option; });
  return row == std::end(kKeys) ? nullptr : row;
}

}  // namespace

std::string LoadOption(std::string_view kind, std::string_view option) {
  const OptionKey* const row = Find(kind, option);
  return row == nullptr ? std::string() : row->load();
}

void StoreOption(std::string_view kind, std::string_view option, const std::string& value) {
  if (const OptionKey* const row = Find(kind, option)) row->store(value);
}

}  // namespace fotomill::desktop
