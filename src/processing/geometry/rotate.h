#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/geometry/warp.h"

namespace fotomill {

// Rotation, shear and perspective of a whole picture. Angles are in degrees, clockwise.
// Statuses as WarpPicture.

// Rotates about the center. Multiples of 90 move whole pixels and keep the depth. With `grow` the
// width becomes |w cos| + |h sin|, rounded up, and the height likewise; else the size is unchanged.
Status RotatePicture(PictureRecord& picture, double angle, bool grow, const WarpOptions& options,
                     const Work& work);

// Rotates by less than 90 degrees, and crops to the largest axis-aligned rectangle
// inside the picture.
Status StraightenPicture(PictureRecord& picture, double angle, WarpFilter filter, const Work& work);
// The size of that rectangle.
Size StraightenedSize(Size picture, double angle);

// Shears horizontally by an angle, then vertically by another; grows as needed. By less
// than 90 degrees.
Status ShearPicture(PictureRecord& picture, double across, double down, const WarpOptions& options,
                    const Work& work);

// Maps four points of a picture, clockwise from the top left, in pixels
// from its top left corner, to a rectangle of `size`; width or height
// 0: the longer of the two edges. Source: P. Heckbert, "Fundamentals of
// Texture Mapping and Image Warping", Berkeley (1989), section 2.2.3.
struct Corner {
  double x, y;
};
// EmptyImage if the points are not the corners of a convex quadrilateral, in that order.
Status UnwarpPicture(PictureRecord& picture, const Corner (&corners)[4], Size size,
                     const WarpOptions& options, const Work& work);

}  // namespace fotomill
