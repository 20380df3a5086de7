#include <algorithm>
#include <cmath>

#include "operations/backdrop.h"
#include "operations/gravity.h"
#include "operations/lettering.h"
#include "operations/operations.h"
#include "processing/color/overlay.h"
#include "processing/geometry/canvas.h"
#include "processing/geometry/cut.h"

// Captions and texts.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr const char* kAligns = "left|center|right";  // in the order of TextAlign
constexpr double kMostText = 4096;

// clang-format off
constexpr Parameter kCaption[] = {
    {.name = "text", .kind = kText, .preset = "This space for rent...", .least = 0, .most = kMostText, .label = "Text",
     .help = "Macros such as %F and %D are replaced; \\n begins a new line.", .key = "AnnotateText"},
    {.name = "position", .kind = kChoice, .preset = "below", .choices = "below|above", .label = "Position",
     .help = "Where the strip is added."},
    {.name = "font", .kind = kText, .preset = "Arial", .least = 0, .most = 260, .label = "Font",
     .help = "Family name, optionally followed by \"Bold\" or \"Italic\".", .key = "AnnotateFontName"},
    {.name = "size", .kind = kLength, .unit = "pt", .preset = "24", .least = 0.1, .most = 10000, .label = "Font size",
     .help = "Points at the picture's resolution, pixels (40px), or a percentage of the picture's height.", .key = "AnnotatePointSizeFont"},
    {.name = "color", .kind = kColor, .preset = "#000000", .label = "Text color", .help = "Color of letters and frame.",
     .key = "AnnotateForeground"},
    {.name = "background", .kind = kColor, .preset = "#ffffff", .label = "Background", .help = "Color of the strip.",
     .key = "AnnotateBackground"},
    {.name = "align", .kind = kChoice, .preset = "center", .choices = kAligns, .label = "Alignment",
     .help = "How lines are aligned in the strip."},
    {.name = "frame", .kind = kFlag, .preset = "no", .label = "Frame", .help = "Draws a line around the strip.", .key = "AnnotateFrame"},
    {.name = "frame-size", .kind = kLength, .unit = "px", .preset = "1", .least = 0, .most = 10000, .label = "Frame width",
     .help = "Thickness of the frame.", .key = "AnnotateBorderFrameSize"},
    {.name = "padding", .kind = kLength, .unit = "px", .preset = "4", .least = 0, .most = 10000, .label = "Padding",
     .help = "Space around the text.", .key = "AnnotatePadding"},
    {.name = "line-spacing", .kind = kLength, .unit = "px", .preset = "0", .least = -1000, .most = 10000, .label = "Line spacing",
     .help = "Added between lines.", .key = "AnnotateLinespace"},
    {.name = "char-spacing", .kind = kLength, .unit = "px", .preset = "0", .least = -1000, .most = 10000, .label = "Character spacing",
     .help = "Added after each character.", .key = "AnnotateCharspace"},
};

