#include <algorithm>
#include <cmath>

#include "operations/gravity.h"
#include "operations/operations.h"
#include "processing/geometry/cut.h"

// Crop: what is cut off, and what is added around.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr Parameter kCrop[] = {
    {.name = "area", .kind = kRectangle, .unit = "px", .least = -1e9, .most = 1e9, .label = "Area",
     .help = "WxH+X+Y from the top left; WxH or a ratio such as 3:2 is placed by gravity."},
    {.name = "gravity", .kind = kChoice, .preset = "center", .choices = kGravities, .label = "Place",
     .help = "Which part to keep of an area without a place."},
};

int32_t Whole(double pixels) { return static_cast<int32_t>(std::floor(std::clamp(pixels, -2e9, 2e9) + 0.5)); }

// The largest size of a ratio within a picture.
Size SizeOfRatio(double across, double down, Size picture) {
  const double width = picture.width, height = picture.height;
  const bool fullWidth = width * down <= height * across;
  const double w = fullWidth ? width : height * across / down, h = fullWidth ? width * down / across : height;
  return {std::clamp(Whole(w), 1, picture.width), std::clamp(Whole(h), 1, picture.height)};
}

Status Crop(PictureRecord& picture, const Arguments& arguments, const OperationContext&) {
  const Value& area = arguments.Of("area");
  const Size whole{picture.image.Width(), picture.image.Height()};
  const PictureMetadata& metadata = picture.metadata;
  const auto gravity = arguments.Choice<Gravity>("gravity");
  if (area.ratio) {
    return CutPicture(picture, PlaceWithin(whole, SizeOfRatio(area.width.number, area.height.number, whole), gravity));
  }
  const Size size{std::max(Whole(area.width.Pixels(whole.width, metadata.dpiX)), 1),
                  std::max(Whole(area.height.Pixels(whole.height, metadata.dpiY)), 1)};
  if (area.hasPlace) {
    return CutPicture(picture, {Whole(area.x.Pixels(whole.width, metadata.dpiX)), Whole(area.y.Pixels(whole.height, metadata.dpiY)),
                                size.width, size.height});
  }
  return CutPicture(picture, PlaceWithin(whole, {std::min(size.width, whole.width), std::min(size.height, whole.height)}, gravity));
}

constexpr Operation kOperations[] = {
    {.name = "crop", .family = Family::Crop, .label = "Crop", .help = "Keeps a part of the picture and cuts off the rest.",
     .example = "crop 3:2 gravity=top", .parameters = kCrop, .works = Works::Geometry, .apply = Crop},
};

}  // namespace

std::span<const Operation> CropOperations() { return kOperations; }

}  // namespace fotomill
