#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "picture/rectangle.h"
#include "processing/geometry/scale.h"

namespace fotomill::desktop {

// What of a crop rectangle is dragged.
enum class CropGrip : uint8_t {
  None,
  Inside,  // moves it
  Left,
  Right,
  Top,
  Bottom,
  TopLeft,
  TopRight,
  BottomLeft,
  BottomRight,
};

// A ratio of width to height; 0: any.
struct CropRatio {
  double width = 0, height = 0;

  bool Free() const { return width <= 0 || height <= 0; }
  bool operator==(const CropRatio&) const = default;
};
// Reads "3:2" or "1.5"; "" and words are no ratio. False if it is neither.
bool ReadCropRatio(std::string_view text, CropRatio& ratio);

// A crop rectangle within a picture, in its pixels: at least one pixel, inside the picture, and of
// the ratio, as far as whole pixels allow.
class CropArea {
 public:
  // Another picture; the rectangle becomes the suggested one.
  void SetPicture(Size size);
  Size Picture() const { return picture_; }
  const Rectangle& Area() const { return area_; }
  const CropRatio& Ratio() const { return ratio_; }

  void SetRatio(const CropRatio& ratio);  // shrinks the rectangle around its center
  // The rectangle, moved and cut to fit into the picture; the ratio applies to its height.
  void SetArea(const Rectangle& area);
  // The largest rectangle of the ratio in the middle, or the whole picture.
  Rectangle Suggested() const;
  // Moves the rectangle; it stops at the edges.
  void MoveBy(int32_t right, int32_t down);
  // The rectangle after dragging a grip of `start` by a distance in pixels.
  void Drag(CropGrip grip, const Rectangle& start, double right, double down);
  // Spans a new rectangle between two points.
  void Span(double fromX, double fromY, double toX, double toY);

 private:
  void Fit(double left, double top, double width, double height);

  Size picture_{1, 1};
  Rectangle area_{0, 0, 1, 1};
  CropRatio ratio_;
};

// The grip of a rectangle at a point, in any unit; corners before edges.
CropGrip GripAt(const Rectangle& shown, int32_t x, int32_t y, int32_t near);

// The same part of another picture.
Rectangle SamePart(const Rectangle& area, Size from, Size to);

// The angle by which to straighten a picture in which a line is level or upright, in degrees
// clockwise: -45 to 45.
double StraighteningAngle(double fromX, double fromY, double toX, double toY);

// The recipe for a crop: empty if it keeps the whole picture.
std::string CropRecipe(double angle, const Rectangle& area, Size picture);

}  // namespace fotomill::desktop
