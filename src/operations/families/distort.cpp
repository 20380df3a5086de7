#include <algorithm>

#include "operations/area.h"
#include "operations/operations.h"
#include "processing/filters/scatter.h"
#include "processing/geometry/distort.h"

// Filters that displace pixels.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr Parameter kSeed = {.name = "seed",
                             .kind = kInteger,
                             .preset = "1",
                             .least = 0,
                             .most = 2147483647,
                             .label = "Seed",
                             .help = "Another number gives another pattern."};
constexpr Parameter kNoise[] = {
    {.name = "kind", .kind = kChoice, .preset = "gaussian", .choices = "uniform|gaussian|salt-pepper", .label = "Kind",
     .help = "Distribution: uniform, Gaussian, or single pixels set to black and white."},
    {.name = "amount", .kind = kPercent, .unit = "%", .preset = "10", .least = 0, .most = 100, .label = "Amount",
     .help = "The largest change, the standard deviation, or the share of pixels."},
    kSeed,
    {.name = "gray", .kind = kFlag, .preset = "no", .label = "Gray", .help = "Changes brightness only, not color."},
};

Status Noise(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return AddNoise(picture,
                  {.kind = arguments.Choice<NoiseKind>("kind"),
                   .amount = arguments.Number("amount"),
                   .gray = arguments.Flag("gray"),
                   .seed = static_cast<uint32_t>(arguments.Integer("seed")),
                   .left = context.left,
                   .top = context.top},
                  context.work);
}
int32_t NoReach(const Arguments&) { return 0; }

constexpr Parameter kSpread[] = {
    {.name = "radius", .kind = kInteger, .unit = "px", .preset = "3", .least = 0, .most = 1000, .label = "Radius", .help = "How far pixels move."},
    kSeed,
};

Status Spread(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return SpreadPicture(picture, arguments.Integer("radius"),
                       static_cast<uint32_t>(arguments.Integer("seed")), context.left, context.top,
                       context.work);
}
int32_t ReachOfSpread(const Arguments& arguments) { return arguments.Integer("radius"); }

constexpr Parameter kAmplitude = {.name = "amplitude",
                                  .kind = kNumber,
                                  .unit = "px",
                                  .preset = "10",
                                  .least = -1000,
                                  .most = 1000,
                                  .label = "Amplitude",
                                  .help = "How far pixels move."};
constexpr Parameter kWavelength = {.name = "wavelength",
                                   .kind = kNumber,
                                   .unit = "px",
                                   .preset = "50",
                                   .least = 1,
                                   .most = 100000,
                                   .label = "Wavelength",
                                   .help = "From crest to crest."};
constexpr Parameter kCenter = {.name = "center",
                               .kind = kPoint,
                               .unit = "px",
                               .preset = "50%,50%",
                               .label = "Center",
                               .help = "Center of the effect."};
constexpr Parameter kRadius = {.name = "radius",
                               .kind = kLength,
                               .unit = "px",
                               .preset = "50%",
                               .least = 0.001,
                               .most = 1e9,
                               .label = "Radius",
                               .help = "Radius of the effect; percentages refer to the shorter edge."};

AreaPoint CenterOf(const PictureRecord& picture, const Arguments& arguments,
                   const OperationContext& context) {
  const Size own{picture.image.Width(), picture.image.Height()};
  return PointOf(arguments.Of("center"), context.whole.width > 0 ? context.whole : own,
                 picture.metadata);
}

double RadiusOf(const PictureRecord& picture, const Arguments& arguments) {
  const int32_t edge = std::min(picture.image.Width(), picture.image.Height());
  return std::max(arguments.Of("radius").x.Pixels(edge, picture.metadata.dpiX), 0.001);
}

int32_t ReachOfWave(const Arguments& arguments) { return WaveReach(arguments.Number("amplitude")); }

constexpr Parameter kRipple[] = {kAmplitude, kWavelength, kCenter};

Status Ripple(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const AreaPoint center = CenterOf(picture, arguments, context);
  return RipplePicture(picture, arguments.Number("amplitude"), arguments.Number("wavelength"),
                       center.x, center.y, {context.left, context.top}, context.work);
}

constexpr Parameter kWave[] = {
    kAmplitude, kWavelength,
    {.name = "direction", .kind = kChoice, .preset = "vertical", .choices = "vertical|horizontal", .label = "Direction",
     .help = "vertical moves columns up and down, horizontal rows left and right."},
};

Status Wave(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return WavePicture(picture, arguments.Number("amplitude"), arguments.Number("wavelength"),
                     arguments.Choice("direction") == 0, {context.left, context.top}, context.work);
}

constexpr Parameter kSwirl[] = {
    {.name = "angle", .kind = kAngle, .unit = "degrees", .preset = "90", .least = -3600, .most = 3600, .label = "Angle",
     .help = "Rotation at the center, clockwise."},
    kRadius, kCenter,
};

Status Swirl(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const AreaPoint center = CenterOf(picture, arguments, context);
  return SwirlPicture(picture, arguments.Number("angle"), center.x, center.y,
                      RadiusOf(picture, arguments), context.work);
}

constexpr Parameter kBulge[] = {
    {.name = "amount", .kind = kPercent, .unit = "%", .preset = "50", .least = -100, .most = 100, .label = "Amount",
     .help = "How much the center is enlarged; below 0 it shrinks."},
    kRadius, kCenter,
};

Status Bulge(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const AreaPoint center = CenterOf(picture, arguments, context);
  return BulgePicture(picture, arguments.Number("amount") / 100, center.x, center.y,
                      RadiusOf(picture, arguments), context.work);
}

constexpr Operation kOperations[] = {
    {.name = "noise",
     .family = Family::Filter,
     .label = "Noise",
     .help = "Adds noise.",
     .example = "noise gaussian 5%",
     .parameters = kNoise,
     .works = Works::Neighborhood,
     .apply = Noise,
     .reach = NoReach},
    {.name = "spread",
     .family = Family::Filter,
     .label = "Spread",
     .help = "Picks pixels from nearby at random, like frosted glass.",
     .example = "spread 4",
     .parameters = kSpread,
     .works = Works::Neighborhood,
     .apply = Spread,
     .reach = ReachOfSpread},
    {.name = "ripple",
     .family = Family::Filter,
     .label = "Ripple",
     .help = "Distorts the picture like rings on water.",
     .example = "ripple 3 20",
     .parameters = kRipple,
     .works = Works::Neighborhood,
     .apply = Ripple,
     .reach = ReachOfWave},
    {.name = "wave",
     .family = Family::Filter,
     .label = "Wave",
     .help = "Shifts columns or rows along a sine wave.",
     .example = "wave 4 30",
     .parameters = kWave,
     .works = Works::Neighborhood,
     .apply = Wave,
     .reach = ReachOfWave},
    {.name = "swirl",
     .family = Family::Filter,
     .label = "Swirl",
     .help = "Twists a picture around a center.",
     .example = "swirl 120",
     .parameters = kSwirl,
     .works = Works::WholePicture,
     .apply = Swirl},
    {.name = "bulge",
     .family = Family::Filter,
     .label = "Bulge",
     .help = "Enlarges or shrinks the center like a lens.",
     .example = "bulge -40%",
     .parameters = kBulge,
     .works = Works::WholePicture,
     .apply = Bulge},
};

}  // namespace

std::span<const Operation> DistortOperations() { return kOperations; }

}  // namespace fotomill
