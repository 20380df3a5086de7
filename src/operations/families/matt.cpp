#include <algorithm>
#include <cmath>
#include <memory>

#include "drawing/shape_mask.h"
#include "operations/backdrop.h"
#include "operations/operations.h"
#include "operations/picture_file.h"
#include "processing/color/overlay.h"
#include "processing/filters/blur_mask.h"
#include "processing/flatten.h"
#include "processing/geometry/canvas.h"
#include "processing/geometry/cut.h"
#include "processing/promote.h"

// Mattes, borders and shadows around pictures.
namespace fotomill {

namespace {

using enum ParameterKind;

enum class Bevel : int32_t { Sunken, Raised, None };

// clang-format off
constexpr Parameter kMatt[] = {
    {.name = "size", .kind = kLength, .preset = "50", .least = 0, .most = 1e6, .label = "Size",
     .help = "Width of the matte; plain numbers count in units, percentages refer to the shorter edge.", .key = "MattSize"},
    {.name = "fill", .kind = kColor, .preset = "#ffffff", .label = "Color", .help = "Color of the matte.", .key = "MattFillColor"},
    {.name = "units", .kind = kChoice, .preset = "px", .choices = "in|cm|px", .label = "Units", .help = "Unit of plain numbers.",
     .key = "MattUnits", .keyWords = "in|cm|px"},
    {.name = "textured", .kind = kFlag, .preset = "no", .label = "Textured", .help = "Covers the matte with the texture.", .key = "MattUseTexture"},
    {.name = "texture", .kind = kFile, .preset = "", .most = 4096, .label = "Texture",
     .help = "A picture that is tiled over the matte; giving one turns textured on.", .key = "TextureImagePath"},
    {.name = "bevel", .kind = kChoice, .preset = "sunken", .choices = "sunken|raised|none", .label = "Bevel",
     .help = "Shape of the matte's inner edge, lit from the top left.", .key = "MattBevelType", .keyWords = "sunken|raised|none"},
    {.name = "bevel-size", .kind = kLength, .unit = "px", .preset = "4", .least = 0, .most = 1e6, .label = "Bevel width",
     .help = "Width of the bevel.", .key = "MattBevelSize"},
    {.name = "intensity", .kind = kPercent, .unit = "%", .preset = "50", .least = 0, .most = 100, .label = "Intensity",
     .help = "Contrast of the bevel.", .key = "MattIntensity"},
    {.name = "inner-border", .kind = kFlag, .preset = "no", .label = "Inner border", .help = "Draws a line between picture and matte.",
     .key = "MattUseInnerBorder"},
    {.name = "inner-size", .kind = kLength, .unit = "px", .preset = "1", .least = 0, .most = 1e6, .label = "Inner border width",
     .help = "Thickness of the line.", .key = "MattInnerBorderSize"},
    {.name = "inner-color", .kind = kColor, .preset = "#000000", .label = "Inner border color", .help = "Color of the line.",
     .key = "MattInnerBorderColor"},
    {.name = "outer-border", .kind = kFlag, .preset = "no", .label = "Outer border", .help = "Draws a line around the matte.",
     .key = "MattUseOuterBorder"},
    {.name = "outer-size", .kind = kLength, .unit = "px", .preset = "1", .least = 0, .most = 1e6, .label = "Outer border width",
     .help = "Thickness of the line.", .key = "MattOuterBorderSize"},
    {.name = "outer-color", .kind = kColor, .preset = "#000000", .label = "Outer border color", .help = "Color of the line.",
     .key = "MattOuterBorderColor"},
};

constexpr Parameter kBorder[] = {
    {.name = "size", .kind = kLength, .unit = "px", .preset = "10", .least = 0, .most = 1e6, .label = "Size",
     .help = "Width on each side; percentages refer to the shorter edge."},
    {.name = "color", .kind = kColor, .preset = "#000000", .label = "Color", .help = "Color of the border."},
};

constexpr Parameter kShadow[] = {
    {.name = "x", .kind = kLength, .unit = "px", .preset = "8", .least = -1e5, .most = 1e5, .label = "Right", .help = "Offset of the shadow to the right."},
    {.name = "y", .kind = kLength, .unit = "px", .preset = "8", .least = -1e5, .most = 1e5, .label = "Down", .help = "Offset of the shadow downward."},
    {.name = "blur", .kind = kNumber, .unit = "px", .preset = "6", .least = 0, .most = 100, .label = "Softness",
     .help = "Sigma of the shadow's Gaussian blur; 0 leaves it sharp."},
    {.name = "opacity", .kind = kPercent, .unit = "%", .preset = "60", .least = 0, .most = 100, .label = "Opacity", .help = "Opacity of the shadow."},
    {.name = "color", .kind = kColor, .preset = "#000000", .label = "Color", .help = "Color of the shadow."},
    {.name = "background", .kind = kColor, .preset = "#ffffff", .label = "Background", .help = "Color behind picture and shadow; #0000 is transparent.",
     .key = "AlphaBackground"},
};

constexpr Parameter kRoundCorners[] = {
    {.name = "radius", .kind = kLength, .unit = "px", .preset = "5%", .least = 0, .most = 1e6, .label = "Radius",
     .help = "Radius of the corners; percentages refer to the shorter edge."},
    {.name = "background", .kind = kColor, .preset = "#00000000", .label = "Background",
     .help = "Color of the corners (default: transparent)."},
};
// clang-format on

Size SizeOf(const PictureRecord& picture) {
  return {picture.image.Width(), picture.image.Height()};
}

// A length in whole pixels; percentages are of the shorter edge.
int32_t Pixels(const PictureRecord& picture, const Arguments& arguments, const char* name) {
  const Size size = SizeOf(picture);
  return arguments.Pixels(name, std::min(size.width, size.height), picture.metadata.dpiX);
}

// Adds a frame of one color; in whole pixels, so that palettes can be kept.
Status Enlarge(PictureRecord& picture, int32_t left, int32_t top, int32_t right, int32_t bottom,
               const AlphaColor& color) {
  const Size size = SizeOf(picture);
  const int64_t width = int64_t{size.width} + left + right,
                height = int64_t{size.height} + top + bottom;
  if (std::max(width, height) > INT32_MAX) return Status::MemoryAllocationError;
  if (width == size.width && height == size.height) return Status::Ok;
  return PlaceOnCanvas(picture, {static_cast<int32_t>(width), static_cast<int32_t>(height)}, left,
                       top, BackdropOf(color));
}

Status Enlarge(PictureRecord& picture, int32_t all, const AlphaColor& color) {
  return Enlarge(picture, all, all, all, all, color);
}

// Size of the matte; plain numbers are in `units`.
int32_t MattSize(const PictureRecord& picture, const Arguments& arguments) {
  constexpr LengthUnit kUnits[] = {LengthUnit::Inches, LengthUnit::Centimeters, LengthUnit::Pixels};
  const Value& value = arguments.Of("size");
  Length length = value.x;
  const char last = value.text.empty() ? '0' : value.text.back();
  if ((last >= '0' && last <= '9') || last == '.') length.unit = kUnits[arguments.Choice("units")];
  const Size size = SizeOf(picture);
  const double pixels =
      length.Pixels(std::min(size.width, size.height), picture.metadata.dpiX);
  return static_cast<int32_t>(std::clamp(std::floor(pixels + 0.5), 0.0, 1e9));
}

bool IsTextured(const Arguments& arguments) {
  const Value& texture = arguments.Of("texture");
  const bool named = texture.given && !texture.text.empty();
  return named && (!texture.byDefault || arguments.Flag("textured"));
}

ArgumentProblem CheckMatt(const Arguments& arguments) {
  const Value& textured = arguments.Of("textured");
  if (!IsTextured(arguments)) {
    return arguments.Flag("textured") && !textured.byDefault
               ? ArgumentProblem{"texture", TrRecorded("must name a picture when textured is on")}
               : ArgumentProblem{};
  }
  const RecordedText problem = PictureFileProblem(arguments.Text("texture"));
  return problem.empty() ? ArgumentProblem{} : ArgumentProblem{"texture", problem};
}

// Fills the matte around `window` with a texture.
Status PaintTexture(PictureRecord& picture, const Rectangle& window, const std::string& name) {
  std::shared_ptr<const PictureRecord> loaded;
  RETURN_IF_BAD(LoadPictureFile(name, loaded));
  PictureRecord opaque;
  const PictureRecord* tile = loaded.get();
  if (!tile->alpha.Empty()) {
    const Rectangle all{0, 0, tile->image.Width(), tile->image.Height()};
    RETURN_IF_BAD(CutImage(tile->image, all, opaque.image));
    RETURN_IF_BAD(CutImage(tile->alpha, all, opaque.alpha));
    RETURN_IF_BAD(FlattenAlpha(opaque));
    tile = &opaque;
  }
  const Size size = SizeOf(picture);
  const Rectangle strips[] = {
      {0, 0, size.width, window.y},
      {0, window.y + window.height, size.width, size.height - window.y - window.height},
      {0, window.y, window.x, window.height},
      {window.x + window.width, window.y, size.width - window.x - window.width, window.height}};
  for (const Rectangle& strip : strips) RETURN_IF_BAD(PaintTiles(picture, *tile, strip));
  return Status::Ok;
}

// Light and shade along the edge of `window`, mitered at the corners.
Status PaintBevel(PictureRecord& picture, const Rectangle& window, int32_t width,
                  const Arguments& arguments) {
  const uint8_t alpha = AlphaOfPercent(arguments.Number("intensity"));
  const bool raised = arguments.Choice<Bevel>("bevel") == Bevel::Raised;
  const Backdrop light{255, 255, 255, alpha}, shade{0, 0, 0, alpha};
  // On a sunken window, the right and bottom edges face the light.
  const Backdrop &upper = raised ? light : shade, &lower = raised ? shade : light;
  for (int32_t i = 1; i <= width; ++i) {
    const int32_t left = window.x - i, top = window.y - i;
    const int32_t across = window.width + 2 * i, down = window.height + 2 * i;
    RETURN_IF_BAD(PaintRectangle(picture, {left, top, across, 1}, upper));
    RETURN_IF_BAD(PaintRectangle(picture, {left, top + 1, 1, down - 2}, upper));
    RETURN_IF_BAD(PaintRectangle(picture, {left, top + down - 1, across, 1}, lower));
    RETURN_IF_BAD(PaintRectangle(picture, {left + across - 1, top + 1, 1, down - 2}, lower));
  }
  return Status::Ok;
}

Status Matt(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const int32_t size = MattSize(picture, arguments);
  const int32_t inner =
      arguments.Flag("inner-border") ? Pixels(picture, arguments, "inner-size") : 0;
  const int32_t outer =
      arguments.Flag("outer-border") ? Pixels(picture, arguments, "outer-size") : 0;
  const bool flat = arguments.Choice<Bevel>("bevel") == Bevel::None ||
                    arguments.Number("intensity") == 0;
  const int32_t bevel = flat ? 0 : std::min(Pixels(picture, arguments, "bevel-size"), size);
  RETURN_IF_BAD(Enlarge(picture, inner, arguments.Color("inner-color")));
  const Size window = SizeOf(picture);
  RETURN_IF_BAD(Enlarge(picture, size, arguments.Color("fill")));
  const Rectangle place{size, size, window.width, window.height};
  if (!context.work.GoesOn()) return Status::FunctionCancelled;
  if (IsTextured(arguments)) RETURN_IF_BAD(PaintTexture(picture, place, arguments.Text("texture")));
  if (bevel > 0) RETURN_IF_BAD(PaintBevel(picture, place, bevel, arguments));
  return Enlarge(picture, outer, arguments.Color("outer-color"));
}

Status Border(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  return Enlarge(picture, Pixels(picture, arguments, "size"), arguments.Color("color"));
}

// The shape of the shadow: the picture's alpha, or a rectangle, at (x, y) on a plane of `size`.
Status ShadowMask(const PictureRecord& picture, Size size, int32_t x, int32_t y,
                  PackedImage& mask) {
  RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, mask));
  for (int32_t row = 0; row < picture.image.Height(); ++row) {
    const auto target = mask.Row(y + row).subspan(static_cast<size_t>(x),
                                                  static_cast<size_t>(picture.image.Width()));
    if (picture.alpha.Empty()) {
      std::ranges::fill(target, uint8_t{255});
    } else {
      std::ranges::copy(picture.alpha.Row(row).first(target.size()), target.begin());
    }
  }
  return Status::Ok;
}