constexpr Parameter kTexts[] = {
    {.name = "text", .kind = kText, .least = 0, .most = kMostText, .label = "Text",
     .help = "Macros such as %F and %D are replaced; \\n begins a new line."},
    {.name = "gravity", .kind = kChoice, .preset = "center", .choices = kGravities, .label = "Place", .help = "Position of the text."},
    {.name = "font", .kind = kText, .preset = "Arial", .least = 0, .most = 260, .label = "Font",
     .help = "Family name, optionally followed by \"Bold\" or \"Italic\".", .key = "AnnotateExFontName"},
    {.name = "size", .kind = kLength, .unit = "pt", .preset = "24", .least = 0.1, .most = 10000, .label = "Font size",
     .help = "Points at the picture's resolution, pixels (40px), or a percentage of the picture's height.", .key = "AnnotateExPointSizeFont"},
    {.name = "color", .kind = kColor, .preset = "#000000", .label = "Text color", .help = "Color of letters and frame.",
     .key = "AnnotateExForeground"},
    {.name = "opacity", .kind = kPercent, .unit = "%", .preset = "100", .least = 0, .most = 100, .label = "Opacity",
     .help = "Opacity of everything drawn; 0 is invisible."},
    {.name = "rotation", .kind = kAngle, .unit = "degrees", .preset = "0", .least = -360, .most = 360, .label = "Rotation", .help = "Clockwise."},
    {.name = "margin", .kind = kLength, .unit = "px", .preset = "2%", .least = -1e6, .most = 1e6, .label = "Margin",
     .help = "Distance from the edges; percentages refer to the shorter edge."},
    {.name = "align", .kind = kChoice, .preset = "center", .choices = kAligns, .label = "Alignment", .help = "How lines of different lengths are aligned."},
    {.name = "outline", .kind = kLength, .unit = "px", .preset = "0", .least = 0, .most = 1000, .label = "Outline",
     .help = "Width of the outline around letters; percentages refer to the font size."},
    {.name = "outline-color", .kind = kColor, .preset = "#ffffff", .label = "Outline color", .help = "Color of the outline."},
    {.name = "shadow", .kind = kLength, .unit = "px", .preset = "0", .least = 0, .most = 1000, .label = "Shadow",
     .help = "Offset of the shadow behind letters; percentages refer to the font size."},
    {.name = "box", .kind = kFlag, .preset = "no", .label = "Box", .help = "Draws a box behind the text."},
    {.name = "background", .kind = kColor, .preset = "#ffffff", .label = "Box color", .help = "Color of the box.", .key = "AnnotateExBackground"},
    {.name = "frame", .kind = kFlag, .preset = "no", .label = "Frame", .help = "Draws a line around the text.", .key = "AnnotateExFrame"},
    {.name = "frame-size", .kind = kLength, .unit = "px", .preset = "1", .least = 0, .most = 10000, .label = "Frame width",
     .help = "Thickness of the frame.", .key = "AnnotateExBorderFrameSize"},
    {.name = "padding", .kind = kLength, .unit = "px", .preset = "4", .least = 0, .most = 10000, .label = "Padding",
     .help = "Space between the text and its box or frame.", .key = "AnnotateExPadding"},
    {.name = "line-spacing", .kind = kLength, .unit = "px", .preset = "0", .least = -1000, .most = 10000, .label = "Line spacing",
     .help = "Added between lines."},
    {.name = "char-spacing", .kind = kLength, .unit = "px", .preset = "0", .least = -1000, .most = 10000, .label = "Character spacing",
     .help = "Added after each character."},
};
// clang-format on

// Properties common to both operations.
Lettering StyleOf(const PictureRecord& picture, const Arguments& arguments) {
  const double dpi = picture.metadata.dpiY;
  Lettering style;
  style.font = arguments.Text("font");
  style.em = std::max(arguments.Of("size").x.Pixels(picture.image.Height(), dpi), 1.0);
  style.color = arguments.Color("color");
  style.boxColor = arguments.Color("background");
  style.layout.spacing = arguments.Pixels("char-spacing", style.em, dpi);
  style.layout.lineSpacing = arguments.Pixels("line-spacing", style.em, dpi);
  style.layout.align = arguments.Choice<TextAlign>("align");
  style.padding = arguments.Pixels("padding", style.em, dpi);
  style.frame = arguments.Flag("frame") ? arguments.Pixels("frame-size", style.em, dpi) : 0;
  return style;
}

