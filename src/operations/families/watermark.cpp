#include <algorithm>
#include <cmath>
#include <memory>

#include "operations/backdrop.h"
#include "operations/gravity.h"
#include "operations/lettering.h"
#include "operations/operations.h"
#include "operations/picture_file.h"
#include "processing/color/overlay.h"
#include "processing/geometry/cut.h"
#include "processing/geometry/rotate.h"
#include "processing/geometry/scale.h"
#include "processing/promote.h"

// Watermarks: a text or picture on top of a picture.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr double kTrialEm = 100;  // font size for measuring a text

// clang-format off
constexpr Parameter kWatermark[] = {
    {.name = "text", .kind = kText, .preset = "Copyright %C %Y %N", .least = 0, .most = 4096, .label = "Text",
     .help = "Macros such as %Y and %N are replaced; \\n begins a new line.", .key = "WatermarkText"},
    {.name = "gravity", .kind = kChoice, .preset = "center", .choices = kGravities, .label = "Place", .help = "Position of the watermark."},
    {.name = "picture", .kind = kFile, .preset = "", .most = 4096, .label = "Picture",
     .help = "A picture instead of the text, often one with transparency.", .key = "WatermarkImagePath"},
    {.name = "size", .kind = kPercent, .unit = "%", .preset = "30", .least = 0.1, .most = 100, .label = "Size",
     .help = "Largest size of the watermark, as a share of the picture's width and height."},
    {.name = "margin", .kind = kLength, .unit = "px", .preset = "2%", .least = -1e6, .most = 1e6, .label = "Margin",
     .help = "Distance from the edges, and between tiles; percentages refer to the shorter edge."},
    {.name = "opacity", .kind = kPercent, .unit = "%", .preset = "50", .least = 0, .most = 100, .label = "Opacity",
     .help = "0 is invisible, 100 is opaque."},
    {.name = "rotation", .kind = kAngle, .unit = "degrees", .preset = "0", .least = -360, .most = 360, .label = "Rotation", .help = "Clockwise."},
    {.name = "tiled", .kind = kFlag, .preset = "no", .label = "Tiled", .help = "Repeats the watermark across the picture."},
    {.name = "font", .kind = kText, .preset = "Arial", .least = 0, .most = 260, .label = "Font",
     .help = "Family name, optionally followed by \"Bold\" or \"Italic\".", .key = "WatermarkFontName"},
    {.name = "color", .kind = kColor, .preset = "#ffffff", .label = "Text color", .help = "Color of letters."},
    {.name = "outline", .kind = kLength, .unit = "px", .preset = "0", .least = 0, .most = 1000, .label = "Outline",
     .help = "Width of the outline around letters; percentages refer to the font size."},
    {.name = "outline-color", .kind = kColor, .preset = "#000000", .label = "Outline color", .help = "Color of the outline."},
    {.name = "shadow", .kind = kLength, .unit = "px", .preset = "0", .least = 0, .most = 1000, .label = "Shadow",
     .help = "Offset of the shadow behind letters; percentages refer to the font size."},
};
// clang-format on

// An explicit text takes precedence over a picture from the settings.
bool IsPicture(const Arguments& arguments) {
  const Value& picture = arguments.Of("picture");
  return picture.given && !picture.text.empty() &&
         (!picture.byDefault || arguments.Of("text").byDefault);
}

ArgumentProblem Check(const Arguments& arguments) {
  const Value &text = arguments.Of("text"), &picture = arguments.Of("picture");
  if (picture.given && !picture.byDefault && text.given && !text.byDefault)
    return {"picture", TrRecorded("cannot be combined with text")};
  if (!IsPicture(arguments)) return {};
  const RecordedText problem = PictureFileProblem(arguments.Text("picture"));
  return problem.empty() ? ArgumentProblem{} : ArgumentProblem{"picture", problem};
}

// The factor that scales an object to a share of the picture.
double Factor(double width, double height, Size whole, double share) {
  return std::min(whole.width / std::max(width, 1.0), whole.height / std::max(height, 1.0)) * share;
}

// A layer with the text, with margins for shadow and outline.
Status TextLayer(const PictureRecord& picture, const Arguments& arguments,
                 const OperationContext& context, PictureRecord& layer, int32_t& reach) {
  const Size whole{picture.image.Width(), picture.image.Height()};
  const std::string text = context.Expanded(WithLineFeeds(arguments.Text("text")), picture);
  Lettering style;
  style.font = arguments.Text("font");
  style.em = kTrialEm;
  style.color = arguments.Color("color");
  style.rotation = arguments.Number("rotation");
  LetteringDrawing trial;
  RETURN_IF_BAD(trial.Open(style, text));
  const Size tried = trial.Bounds();
  const double dpi = picture.metadata.dpiX;
  style.em = std::max(
      kTrialEm * Factor(tried.width, tried.height, whole, arguments.Number("size") / 100), 1.0);
  style.outline = arguments.Of("outline").x.Pixels(style.em, dpi);
  style.outlineColor = arguments.Color("outline-color");
  style.shadow = arguments.Of("shadow").x.Pixels(style.em, dpi);
  LetteringDrawing drawing;
  RETURN_IF_BAD(drawing.Open(style, text));
  const Size bounds = drawing.Bounds();
  reach = drawing.Reach();
  const Size room{bounds.width + 2 * reach, bounds.height + 2 * reach};
  RETURN_IF_BAD(NewLayer(room, layer));
  return drawing.Draw(room.width / 2.0, room.height / 2.0, context.work, layer);
}

