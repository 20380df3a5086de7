#include <algorithm>
#include <cmath>
#include <cstring>

#include "metadata/exif/picture_exif.h"
#include "operations/gravity.h"
#include "operations/operations.h"
#include "processing/geometry/cut.h"
#include "processing/geometry/orient.h"
#include "processing/geometry/scale.h"
#include "processing/promote.h"

// Transform: size and position of whole pictures.
namespace fotomill {

namespace {

using enum ParameterKind;

enum class Mode : int32_t { Fit, Fill, Stretch, Pad };
enum class Only : int32_t { Shrink, Grow };
constexpr ScaleFilter kFilters[] = {ScaleFilter::Nearest, ScaleFilter::Box,      ScaleFilter::Bilinear,
                                    ScaleFilter::Bicubic, ScaleFilter::Mitchell, ScaleFilter::Lanczos};

constexpr Parameter kResize[] = {
    {.name = "size", .kind = kSize, .unit = "px", .least = 0.0001, .most = 1e9, .label = "Size",
     .help = "WxH, Wx or xH; or one value for the longest edge, in pixels, percent, cm, mm or in."},
    {.name = "mode", .kind = kChoice, .preset = "fit", .choices = "fit|fill|stretch|pad", .label = "Mode",
     .help = "fit keeps the proportions within the size, fill crops what is too much, stretch ignores them, pad adds a background."},
    {.name = "filter", .kind = kChoice, .preset = "bicubic", .choices = "nearest|box|triangle|bicubic|mitchell|lanczos3",
     .label = "Filter", .help = "How pixels are computed from those around them.", .key = "ResizeFilter",
     .keyWords = "bicubic|lanczos3|triangle|nearest"},
    {.name = "only", .kind = kChoice, .preset = "", .choices = "shrink|grow", .label = "Only",
     .help = "shrink leaves pictures alone that are smaller, grow those that are larger."},
    {.name = "linear", .kind = kFlag, .preset = "no", .label = "Linear light",
     .help = "Computes with light instead of sRGB values: slower, and fine bright details keep their brightness."},
    {.name = "background", .kind = kColor, .preset = "#ffffff", .label = "Background",
     .help = "What pad fills the rest of the size with.", .key = "AlphaBackground"},
};

int32_t Whole(double pixels) { return static_cast<int32_t>(std::floor(std::clamp(pixels, 1.0, 2147483646.0) + 0.5)); }

// What `resize` aims at: the size of the scaled picture, and that of the result.
struct Target {
  Size scaled, result;
};

// Both edges of the picture scaled so that it fits into (or covers) a box.
Size Proportional(Size picture, double width, double height, bool cover) {
  const double across = width / picture.width, down = height / picture.height;
  const bool byWidth = cover ? across >= down : across <= down;
  return byWidth ? Size{Whole(width), Whole(picture.height * width / picture.width)}
                 : Size{Whole(picture.width * height / picture.height), Whole(height)};
}

Target TargetOf(const Value& wanted, Mode mode, Size picture, const PictureMetadata& metadata) {
  const double width = wanted.width.Pixels(picture.width, metadata.dpiX), height = wanted.height.Pixels(picture.height, metadata.dpiY);
  if (wanted.longestEdge) {
    if (wanted.width.unit == LengthUnit::Percent) {
      const Size scaled{Whole(width), Whole(wanted.width.Pixels(picture.height, 0))};
      return {scaled, scaled};
    }
    const double edge = picture.width >= picture.height ? width : wanted.width.Pixels(picture.height, metadata.dpiY);
    const Size scaled = Proportional(picture, edge, edge, false);
    return {scaled, scaled};
  }
  if (!wanted.hasHeight || !wanted.hasWidth) {
    const Size scaled = wanted.hasWidth ? Size{Whole(width), Whole(picture.height * width / picture.width)}
                                        : Size{Whole(picture.width * height / picture.height), Whole(height)};
    return {scaled, scaled};
  }
  const Size box{Whole(width), Whole(height)};
  if (mode == Mode::Stretch) return {box, box};
  const Size scaled = Proportional(picture, box.width, box.height, mode == Mode::Fill);
  return {scaled, mode == Mode::Fit ? scaled : box};
}

// Whether `only` keeps the picture from being scaled.
bool IsKept(const Arguments& arguments, Size picture, Size scaled) {
  if (!arguments.Has("only")) return false;
  const bool grows = scaled.width > picture.width || scaled.height > picture.height;
  const bool shrinks = scaled.width < picture.width || scaled.height < picture.height;
  return arguments.Choice<Only>("only") == Only::Shrink ? grows : shrinks;
}

// Puts the picture into the middle of a larger one of 24 bits; one that is transparent there gets an alpha plane.
Status PadPicture(PictureRecord& picture, Size size, const AlphaColor& color) {
  const Rectangle place = PlaceWithin(size, {picture.image.Width(), picture.image.Height()}, Gravity::Center);
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, image, platform::Fill::Zero));
  RETURN_IF_BAD(color.alpha < 255 ? PromoteToAlpha(picture) : PromotePicture(picture));
  const bool hasAlpha = !picture.alpha.Empty();
  if (hasAlpha) RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, alpha));
  for (int32_t y = 0; y < size.height; ++y) {
    uint8_t* bgr = image.Row(y).data();
    for (int32_t x = 0; x < size.width; ++x) {
      bgr[3 * x] = color.blue;
      bgr[3 * x + 1] = color.green;
      bgr[3 * x + 2] = color.red;
    }
    if (hasAlpha) std::memset(alpha.Row(y).data(), color.alpha, static_cast<size_t>(size.width));
    const int32_t source = y - place.y;
    if (source < 0 || source >= place.height) continue;
    std::memcpy(bgr + 3 * static_cast<size_t>(place.x), picture.image.Row(source).data(), 3 * static_cast<size_t>(place.width));
    if (hasAlpha) std::memcpy(alpha.Row(y).data() + place.x, picture.alpha.Row(source).data(), static_cast<size_t>(place.width));
  }
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  picture.width = size.width;
  picture.height = size.height;
  return Status::Ok;
}