Status Caption(PictureRecord& picture, const Arguments& arguments,
               const OperationContext& context) {
  Lettering style = StyleOf(picture, arguments);
  const Size whole{picture.image.Width(), picture.image.Height()};
  const double around = style.padding + style.frame;
  style.layout.width = std::max(whole.width - 2 * around, 1.0);
  TextFont font;
  RETURN_IF_BAD(font.Open(style.font, style.em));
  const TextBlock block = LayOutText(
      font, context.Expanded(WithLineFeeds(arguments.Text("text")), picture), style.layout);
  const double rows = block.height + 2 * around;
  if (rows + whole.height > 1e9) return Status::MemoryAllocationError;
  const auto height = static_cast<int32_t>(rows);
  const bool above = arguments.Choice("position") == 1;
  RETURN_IF_BAD(PlaceOnCanvas(picture, {whole.width, whole.height + height}, 0,
                              above ? height : 0, BackdropOf(style.boxColor)));
  const int32_t top = above ? 0 : whole.height;
  const auto line = static_cast<int32_t>(style.frame);
  const Backdrop ink = BackdropOf(style.color);
  const Rectangle edges[] = {{0, top, whole.width, line},
                             {0, top + height - line, whole.width, line},
                             {0, top + line, line, height - 2 * line},
                             {whole.width - line, top + line, line, height - 2 * line}};
  for (const Rectangle& edge : edges) {
    if (line > 0) RETURN_IF_BAD(PaintRectangle(picture, edge, ink));
  }
  PackedImage mask;
  RETURN_IF_BAD(NewAlphaPlane(whole.width, height, mask));
  // Center of the block; puts its edge at the padding if it is not centered.
  const double room = std::max((style.layout.width - block.width) / 2, 0.0);
  const double aside[] = {-room, 0, room};
  const double x = whole.width / 2.0 + aside[arguments.Choice("align")];
  RETURN_IF_BAD(DrawTextBlock(font, block, {x, rows / 2, 0, 0}, mask, context.work));
  return PaintThroughMask(picture, mask, 0, top, ink);
}

Status DrawText(PictureRecord& picture, const Arguments& arguments,
                const OperationContext& context) {
  Lettering style = StyleOf(picture, arguments);
  const Size whole{picture.image.Width(), picture.image.Height()};
  const double dpi = picture.metadata.dpiX;
  const int32_t margin =
      arguments.Pixels("margin", std::min(whole.width, whole.height), dpi);
  style.box = arguments.Flag("box");
  style.rotation = arguments.Number("rotation");
  style.outline = arguments.Of("outline").x.Pixels(style.em, dpi);
  style.outlineColor = arguments.Color("outline-color");
  style.shadow = arguments.Of("shadow").x.Pixels(style.em, dpi);
  const double around = style.box || style.frame > 0 ? style.padding + style.frame : 0;
  style.layout.width = std::max(whole.width - 2.0 * margin - 2 * around, 1.0);
  LetteringDrawing drawing;
  RETURN_IF_BAD(
      drawing.Open(style, context.Expanded(WithLineFeeds(arguments.Text("text")), picture)));
  const Rectangle place =
      PlaceWithin(whole, drawing.Bounds(), arguments.Choice<Gravity>("gravity"), margin);
  const int32_t reach = drawing.Reach();
  const auto bounded = [](int64_t value) {
    return static_cast<int32_t>(std::clamp<int64_t>(value, -2000000000, 2000000000));
  };
  const Rectangle seen = Clipped(
      {bounded(int64_t{place.x} - reach), bounded(int64_t{place.y} - reach),
       bounded(int64_t{place.width} + 2 * reach), bounded(int64_t{place.height} + 2 * reach)},
      whole.width, whole.height);
  if (seen.width == 0) return Status::Ok;
  PictureRecord layer;
  RETURN_IF_BAD(NewLayer({seen.width, seen.height}, layer));
  RETURN_IF_BAD(drawing.Draw(place.x - seen.x + place.width / 2.0,
                             place.y - seen.y + place.height / 2.0, context.work, layer));
  const uint8_t opacity = AlphaOfPercent(arguments.Number("opacity"));
  return PaintPicture(picture, layer, seen.x, seen.y, opacity);
}

constexpr Operation kOperations[] = {
    {.name = "caption",
     .family = Family::Annotate,
     .label = "Caption",
     .help = "Adds a strip with text below or above the picture.",
     .example = "caption '%F, %D' size=18",
     .parameters = kCaption,
     .works = Works::WholePicture,
     .apply = Caption},
    {.name = "text",
     .family = Family::Annotate,
     .label = "Text",
     .help = "Draws text onto the picture.",
     .example = "text '%F' bottom-right size=5% color=white outline=6% outline-color=black",
     .parameters = kTexts,
     .works = Works::WholePicture,
     .apply = DrawText},
};

}  // namespace

std::span<const Operation> AnnotateOperations() { return kOperations; }

}  // namespace fotomill