Status Shadow(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  constexpr double kSigmas = 3;  // a blur is invisible beyond this
  const int32_t x = Pixels(picture, arguments, "x"), y = Pixels(picture, arguments, "y");
  const double sigma = arguments.Number("blur");
  const auto reach = static_cast<int32_t>(std::ceil(sigma * kSigmas));
  const int32_t left = std::max(reach - x, 0), right = std::max(reach + x, 0),
                top = std::max(reach - y, 0), bottom = std::max(reach + y, 0);
  const int64_t width = int64_t{picture.image.Width()} + left + right,
                height = int64_t{picture.image.Height()} + top + bottom;
  if (std::max(width, height) > INT32_MAX) return Status::MemoryAllocationError;
  const Size size{static_cast<int32_t>(width), static_cast<int32_t>(height)};
  RETURN_IF_BAD(CheckPackedSize(size.width, size.height, 24));
  RETURN_IF_BAD(PromotePicture(picture));
  PackedImage mask;
  RETURN_IF_BAD(ShadowMask(picture, size, left + x, top + y, mask));
  RETURN_IF_BAD(BlurMask(mask, sigma, context.work));
  // The canvas, with the shadow and then the picture on top. A separate record, as the picture is a
  // layer on it.
  PictureRecord canvas;
  RETURN_IF_BAD(NewPackedImage(size.width, size.height, nullptr, 24, canvas.image));
  canvas.bitsPerPixel = 24;
  const Backdrop background = BackdropOf(arguments.Color("background"));
  if (background.alpha < 255) RETURN_IF_BAD(NewAlphaPlane(size.width, size.height, canvas.alpha));
  RETURN_IF_BAD(PaintRectangle(canvas, {0, 0, size.width, size.height}, background));
  Backdrop ink = BackdropOf(arguments.Color("color"));
  ink.alpha = static_cast<uint8_t>(std::floor(arguments.Number("opacity") * ink.alpha / 100 + 0.5));
  RETURN_IF_BAD(PaintThroughMask(canvas, mask, 0, 0, ink));
  mask.Free();
  RETURN_IF_BAD(PaintPicture(canvas, picture, left, top, 255));
  picture.image = std::move(canvas.image);
  picture.alpha = std::move(canvas.alpha);
  picture.alphaFlags = static_cast<uint8_t>(
      picture.alpha.Empty() ? picture.alphaFlags & ~kHasAlpha : picture.alphaFlags | kHasAlpha);
  picture.width = size.width;
  picture.height = size.height;
  return Status::Ok;
}

