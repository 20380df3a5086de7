#include <charconv>
#include <cmath>
#include <cstring>
#include <optional>
#include <vector>

#include "operations/operations.h"
#include "processing/color/histogram_effects.h"
#include "processing/color/mix.h"
#include "processing/color/tone.h"
#include "processing/color/vignette.h"
#include "processing/promote.h"

// Effects: per-pixel changes of color and brightness.
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

constexpr Parameter kLevels[] = {
    {.name = "black", .kind = kNumber, .unit = "levels", .preset = "0", .least = 0, .most = 254, .label = "Black",
     .help = "The level that becomes black."},
    {.name = "white", .kind = kNumber, .unit = "levels", .preset = "255", .least = 1, .most = 255, .label = "White",
     .help = "The level that becomes white."},
    {.name = "gamma", .kind = kNumber, .preset = "1", .least = 0.01, .most = 100, .label = "Gamma",
     .help = "Above 1 brightens midtones, below 1 darkens them."},
    {.name = "out-black", .kind = kNumber, .unit = "levels", .preset = "0", .least = 0, .most = 255, .label = "Output black",
     .help = "What black becomes."},
    {.name = "out-white", .kind = kNumber, .unit = "levels", .preset = "255", .least = 0, .most = 255, .label = "Output white",
     .help = "What white becomes."},
};
constexpr Parameter kCurves[] = {
    {.name = "points", .kind = kCurve, .preset = "0,0 255,255", .label = "Curve",
     .help = "Points of the curve: old level, new level."},
    {.name = "channel", .kind = kChoice, .preset = "all", .choices = "all|red|green|blue", .label = "Channel",
     .help = "Which channels change."},
};
constexpr Parameter kAutoLevels[] = {
    {.name = "clip", .kind = kPercent, .unit = "%", .preset = "0.1", .least = 0, .most = 49, .label = "Clip",
     .help = "Share of the pixels that may become pure black, and pure white."},
    {.name = "mode", .kind = kChoice, .preset = "each", .choices = "each|together", .label = "Channels", .help = "each stretches every channel separately; together keeps hues."},
};
constexpr Parameter kEqualize[] = {
    {.name = "mode", .kind = kChoice, .preset = "each", .choices = "each|together", .label = "Channels",
     .help = "each equalizes every channel separately; together keeps grays gray."},
};
constexpr Parameter kSaturation[] = {
    {.name = "s", .kind = kPercent, .unit = "%", .preset = "100", .least = 0, .most = 400, .label = "Saturation",
     .help = "0 makes a picture gray, 100 changes nothing."},
};
constexpr Parameter kHue[] = {
    {.name = "angle", .kind = kAngle, .unit = "degrees", .preset = "0", .least = -360, .most = 360, .label = "Angle",
     .help = "120 turns red into green, green into blue, blue into red."},
};
constexpr Parameter kTemperature[] = {
    {.name = "t", .kind = kNumber, .unit = "%", .preset = "0", .least = -100, .most = 100, .label = "Temperature",
     .help = "Above 0 is warmer, below 0 colder."},
};
constexpr Parameter kTint[] = {
    {.name = "color", .kind = kColor, .preset = "#ff8800", .label = "Color", .help = "The color to mix in."},
    {.name = "amount", .kind = kPercent, .unit = "%", .preset = "30", .least = 0, .most = 100, .label = "Amount",
     .help = "Share of the color."},
};
constexpr Parameter kSepia[] = {
    {.name = "amount", .kind = kPercent, .unit = "%", .preset = "100", .least = 0, .most = 100, .label = "Amount",
     .help = "Share of the effect; at 0 the colors stay."},
};
constexpr Parameter kThreshold[] = {
    {.name = "t", .kind = kInteger, .unit = "levels", .preset = "128", .least = 0, .most = 256, .label = "Threshold",
     .help = "The darkest brightness that becomes white."},
};
constexpr Parameter kPosterize[] = {
    {.name = "n", .kind = kInteger, .preset = "4", .least = 2, .most = 256, .label = "Levels",
     .help = "Number of levels left in each channel."},
};
constexpr Parameter kSolarize[] = {
    {.name = "t", .kind = kInteger, .unit = "levels", .preset = "128", .least = 0, .most = 256, .label = "Threshold",
     .help = "The darkest level that is inverted."},
};
constexpr Parameter kColorize[] = {
    {.name = "color", .kind = kColor, .preset = "#b08040", .label = "Color", .help = "What middle gray becomes."},
    {.name = "dark", .kind = kColor, .preset = "#000000", .label = "Dark", .help = "What black becomes."},
    {.name = "light", .kind = kColor, .preset = "#ffffff", .label = "Light", .help = "What white becomes."},
};
constexpr Parameter kChannels[] = {
    {.name = "keep",
     .kind = kChoice,
     .preset = "",
     .choices = "red|green|blue|alpha",
     .label = "Keep",
     .help = "Shows one channel in gray; alpha is removed."},
    {.name = "swap",
     .kind = kChoice,
     .preset = "",
     .choices = "red-green|red-blue|green-blue",
     .label = "Swap",
     .help = "Exchanges two channels."},
    {.name = "mix",
     .kind = kText,
     .preset = "",
     .most = 200,
     .label = "Mix",
     .help = "Nine percentages: shares of red, green and blue in the new red, then in green, then "
             "in blue."},
};
constexpr Parameter kVignette[] = {
    {.name = "amount", .kind = kPercent, .unit = "%", .preset = "50", .least = 0, .most = 100, .label = "Amount",
     .help = "Share of the color in the corners."},
    {.name = "size", .kind = kPercent, .unit = "%", .preset = "40", .least = 0, .most = 99, .label = "Size",
     .help = "Share of the distance from center to corners that stays unchanged."},
    {.name = "color", .kind = kColor, .preset = "#000000", .label = "Color", .help = "What the edges fade into."},
};