Status Resize(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const Size whole{picture.image.Width(), picture.image.Height()};
  const auto mode = arguments.Choice<Mode>("mode");
  Target target = TargetOf(arguments.Of("size"), mode, whole, picture.metadata);
  if (IsKept(arguments, whole, target.scaled)) {
    target.scaled = whole;
    if (mode == Mode::Fit || mode == Mode::Stretch) return Status::Ok;
  }
  RETURN_IF_BAD(CheckPackedSize(target.scaled.width, target.scaled.height, 24));
  RETURN_IF_BAD(CheckPackedSize(target.result.width, target.result.height, 24));
  if (target.scaled.width != whole.width || target.scaled.height != whole.height) {
    RETURN_IF_BAD(ScalePicture(picture, target.scaled,
                               ScaleOptions{.filter = kFilters[arguments.Choice("filter")],
                                            .linear = arguments.Flag("linear"),
                                            .blocks = false,
                                            .work = context.work,
                                            .progress = picture.progress}));
  }
  const Size result{mode == Mode::Fill ? std::min(target.result.width, target.scaled.width) : target.result.width,
                    mode == Mode::Fill ? std::min(target.result.height, target.scaled.height) : target.result.height};
  if (mode == Mode::Fill) return CutPicture(picture, PlaceWithin(target.scaled, result, Gravity::Center));
  const bool pads = mode == Mode::Pad && (result.width > target.scaled.width || result.height > target.scaled.height);
  return pads ? PadPicture(picture, {std::max(result.width, target.scaled.width), std::max(result.height, target.scaled.height)},
                           arguments.Color("background"))
              : Status::Ok;
}

constexpr Parameter kRotate[] = {
    {.name = "angle", .kind = kAngle, .unit = "degrees", .least = -360, .most = 360, .label = "Angle",
     .help = "Clockwise."},
};

Status Rotate(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  constexpr Orientation kQuarters[] = {Orientation::Upright, Orientation::QuarterRight, Orientation::HalfTurn,
                                       Orientation::QuarterLeft};
  const auto quarters = static_cast<int32_t>(arguments.Number("angle") / 90);
  return OrientPicture(picture, kQuarters[(quarters % 4 + 4) % 4]);
}

ArgumentProblem CheckRotate(const Arguments& arguments) {
  if (std::fmod(arguments.Number("angle"), 90) == 0) return {};
  return {"angle", "must be a multiple of 90"};
}

constexpr Parameter kFlip[] = {
    {.name = "direction", .kind = kChoice, .preset = "horizontal", .choices = "horizontal|vertical|both", .label = "Direction",
     .help = "horizontal mirrors left and right, vertical top and bottom."},
};

Status Flip(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  constexpr Orientation kWays[] = {Orientation::MirrorAcross, Orientation::MirrorDown, Orientation::HalfTurn};
  return OrientPicture(picture, kWays[arguments.Choice("direction")]);
}

Status Upright(PictureRecord& picture, const Arguments&, const OperationContext&) { return TurnUpright(picture); }

constexpr Operation kOperations[] = {
    {.name = "resize", .family = Family::Transform, .label = "Resize", .help = "Scales a picture to another size.",
     .example = "resize 800x600 filter=lanczos3", .parameters = kResize, .works = Works::Geometry, .apply = Resize},
    {.name = "rotate", .family = Family::Transform, .label = "Rotate", .help = "Rotates a picture clockwise.",
     .example = "rotate 90", .parameters = kRotate, .works = Works::Geometry, .apply = Rotate, .check = CheckRotate},
    {.name = "flip", .family = Family::Transform, .label = "Flip", .help = "Mirrors a picture.", .example = "flip vertical",
     .parameters = kFlip, .works = Works::Geometry, .apply = Flip},
    {.name = "upright", .family = Family::Transform, .label = "Upright",
     .help = "Rotates a picture as its EXIF orientation says.", .example = "upright", .parameters = {},
     .works = Works::Geometry, .apply = Upright},
};

}  // namespace

std::span<const Operation> TransformOperations() { return kOperations; }

}  // namespace fotomill