// A layer with the scaled and rotated picture.
Status PictureLayer(const PictureRecord& picture, const Arguments& arguments,
                    const OperationContext& context, PictureRecord& layer) {
  std::shared_ptr<const PictureRecord> mark;
  RETURN_IF_BAD(LoadPictureFile(arguments.Text("picture"), mark));
  const Rectangle all{0, 0, mark->image.Width(), mark->image.Height()};
  const double angle = arguments.Number("rotation") * 3.14159265358979 / 180;
  const double cosine = std::abs(std::cos(angle)), sine = std::abs(std::sin(angle));
  const double factor = Factor(all.width * cosine + all.height * sine,
                               all.width * sine + all.height * cosine,
                               {picture.image.Width(), picture.image.Height()},
                               arguments.Number("size") / 100);
  const auto edge = [&](int32_t length) {
    return static_cast<int32_t>(std::clamp(std::floor(length * factor + 0.5), 1.0, 1e9));
  };
  const Size size{edge(all.width), edge(all.height)};
  RETURN_IF_BAD(CheckPackedSize(size.width, size.height, 24));
  RETURN_IF_BAD(
      ScaleFiltered(mark->image, mark->alpha,
                    Reach{static_cast<double>(all.width), static_cast<double>(all.height)}, size,
                    ScaleOptions{.work = context.work}, layer.image, layer.alpha));
  layer.width = size.width;
  layer.height = size.height;
  layer.bitsPerPixel = 24;
  RETURN_IF_BAD(PromoteToAlpha(layer));
  const WarpOptions turning{.filter = WarpFilter::Bicubic,
                            .edgesRepeat = false,
                            .backdrop = {0, 0, 0, 0}};
  return RotatePicture(layer, arguments.Number("rotation"), true, turning, context.work);
}

Status Watermark(PictureRecord& picture, const Arguments& arguments,
                 const OperationContext& context) {
  const Size whole{picture.image.Width(), picture.image.Height()};
  PictureRecord layer;
  int32_t reach = 0;  // margin of the layer that does not count for alignment
  RETURN_IF_BAD(IsPicture(arguments) ? PictureLayer(picture, arguments, context, layer)
                                     : TextLayer(picture, arguments, context, layer, reach));
  const int32_t margin = arguments.Pixels("margin", std::min(whole.width, whole.height),
                                          picture.metadata.dpiX);
  const uint8_t opacity = AlphaOfPercent(arguments.Number("opacity"));
  const Size inner{layer.image.Width() - 2 * reach, layer.image.Height() - 2 * reach};
  const Rectangle first =
      PlaceWithin(whole, inner, arguments.Choice<Gravity>("gravity"), margin);
  if (!arguments.Flag("tiled"))
    return PaintPicture(picture, layer, first.x - reach, first.y - reach, opacity);
  const int64_t across = std::max(int64_t{inner.width} + margin, int64_t{1}),
                down = std::max(int64_t{inner.height} + margin, int64_t{1});
  // The first visible tile, counted from the one placed by gravity.
  const auto start = [](int64_t place, int64_t length, int64_t step) {
    return place - (place + length + step - 1) / step * step;
  };
  for (int64_t y = start(first.y, layer.image.Height(), down); y < whole.height + reach;
       y += down) {
    for (int64_t x = start(first.x, layer.image.Width(), across); x < whole.width + reach;
         x += across) {
      if (!context.work.GoesOn()) return Status::FunctionCancelled;
      RETURN_IF_BAD(PaintPicture(picture, layer, static_cast<int32_t>(x - reach),
                                 static_cast<int32_t>(y - reach), opacity));
    }
  }
  return Status::Ok;
}

constexpr Operation kOperations[] = {
    {.name = "watermark",
     .family = Family::Watermark,
     .label = "Watermark",
     .help = "Overlays a text or a picture.",
     .example = "watermark '%C %Y %F' bottom-right opacity=60%",
     .parameters = kWatermark,
     .works = Works::WholePicture,
     .apply = Watermark,
     .check = Check},
};

}  // namespace

std::span<const Operation> WatermarkOperations() { return kOperations; }

}  // namespace fotomill
