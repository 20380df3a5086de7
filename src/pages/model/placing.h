#pragma once

#include "pages/model/page.h"

namespace fotomill {

// How a picture fills a box: as large as fits, cropped to fill it, or distorted.
enum class PictureFit { Inside, Cover, Stretch };

// A picture's size in a box, scaled proportionally to fit inside or to cover it.
Box FittedBox(double width, double height, const Box& box, PictureFit fit);

// A picture in a box, centered. With `turn`, it is rotated by 90 degrees clockwise if that makes
// it larger (Inside) or crops less (Cover).
PictureItem PlacePicture(const PagePicture& picture, const Box& box, PictureFit fit, bool turn);

// Whether a picture must be rotated to be upright or lying like a box; squares never.
bool NeedsTurn(double width, double height, const Box& box);

// The corners of a box, clockwise from the top left.
std::vector<Point> CornersOf(const Box& box);
// The bounding box of points; there is at least one.
Box BoundsOf(const std::vector<Point>& points);
// The four corners of a picture, in the order top left, top right, bottom right, bottom left.
std::vector<Point> CornersOf(const PictureItem& item);

// Whether white text is more readable on a color than black text.
bool IsDark(Color color);

// A filled rectangle.
PolygonItem FilledBox(const Box& box, Color color);
// The four sides of a box as lines, dashed if `dash` is above 0.
void AddOutline(const Box& box, double lineWidth, Color color, double dash,
                std::vector<PageItem>& items);
// Crop marks at the four corners of a box: lines of `length`, starting `gap` outside of it.
void AddCropMarks(const Box& box, double gap, double length, double lineWidth, Color color,
                  std::vector<PageItem>& items);

}  // namespace fotomill