void Brightness(const Arguments& arguments, PointEffect& effect) {
  effect = BrightnessEffect(arguments.Number("b"));
}
void Contrast(const Arguments& arguments, PointEffect& effect) {
  effect = ContrastEffect(arguments.Number("c"));
}
void Gamma(const Arguments& arguments, PointEffect& effect) {
  effect = GammaEffect(arguments.Number("g"));
}
void Invert(const Arguments&, PointEffect& effect) { effect = InvertEffect(); }
void Gray(const Arguments&, PointEffect& effect) { effect = GrayEffect(); }
void Saturation(const Arguments& arguments, PointEffect& effect) {
  effect = SaturationEffect(arguments.Number("s") / 100);
}
void Hue(const Arguments& arguments, PointEffect& effect) {
  effect = HueEffect(arguments.Number("angle"));
}
void Temperature(const Arguments& arguments, PointEffect& effect) {
  effect = TemperatureEffect(arguments.Number("t"));
}
void Sepia(const Arguments& arguments, PointEffect& effect) {
  effect = SepiaEffect(arguments.Number("amount") / 100);
}
void Threshold(const Arguments& arguments, PointEffect& effect) {
  effect = ThresholdEffect(arguments.Integer("t"));
}
void Posterize(const Arguments& arguments, PointEffect& effect) {
  effect = PosterizeEffect(arguments.Integer("n"));
}
void Solarize(const Arguments& arguments, PointEffect& effect) {
  effect = SolarizeEffect(arguments.Number("t"));
}

void LevelsOf(const Arguments& arguments, PointEffect& effect) {
  effect = LevelsEffect({.black = arguments.Number("black"),
                         .white = arguments.Number("white"),
                         .gamma = arguments.Number("gamma"),
                         .outBlack = arguments.Number("out-black"),
                         .outWhite = arguments.Number("out-white")});
}

ArgumentProblem CheckLevels(const Arguments& arguments) {
  if (arguments.Number("black") < arguments.Number("white")) return {};
  return {"white", TrRecorded("must be above black")};
}

void Curves(const Arguments& arguments, PointEffect& effect) {
  std::vector<CurveKnot> knots;
  for (const CurvePoint& point : arguments.Of("points").points) knots.push_back({point.x, point.y});
  effect = CurveEffect(knots, arguments.Choice<CurveChannel>("channel"));
}

// Effects have no use for transparent colors.
ArgumentProblem CheckOpaque(const Arguments& arguments) {
  for (size_t i = 0; i < arguments.Rows().size(); ++i) {
    const Parameter& row = arguments.Rows()[i];
    if (row.kind == kColor && arguments.At(i).color.alpha < 255)
      return {row.name, TrRecorded("must be a color without transparency")};
  }
  return {};
}

BgrColor BgrOf(const AlphaColor& color) { return {color.blue, color.green, color.red}; }

void Tint(const Arguments& arguments, PointEffect& effect) {
  effect = TintEffect(BgrOf(arguments.Color("color")), arguments.Number("amount"));
}

void Colorize(const Arguments& arguments, PointEffect& effect) {
  effect = ColorizeEffect(BgrOf(arguments.Color("color")), BgrOf(arguments.Color("dark")),
                          BgrOf(arguments.Color("light")));
}

enum class Mode : int32_t { Each, Together };

Status CountForMode(const PictureRecord& picture, const Arguments& arguments, const Work& work,
                    LevelCounts& counts) {
  RETURN_IF_BAD(CountLevels(picture, work, counts));
  if (arguments.Choice<Mode>("mode") == Mode::Together) counts = TogetherCounts(counts);
  return Status::Ok;
}

