#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/bands.h"

namespace fotomill {

// Changes within a rectangle, which may reach beyond the picture. In place: after FunctionCancelled
// some of it is changed. Statuses: EmptyImage without a picture, MemoryAllocationError,
// FunctionCancelled.

// Squares of `side` pixels, the first one at the top left of `area`, become the mean of their
// pixels. A color counts by its alpha; alpha becomes its mean too.
Status MosaicPicture(PictureRecord& picture, const Rectangle& area, int32_t side, const Work& work);

// Takes the red out of pixels that have more than `ratio` times as much red as the mean of green
// and blue: their red becomes that mean.
Status RemoveRedEye(PictureRecord& picture, const Rectangle& area, double ratio);

// The same within a face, for what may be a pupil only: skin and lips are red too. That is a
// compact spot, at most a fifth of the face wide, at the height of the eyes, whose pixels have more
// than `ratio` times as much red as green and as blue. Only pixels within `area` are looked at.
Status RemoveRedEyesOfFace(PictureRecord& picture, const Rectangle& face, const Rectangle& area,
                           double ratio);

// Each pixel becomes the mean of those in a square of 2 radius + 1 whose luma is in the most
// frequent of `levels` ranges, the darkest of several. Edges repeat; a pixel counts by its alpha,
// and alpha stays. Not in place.
inline constexpr int32_t kMostOilRadius = 20, kMostOilLevels = 256;
Status OilPicture(PictureRecord& picture, int32_t radius, int32_t levels, const Work& work);

}  // namespace fotomill