Status RoundCorners(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  const Size size = SizeOf(picture);
  const int32_t radius = std::min(Pixels(picture, arguments, "radius"),
                                  (std::min(size.width, size.height) + 1) / 2);
  if (radius == 0) return Status::Ok;
  const Backdrop background = BackdropOf(arguments.Color("background"));
  const bool opaque = background.alpha == 255 && picture.alpha.Empty();
  RETURN_IF_BAD(opaque ? PromotePicture(picture) : PromoteToAlpha(picture));
  const Shape shape{size.width / 2.0, size.height / 2.0, static_cast<double>(size.width),
                    static_cast<double>(size.height), 0, static_cast<double>(radius)};
  const ShapeCoverage coverage(shape);
  const uint8_t under[] = {background.blue, background.green, background.red};
  const auto round = [&](int32_t x, int32_t y) {
    uint8_t* const plane = opaque ? nullptr : picture.alpha.Row(y).data() + x;
    const int32_t cover = coverage.At(x, y), alpha = opaque ? 255 : *plane;
    uint8_t* const pixel = picture.image.Row(y).data() + static_cast<ptrdiff_t>(x) * 3;
    const int32_t own = alpha * cover, other = background.alpha * (255 - cover);
    const int32_t whole = own + other;
    for (int32_t channel = 0; whole > 0 && channel < 3; ++channel) {
      pixel[channel] = static_cast<uint8_t>(
          (pixel[channel] * own + under[channel] * other + whole / 2) / whole);
    }
    if (!opaque) *plane = static_cast<uint8_t>((whole + 127) / 255);
  };
  for (int32_t y = 0; y < size.height; ++y) {
    if (y >= radius && y < size.height - radius) continue;
    for (int32_t x = 0; x < size.width; ++x) {
      if (x < radius || x >= size.width - radius) round(x, y);
    }
  }
  return Status::Ok;
}