Status AutoLevels(PictureRecord& picture, const Arguments& arguments,
                  const OperationContext& context) {
  LevelCounts counts;
  RETURN_IF_BAD(CountForMode(picture, arguments, context.work, counts));
  const PointEffect effect = StretchEffect(counts, arguments.Number("clip"));
  return ApplyPointEffects(picture, std::span(&effect, 1), context.work);
}

Status Equalize(PictureRecord& picture, const Arguments& arguments,
                const OperationContext& context) {
  LevelCounts counts;
  RETURN_IF_BAD(CountForMode(picture, arguments, context.work, counts));
  const PointEffect effect = EqualizeEffect(counts);
  return ApplyPointEffects(picture, std::span(&effect, 1), context.work);
}

// Parses nine percentages, separated by blanks or commas, as factors.
std::optional<MixMatrix> ReadMix(std::string_view text) {
  MixMatrix matrix{};
  size_t count = 0;
  const auto isGap = [](char c) { return c == ' ' || c == ','; };
  while (!text.empty()) {
    if (isGap(text[0])) {
      text.remove_prefix(1);
      continue;
    }
    double number = 0;
    const auto [end, error] =
        std::from_chars(text.data(), text.data() + text.size(), number, std::chars_format::fixed);
    text.remove_prefix(static_cast<size_t>(end - text.data()));
    const bool ends = text.empty() || isGap(text[0]);
    if (error != std::errc() || !ends || !(std::abs(number) <= 200) || count == 9)
      return std::nullopt;
    matrix[count / 3][count % 3] = number / 100;
    ++count;
  }
  return count == 9 ? std::optional(matrix) : std::nullopt;
}

ArgumentProblem CheckChannels(const Arguments& arguments) {
  const int given = arguments.Has("keep") + arguments.Has("swap") + arguments.Has("mix");
  if (given != 1)
    return {"keep", TrRecorded("must be given, or swap or mix, and only one of them")};
  if (!arguments.Has("mix") || ReadMix(arguments.Text("mix"))) return {};
  return {"mix",
          TrRecorded("must be nine numbers from -200 to 200, such as \"100 0 0 0 100 0 0 0 100\"")};
}

// Replaces the picture with its alpha plane in gray; white if it has none.
Status KeepAlpha(PictureRecord& picture) {
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width();
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    uint8_t* bgr = picture.image.Row(y).data();
    const uint8_t* alpha = picture.alpha.Empty() ? nullptr : picture.alpha.Row(y).data();
    for (int32_t x = 0; x < width; ++x, bgr += 3)
      std::memset(bgr, alpha != nullptr ? alpha[x] : 255, 3);
  }
  picture.alpha.Free();
  picture.alphaFlags &= static_cast<uint8_t>(~kHasAlpha);
  return Status::Ok;
}

Status Channels(PictureRecord& picture, const Arguments& arguments,
                const OperationContext& context) {
  constexpr int32_t kAlpha = 3;
  if (picture.image.Empty()) return Status::EmptyImage;
  if (arguments.Has("keep") && arguments.Choice("keep") == kAlpha) return KeepAlpha(picture);
  PointEffect effect;
  if (arguments.Has("keep")) {
    effect = KeepEffect(arguments.Choice<KeptChannel>("keep"));
  } else if (arguments.Has("swap")) {
    effect = SwapEffect(arguments.Choice<SwappedChannels>("swap"));
  } else {
    effect = MixEffect(ReadMix(arguments.Text("mix")).value_or(MixMatrix{}));
  }
  return ApplyPointEffects(picture, std::span(&effect, 1), context.work);
}

// Uses no neighbors; but the engine must pass the position of a part.
int32_t NoReach(const Arguments&) { return 0; }

Status Vignetted(PictureRecord& picture, const Arguments& arguments,
                 const OperationContext& context) {
  return ApplyVignette(picture,
                       {.amount = arguments.Number("amount") / 100,
                        .size = arguments.Number("size") / 100,
                        .color = BgrOf(arguments.Color("color")),
                        .left = context.left,
                        .top = context.top,
                        .whole = context.whole},
                       context.work);
}

