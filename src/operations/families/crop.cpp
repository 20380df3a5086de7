#include <algorithm>
#include <cmath>

#include "operations/area.h"
#include "operations/backdrop.h"
#include "operations/gravity.h"
#include "operations/operations.h"
#include "processing/faces/face_finder.h"
#include "processing/geometry/canvas.h"
#include "processing/geometry/cut.h"

// Crop: removes or adds edges.
namespace fotomill {

namespace {

using enum ParameterKind;

// The nine positions, and the faces as the last choice.
constexpr char kGravitiesAndFaces[] =
    "center|top|bottom|left|right|top-left|top-right|bottom-left|bottom-right|faces";
constexpr int32_t kToFaces = 9;

constexpr Parameter kCrop[] = {
    {.name = "area",
     .kind = kRectangle,
     .unit = "px",
     .least = -1e9,
     .most = 1e9,
     .label = "Area",
     .help = "WxH+X+Y from the top left; WxH or a ratio such as 3:2 is placed by gravity."},
    {.name = "gravity",
     .kind = kChoice,
     .preset = "center",
     .choices = kGravitiesAndFaces,
     .label = "Place",
     .help = "Which part to keep if the area has no position; faces: around the faces, or the center if there are none."},
};

// Moves an area to center it on the faces, as far as the picture allows.
Status MoveToFaces(const PictureRecord& picture, const OperationContext& context, Rectangle& area) {
  std::vector<Rectangle> faces;
  RETURN_IF_BAD(FindFaces(picture.image, context.faces, faces, context.work.goesOn));
  if (faces.empty()) return Status::Ok;
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  const Rectangle around = AroundFaces(faces, width, height);
  area.x =
      std::clamp(around.x + (around.width - area.width) / 2, 0, std::max(0, width - area.width));
  area.y = std::clamp(around.y + (around.height - area.height) / 2, 0,
                      std::max(0, height - area.height));
  return Status::Ok;
}

Status Crop(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const Size whole{picture.image.Width(), picture.image.Height()};
  const bool toFaces = arguments.Choice<int32_t>("gravity") == kToFaces;
  const Value& wanted = arguments.Of("area");
  Rectangle area = AreaOf(wanted, whole, picture.metadata,
                          toFaces ? Gravity::Center : arguments.Choice<Gravity>("gravity"));
  if (toFaces && !wanted.hasPlace) RETURN_IF_BAD(MoveToFaces(picture, context, area));
  return CutPicture(picture, area);
}

constexpr Parameter kTrim[] = {
    {.name = "fuzz", .kind = kInteger, .unit = "levels", .preset = "0", .least = 0, .most = 255, .label = "Fuzz",
     .help = "How much a pixel may differ from the top left pixel and still count as border."},
    {.name = "margin", .kind = kInteger, .unit = "px", .preset = "0", .least = 0, .most = 100000, .label = "Margin",
     .help = "Width of the border to keep."},
};

Status Trim(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  Rectangle content;
  RETURN_IF_BAD(FindContent(picture, arguments.Integer("fuzz"), content));
  const int32_t margin = arguments.Integer("margin");
  return CutPicture(picture, {content.x - margin, content.y - margin, content.width + 2 * margin,
                              content.height + 2 * margin});
}

constexpr Parameter kCanvas[] = {
    {.name = "size", .kind = kSize, .unit = "px", .least = 0.0001, .most = 1e9, .label = "Size",
     .help = "WxH, Wx or xH, or one value for both edges. What does not fit is cut off."},
    {.name = "gravity", .kind = kChoice, .preset = "center", .choices = kGravities, .label = "Place",
     .help = "Where the picture is on the canvas."},
    {.name = "background", .kind = kColor, .preset = "#ffffff", .label = "Background", .help = "Color of the added area.",
     .key = "AlphaBackground"},
};

int32_t Whole(double pixels) {
  return static_cast<int32_t>(std::floor(std::clamp(pixels, 1.0, 1e9) + 0.5));
}

Status Canvas(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  const Value& wanted = arguments.Of("size");
  const Size own{picture.image.Width(), picture.image.Height()};
  const Length& height = wanted.longestEdge ? wanted.width : wanted.height;
  Size size = own;
  if (wanted.hasWidth || wanted.longestEdge)
    size.width = Whole(wanted.width.Pixels(own.width, picture.metadata.dpiX));
  if (wanted.hasHeight || wanted.longestEdge)
    size.height = Whole(height.Pixels(own.height, picture.metadata.dpiY));
  const Rectangle place = PlaceWithin(size, own, arguments.Choice<Gravity>("gravity"));
  return PlaceOnCanvas(picture, size, place.x, place.y, BackdropOf(arguments.Color("background")));
}

bool Always(const Arguments&) { return true; }

constexpr Operation kOperations[] = {
    {.name = "crop",
     .family = Family::Crop,
     .label = "Crop",
     .help = "Keeps a part of the picture and cuts off the rest.",
     .example = "crop 3:2 gravity=top",
     .parameters = kCrop,
     .works = Works::Geometry,
     .apply = Crop,
     .moves = Always},
    {.name = "trim",
     .family = Family::Crop,
     .label = "Trim",
     .help = "Cuts off a border of one color.",
     .example = "trim 10 margin=2",
     .parameters = kTrim,
     .works = Works::Geometry,
     .apply = Trim,
     .moves = Always},
    {.name = "canvas",
     .family = Family::Crop,
     .label = "Canvas",
     .help = "Puts the picture onto a larger or smaller canvas without scaling it.",
     .example = "canvas 200x200 gravity=top background=gray",
     .parameters = kCanvas,
     .works = Works::Geometry,
     .apply = Canvas,
     .moves = Always},
};

}  // namespace

std::span<const Operation> CropOperations() { return kOperations; }

}  // namespace fotomill
