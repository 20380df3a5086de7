#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/geometry/warp.h"

namespace fotomill {

// Turns, slants and stretches of a whole picture. Angles are degrees, clockwise. Statuses as
// WarpPicture.

// Rotates about the center, which stays the center. Multiples of 90 move whole pixels and keep the
// depth. Grows to |w cos| + |h sin|, rounded up, or keeps the size.
Status RotatePicture(PictureRecord& picture, double angle, bool grow, const WarpOptions& options,
                     const Work& work);

// Rotates, and cuts down to the largest upright rectangle within the picture; by less than 90
// degrees.
Status StraightenPicture(PictureRecord& picture, double angle, WarpFilter filter, const Work& work);
// The size of that rectangle.
Size StraightenedSize(Size picture, double angle);

// Slants columns sideways by an angle, then rows down by another; grows as far as needed. By less
// than 90 degrees.
Status ShearPicture(PictureRecord& picture, double across, double down, const WarpOptions& options,
                    const Work& work);

// The map from a rectangle onto four points of a picture, clockwise from the top left, all in
// pixels from the top left corner of the picture. `size` is that of the rectangle; width or height
// 0: as long as the longer of the two edges. Source: P. Heckbert, "Fundamentals of Texture Mapping
// and Image Warping", Berkeley (1989), section 2.2.3.
struct Corner {
  double x, y;
};
// EmptyImage when the points are not the corners of a convex shape, in that order.
Status UnwarpPicture(PictureRecord& picture, const Corner (&corners)[4], Size size,
                     const WarpOptions& options, const Work& work);

}  // namespace fotomill