constexpr Operation kEffects[] = {
    {.name = "brightness",
     .family = Family::Effects,
     .label = "Brightness",
     .help = "Makes a picture brighter or darker.",
     .example = "brightness 10",
     .parameters = kBrightness,
     .works = Works::Point,
     .point = Brightness},
    {.name = "contrast",
     .family = Family::Effects,
     .label = "Contrast",
     .help = "Raises or lowers the contrast.",
     .example = "contrast 15",
     .parameters = kContrast,
     .works = Works::Point,
     .point = Contrast},
    {.name = "gamma",
     .family = Family::Effects,
     .label = "Gamma",
     .help = "Brightens or darkens midtones; black and white stay.",
     .example = "gamma 1.2",
     .parameters = kGamma,
     .works = Works::Point,
     .point = Gamma},
    {.name = "levels",
     .family = Family::Effects,
     .label = "Levels",
     .help = "Sets which levels become black and white.",
     .example = "levels 10 240 gamma=1.1",
     .parameters = kLevels,
     .works = Works::Point,
     .point = LevelsOf,
     .check = CheckLevels},
    {.name = "curves",
     .family = Family::Effects,
     .label = "Curves",
     .help = "Changes levels by a smooth curve through points.",
     .example = "curves \"0,0 64,50 192,210 255,255\"",
     .parameters = kCurves,
     .works = Works::Point,
     .point = Curves},
    {.name = "auto-levels",
     .family = Family::Effects,
     .label = "Auto levels",
     .help = "Spreads the levels from black to white.",
     .example = "auto-levels",
     .parameters = kAutoLevels,
     .works = Works::WholePicture,
     .apply = AutoLevels},
    {.name = "equalize",
     .family = Family::Effects,
     .label = "Equalize",
     .help = "Spreads the levels so that all are about equally frequent.",
     .example = "equalize",
     .parameters = kEqualize,
     .works = Works::WholePicture,
     .apply = Equalize},
    {.name = "saturation",
     .family = Family::Effects,
     .label = "Saturation",
     .help = "Makes colors stronger or weaker.",
     .example = "saturation 130",
     .parameters = kSaturation,
     .works = Works::Point,
     .point = Saturation},
    {.name = "hue",
     .family = Family::Effects,
     .label = "Hue",
     .help = "Rotates all hues on the color wheel.",
     .example = "hue 30",
     .parameters = kHue,
     .works = Works::Point,
     .point = Hue},
    {.name = "temperature",
     .family = Family::Effects,
     .label = "Temperature",
     .help = "Makes a picture warmer or colder.",
     .example = "temperature 20",
     .parameters = kTemperature,
     .works = Works::Point,
     .point = Temperature},
    {.name = "tint",
     .family = Family::Effects,
     .label = "Tint",
     .help = "Mixes a color into all others.",
     .example = "tint #ff8800 20%",
     .parameters = kTint,
     .works = Works::Point,
     .point = Tint,
     .check = CheckOpaque},
    {.name = "invert",
     .family = Family::Effects,
     .label = "Invert",
     .help = "Turns a picture into its negative.",
     .example = "invert",
     .parameters = {},
     .works = Works::Point,
     .point = Invert},
    {.name = "gray",
     .family = Family::Effects,
     .label = "Gray",
     .help = "Replaces colors with their brightness.",
     .example = "gray",
     .parameters = {},
     .works = Works::Point,
     .point = Gray},
    {.name = "sepia",
     .family = Family::Effects,
     .label = "Sepia",
     .help = "Gives a picture the brown tone of old photographs.",
     .example = "sepia",
     .parameters = kSepia,
     .works = Works::Point,
     .point = Sepia},
    {.name = "threshold",
     .family = Family::Effects,
     .label = "Threshold",
     .help = "Makes bright pixels white and dark ones black.",
     .example = "threshold 110",
     .parameters = kThreshold,
     .works = Works::Point,
     .point = Threshold},
    {.name = "posterize",
     .family = Family::Effects,
     .label = "Posterize",
     .help = "Reduces each channel to a few levels.",
     .example = "posterize 5",
     .parameters = kPosterize,
     .works = Works::Point,
     .point = Posterize},
    {.name = "solarize",
     .family = Family::Effects,
     .label = "Solarize",
     .help = "Inverts bright levels.",
     .example = "solarize 140",
     .parameters = kSolarize,
     .works = Works::Point,
     .point = Solarize},
    {.name = "colorize",
     .family = Family::Effects,
     .label = "Colorize",
     .help = "Replaces all colors with shades of one.",
     .example = "colorize #4070a0",
     .parameters = kColorize,
     .works = Works::Point,
     .point = Colorize,
     .check = CheckOpaque},
    {.name = "channels",
     .family = Family::Effects,
     .label = "Channels",
     .help = "Keeps, exchanges or mixes color channels.",
     .example = "channels swap=red-blue",
     .parameters = kChannels,
     .works = Works::Neighborhood,
     .apply = Channels,
     .reach = NoReach,
     .check = CheckChannels},
    {.name = "vignette",
     .family = Family::Effects,
     .label = "Vignette",
     .help = "Darkens the edges of a picture, or fades them into a color.",
     .example = "vignette 60",
     .parameters = kVignette,
     .works = Works::Neighborhood,
     .apply = Vignetted,
     .reach = NoReach,
     .check = CheckOpaque},
};

}  // namespace

std::span<const Operation> EffectOperations() { return kEffects; }

}  // namespace fotomill
