#include <algorithm>
#include <cmath>

#include "metadata/exif/picture_exif.h"
#include "operations/area.h"
#include "operations/backdrop.h"
#include "operations/gravity.h"
#include "operations/operations.h"
#include "processing/geometry/canvas.h"
#include "processing/geometry/cut.h"
#include "processing/geometry/orient.h"
#include "processing/geometry/rotate.h"
#include "processing/geometry/scale.h"
#include "processing/geometry/skew.h"

// Transform: size and orientation of whole pictures.
namespace fotomill {

namespace {

using enum ParameterKind;

enum class Mode : int32_t { Fit, Fill, Stretch, Pad };
enum class Only : int32_t { Shrink, Grow };
constexpr ScaleFilter kFilters[] = {ScaleFilter::Nearest,  ScaleFilter::Box,
                                    ScaleFilter::Bilinear, ScaleFilter::Bicubic,
                                    ScaleFilter::Mitchell, ScaleFilter::Lanczos};

constexpr Parameter kResize[] = {
    {.name = "size",
     .kind = kSize,
     .unit = "px",
     .least = 0.0001,
     .most = 1e9,
     .label = "Size",
     .help = "WxH, Wx or xH; or one value for the longest edge, in pixels, percent, cm, mm or in."},
    {.name = "mode",
     .kind = kChoice,
     .preset = "fit",
     .choices = "fit|fill|stretch|pad",
     .label = "Mode",
     .help = "fit: scale to fit within the size; fill: cover the size and crop the rest; stretch: ignore proportions; pad: fit and add a background."},
    {.name = "filter",
     .kind = kChoice,
     .preset = "bicubic",
     .choices = "nearest|box|triangle|bicubic|mitchell|lanczos3",
     .label = "Filter",
     .help = "Resampling filter.",
     .key = "ResizeFilter",
     .keyWords = "bicubic|lanczos3|triangle|nearest"},
    {.name = "only",
     .kind = kChoice,
     .preset = "",
     .choices = "shrink|grow",
     .label = "Only",
     .help = "shrink: never enlarge; grow: never reduce."},
    {.name = "linear",
     .kind = kFlag,
     .preset = "no",
     .label = "Linear light",
     .help = "Computes in linear light instead of sRGB values: slower, but fine bright details keep their brightness."},
    {.name = "background",
     .kind = kColor,
     .preset = "#ffffff",
     .label = "Background",
     .help = "Background color for mode=pad.",
     .key = "AlphaBackground"},
};

int32_t Whole(double pixels) {
  return static_cast<int32_t>(std::floor(std::clamp(pixels, 1.0, 2147483646.0) + 0.5));
}

// The result of `resize`: size of the scaled picture, and of the final one.
struct Target {
  Size scaled, result;
};

// Scales both edges proportionally to fit into (or cover) a box.
Size Proportional(Size picture, double width, double height, bool cover) {
  const double across = width / picture.width, down = height / picture.height;
  const bool byWidth = cover ? across >= down : across <= down;
  return byWidth ? Size{Whole(width), Whole(picture.height * width / picture.width)}
                 : Size{Whole(picture.width * height / picture.height), Whole(height)};
}

Target TargetOf(const Value& wanted, Mode mode, Size picture, const PictureMetadata& metadata) {
  const double width = wanted.width.Pixels(picture.width, metadata.dpiX),
               height = wanted.height.Pixels(picture.height, metadata.dpiY);
  if (wanted.longestEdge) {
    if (wanted.width.unit == LengthUnit::Percent) {
      const Size scaled{Whole(width), Whole(wanted.width.Pixels(picture.height, 0))};
      return {scaled, scaled};
    }
    const double edge = picture.width >= picture.height
                            ? width
                            : wanted.width.Pixels(picture.height, metadata.dpiY);
    const Size scaled = Proportional(picture, edge, edge, false);
    return {scaled, scaled};
  }
  if (!wanted.hasHeight || !wanted.hasWidth) {
    const Size scaled = wanted.hasWidth
                            ? Size{Whole(width), Whole(picture.height * width / picture.width)}
                            : Size{Whole(picture.width * height / picture.height), Whole(height)};
    return {scaled, scaled};
  }
  const Size box{Whole(width), Whole(height)};
  if (mode == Mode::Stretch) return {box, box};
  const Size scaled = Proportional(picture, box.width, box.height, mode == Mode::Fill);
  return {scaled, mode == Mode::Fit ? scaled : box};
}

// Whether `only` prevents scaling.
bool IsKept(const Arguments& arguments, Size picture, Size scaled) {
  if (!arguments.Has("only")) return false;
  const bool grows = scaled.width > picture.width || scaled.height > picture.height;
  const bool shrinks = scaled.width < picture.width || scaled.height < picture.height;
  return arguments.Choice<Only>("only") == Only::Shrink ? grows : shrinks;
}

// A picture may be decoded at a reduced size that is still twice the result's: smooth filters give
// nearly the same result. Nearest and box select whole pixels, and light adds up differently than
// levels.
int32_t ResizeSide(const Arguments& arguments, Size whole, const PictureMetadata& metadata) {
  const ScaleFilter filter = kFilters[arguments.Choice("filter")];
  if (arguments.Flag("linear") || filter == ScaleFilter::Nearest || filter == ScaleFilter::Box)
    return 0;
  const Size scaled =
      TargetOf(arguments.Of("size"), arguments.Choice<Mode>("mode"), whole, metadata).scaled;
  if (IsKept(arguments, whole, scaled)) return 0;
  const double factor = std::max(static_cast<double>(scaled.width) / whole.width,
                                 static_cast<double>(scaled.height) / whole.height);
  return Whole(std::ceil(factor * std::max(whole.width, whole.height)));
}

Status Resize(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const Size whole = FullSizeOf(picture);
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
  const Size result{
      mode == Mode::Fill ? std::min(target.result.width, target.scaled.width) : target.result.width,
      mode == Mode::Fill ? std::min(target.result.height, target.scaled.height)
                         : target.result.height};
  if (mode == Mode::Fill)
    return CutPicture(picture, PlaceWithin(target.scaled, result, Gravity::Center));
  if (mode != Mode::Pad) return Status::Ok;
  const Size padded{std::max(result.width, target.scaled.width),
                    std::max(result.height, target.scaled.height)};
  const Rectangle place = PlaceWithin(padded, target.scaled, Gravity::Center);
  return PlaceOnCanvas(picture, padded, place.x, place.y,
                       BackdropOf(arguments.Color("background")));
}

constexpr Parameter kBackground = {.name = "background",
                                   .kind = kColor,
                                   .preset = "#ffffff",
                                   .label = "Background",
                                   .help = "Color of the areas the picture does not cover.",
                                   .key = "AlphaBackground"};
constexpr Parameter kGrow = {
    .name = "mode",
    .kind = kChoice,
    .preset = "grow",
    .choices = "grow|keep",
    .label = "Mode",
    .help = "grow: enlarge the canvas to hold the whole picture; keep: keep its size."};
constexpr Parameter kSampling = {.name = "filter",
                                 .kind = kChoice,
                                 .preset = "bicubic",
                                 .choices = "bicubic|bilinear|nearest",
                                 .label = "Filter",
                                 .help = "Resampling filter."};
constexpr Parameter kRotate[] = {
    {.name = "angle", .kind = kAngle, .unit = "degrees", .least = -360, .most = 360, .label = "Angle",
     .help = "Clockwise. Multiples of 90 are lossless."},
    kBackground, kGrow, kSampling,
};

WarpOptions SamplingOf(const Arguments& arguments) {
  return {.filter = arguments.Choice<WarpFilter>("filter"),
          .edgesRepeat = false,
          .backdrop = BackdropOf(arguments.Color("background"))};
}

Status Rotate(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return RotatePicture(picture, arguments.Number("angle"), arguments.Choice("mode") == 0,
                       SamplingOf(arguments), context.work);
}

constexpr Parameter kStraighten[] = {
    {.name = "angle", .kind = kAngle, .unit = "degrees", .least = -45, .most = 45, .label = "Angle", .help = "Clockwise."},
    kSampling,
};

Status Straighten(PictureRecord& picture, const Arguments& arguments,
                  const OperationContext& context) {
  return StraightenPicture(picture, arguments.Number("angle"),
                           arguments.Choice<WarpFilter>("filter"), context.work);
}

constexpr Parameter kDeskew[] = {
    {.name = "most", .kind = kAngle, .unit = "degrees", .preset = "15", .least = 0.1, .most = 45, .label = "At most",
     .help = "The largest angle to correct."},
    kBackground,
    {.name = "mode", .kind = kChoice, .preset = "keep", .choices = "grow|keep", .label = "Mode",
     .help = "grow: enlarge the canvas to hold the whole picture; keep: keep its size."},
    kSampling,
};

Status Deskew(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  double angle = 0;
  RETURN_IF_BAD(FindSkew(picture, arguments.Number("most"), context.work, angle));
  if (angle == 0) return Status::Ok;
  return RotatePicture(picture, -angle, arguments.Choice("mode") == 0, SamplingOf(arguments),
                       context.work);
}

constexpr Parameter kShear[] = {
    {.name = "across", .kind = kAngle, .unit = "degrees", .preset = "0", .least = -80, .most = 80, .label = "Across",
     .help = "Horizontal shear: positive values move the bottom to the right."},
    {.name = "down", .kind = kAngle, .unit = "degrees", .preset = "0", .least = -80, .most = 80, .label = "Down",
     .help = "Vertical shear, applied after that: positive values move the right side down."},
    kBackground, kSampling,
};

Status Shear(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return ShearPicture(picture, arguments.Number("across"), arguments.Number("down"),
                      SamplingOf(arguments), context.work);
}

constexpr Parameter kPerspective[] = {
    {.name = "top-left",
     .kind = kPoint,
     .unit = "px",
     .preset = "0,0",
     .label = "Top left",
     .help = "The point of the picture that becomes this corner."},
    {.name = "top-right",
     .kind = kPoint,
     .unit = "px",
     .preset = "100%,0",
     .label = "Top right",
     .help = "The point of the picture that becomes this corner."},
    {.name = "bottom-right",
     .kind = kPoint,
     .unit = "px",
     .preset = "100%,100%",
     .label = "Bottom right",
     .help = "The point of the picture that becomes this corner."},
    {.name = "bottom-left",
     .kind = kPoint,
     .unit = "px",
     .preset = "0,100%",
     .label = "Bottom left",
     .help = "The point of the picture that becomes this corner."},
    {.name = "size",
     .kind = kSize,
     .unit = "px",
     .preset = "",
     .least = 0.0001,
     .most = 1e9,
     .label = "Size",
     .help = "WxH, Wx or xH of the result, or one value for both edges (default: the longer edges between the points)."},
    kBackground,
    kSampling,
};

Status Perspective(PictureRecord& picture, const Arguments& arguments,
                   const OperationContext& context) {
  constexpr const char* kNames[] = {"top-left", "top-right", "bottom-right", "bottom-left"};
  const PictureMetadata& metadata = picture.metadata;
  const Size whole{picture.image.Width(), picture.image.Height()};
  Corner corners[4];
  for (size_t i = 0; i < 4; ++i) {
    const AreaPoint point = PointOf(arguments.Of(kNames[i]), whole, metadata);
    corners[i] = {point.x, point.y};
  }
  Size size{0, 0};
  if (arguments.Has("size")) {
    const Value& wanted = arguments.Of("size");
    const Length& down = wanted.longestEdge ? wanted.width : wanted.height;
    if (wanted.hasWidth || wanted.longestEdge)
      size.width = Whole(wanted.width.Pixels(whole.width, metadata.dpiX));
    if (wanted.hasHeight || wanted.longestEdge)
      size.height = Whole(down.Pixels(whole.height, metadata.dpiY));
  }
  return UnwarpPicture(picture, corners, size, SamplingOf(arguments), context.work);
}

constexpr Parameter kOffset[] = {
    {.name = "x", .kind = kLength, .unit = "px", .preset = "50%", .label = "Right", .help = "Distance to the right."},
    {.name = "y", .kind = kLength, .unit = "px", .preset = "50%", .label = "Down", .help = "Distance downward."},
};

Status Offset(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  return WrapPicture(picture, arguments.Pixels("x", picture.image.Width(), picture.metadata.dpiX),
                     arguments.Pixels("y", picture.image.Height(), picture.metadata.dpiY));
}

constexpr Parameter kFlip[] = {
    {.name = "direction", .kind = kChoice, .preset = "horizontal", .choices = "horizontal|vertical|both", .label = "Direction",
     .help = "horizontal mirrors left and right, vertical top and bottom."},
};

Status Flip(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  constexpr Orientation kWays[] = {Orientation::MirrorAcross, Orientation::MirrorDown,
                                   Orientation::HalfTurn};
  return OrientPicture(picture, kWays[arguments.Choice("direction")]);
}

Status Upright(PictureRecord& picture, const Arguments&, const OperationContext&) {
  return TurnUpright(picture);
}

bool Always(const Arguments&) { return true; }

bool IsQuarterTurn(const Arguments& arguments) {
  return std::fmod(arguments.Number("angle"), 90) == 0;
}

constexpr Operation kOperations[] = {
    {.name = "resize",
     .family = Family::Transform,
     .label = "Resize",
     .help = "Scales a picture to another size.",
     .example = "resize 800x600 filter=lanczos3",
     .parameters = kResize,
     .works = Works::Geometry,
     .apply = Resize,
     .decodedSide = ResizeSide},
    {.name = "rotate",
     .family = Family::Transform,
     .label = "Rotate",
     .help = "Rotates a picture clockwise.",
     .example = "rotate 7 background=black",
     .parameters = kRotate,
     .works = Works::Geometry,
     .apply = Rotate,
     .moves = IsQuarterTurn},
    {.name = "flip",
     .family = Family::Transform,
     .label = "Flip",
     .help = "Mirrors a picture.",
     .example = "flip vertical",
     .parameters = kFlip,
     .works = Works::Geometry,
     .apply = Flip,
     .moves = Always},
    {.name = "upright",
     .family = Family::Transform,
     .label = "Upright",
     .help = "Rotates a picture upright by its EXIF orientation.",
     .example = "upright",
     .parameters = {},
     .works = Works::Geometry,
     .apply = Upright,
     .moves = Always},
    {.name = "straighten",
     .family = Family::Transform,
     .label = "Straighten",
     .help = "Rotates a picture by a small angle and crops it to the largest upright rectangle.",
     .example = "straighten 2.5",
     .parameters = kStraighten,
     .works = Works::Geometry,
     .apply = Straighten},
    {.name = "deskew",
     .family = Family::Transform,
     .label = "Deskew",
     .help = "Detects the angle of a scanned page and straightens it.",
     .example = "deskew 10",
     .parameters = kDeskew,
     .works = Works::Geometry,
     .apply = Deskew},
    {.name = "shear",
     .family = Family::Transform,
     .label = "Shear",
     .help = "Slants a picture.",
     .example = "shear 10",
     .parameters = kShear,
     .works = Works::Geometry,
     .apply = Shear},
    {.name = "perspective",
     .family = Family::Transform,
     .label = "Perspective",
     .help =
         "Maps the area between four points to a rectangle, such as a sheet of paper in a photo.",
     .example = "perspective 10%,5% 90%,0 100%,100% 0,95%",
     .parameters = kPerspective,
     .works = Works::Geometry,
     .apply = Perspective},
    {.name = "offset",
     .family = Family::Transform,
     .label = "Offset",
     .help = "Shifts a picture; what leaves on one side reappears on the other.",
     .example = "offset 50% 0",
     .parameters = kOffset,
     .works = Works::Geometry,
     .apply = Offset,
     .moves = Always},
};

}  // namespace

std::span<const Operation> TransformOperations() { return kOperations; }

}  // namespace fotomill