constexpr Operation kOperations[] = {
    {.name = "matt",
     .family = Family::Matt,
     .label = "Matte",
     .help = "Puts a matte around the picture, with a beveled edge and optional border lines.",
     .example = "matt 40 fill=#f4f0e6 inner-border outer-border",
     .parameters = kMatt,
     .works = Works::WholePicture,
     .apply = Matt,
     .check = CheckMatt},
    {.name = "border",
     .family = Family::Matt,
     .label = "Border",
     .help = "Puts a border of one color around the picture.",
     .example = "border 12 navy",
     .parameters = kBorder,
     .works = Works::Geometry,
     .apply = Border},
    {.name = "shadow",
     .family = Family::Matt,
     .label = "Shadow",
     .help = "Adds a drop shadow and enlarges the picture to make room for it.",
     .example = "shadow 8 8 blur=5",
     .parameters = kShadow,
     .works = Works::WholePicture,
     .apply = Shadow},
    {.name = "round-corners",
     .family = Family::Matt,
     .label = "Round corners",
     .help = "Rounds the corners of the picture.",
     .example = "round-corners 10%",
     .parameters = kRoundCorners,
     .works = Works::WholePicture,
     .apply = RoundCorners},
};

}  // namespace

std::span<const Operation> MattOperations() { return kOperations; }

}  // namespace fotomill
