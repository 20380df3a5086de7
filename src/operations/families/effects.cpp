#include "operations/operations.h"
#include "processing/color/tone.h"

// Effects: colors and brightness, without a look at neighbors.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr Parameter kBrightness[] = {
    {.name = "b", .kind = kNumber, .unit = "%", .preset = "0", .least = -100, .most = 100, .label = "Brightness",
     .help = "Percent of white to add; below 0 the picture gets darker.", .key = "FXBrightness"},
};
constexpr Parameter kContrast[] = {
    {.name = "c", .kind = kNumber, .unit = "%", .preset = "0", .least = -100, .most = 100, .label = "Contrast",
     .help = "-100 makes everything gray, 100 black and white.", .key = "FXContrast"},
};
constexpr Parameter kGamma[] = {
    {.name = "g", .kind = kNumber, .preset = "1", .least = 0.01, .most = 100, .label = "Gamma",
     .help = "Above 1 brightens midtones, below 1 darkens them."},
};

void Brightness(const Arguments& arguments, PointEffect& effect) { effect = BrightnessEffect(arguments.Number("b")); }
void Contrast(const Arguments& arguments, PointEffect& effect) { effect = ContrastEffect(arguments.Number("c")); }
void Gamma(const Arguments& arguments, PointEffect& effect) { effect = GammaEffect(arguments.Number("g")); }
void Invert(const Arguments&, PointEffect& effect) { effect = InvertEffect(); }
void Gray(const Arguments&, PointEffect& effect) { effect = GrayEffect(); }

constexpr Operation kEffects[] = {
    {.name = "brightness", .family = Family::Effects, .label = "Brightness", .help = "Makes a picture brighter or darker.",
     .example = "brightness 10", .parameters = kBrightness, .works = Works::Point, .point = Brightness},
    {.name = "contrast", .family = Family::Effects, .label = "Contrast", .help = "Raises or lowers the contrast.",
     .example = "contrast 15", .parameters = kContrast, .works = Works::Point, .point = Contrast},
    {.name = "gamma", .family = Family::Effects, .label = "Gamma", .help = "Brightens or darkens midtones; black and white stay.",
     .example = "gamma 1.2", .parameters = kGamma, .works = Works::Point, .point = Gamma},
    {.name = "invert", .family = Family::Effects, .label = "Invert", .help = "Turns a picture into its negative.",
     .example = "invert", .parameters = {}, .works = Works::Point, .point = Invert},
    {.name = "gray", .family = Family::Effects, .label = "Gray", .help = "Replaces colors by their brightness.",
     .example = "gray", .parameters = {}, .works = Works::Point, .point = Gray},
};

}  // namespace

std::span<const Operation> EffectOperations() { return kEffects; }

}  // namespace fotomill
