#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/bands.h"

namespace fotomill {

// Effects within a rectangle, which is clipped to the picture. In
// place: FunctionCancelled leaves a part changed. Statuses: EmptyImage
// without a picture, MemoryAllocationError, FunctionCancelled.

// Pixelates: squares of `side` pixels, starting at the top left of `area`, are filled with their
// mean. Colors are weighted by alpha; alpha is averaged, too.
Status MosaicPicture(PictureRecord& picture, const Rectangle& area, int32_t side, const Work& work);

// Removes red-eye: red becomes the mean of green and blue in pixels where it is more than `ratio`
// times that mean.
Status RemoveRedEye(PictureRecord& picture, const Rectangle& area, double ratio);

// As above within a face, but only for what may be a pupil, since skin and lips are red, too: a
// compact spot, at most a fifth of the face wide, at eye height, whose pixels have more than
// `ratio` times as much red as green and as blue. Only pixels within `area` are considered.
Status RemoveRedEyesOfFace(PictureRecord& picture, const Rectangle& face, const Rectangle& area,
                           double ratio);

// Oil painting: each pixel becomes the mean of those pixels in a square of 2 radius + 1 whose luma
// is in the most frequent of `levels` ranges; ties go to the darkest. Edges are repeated; pixels
// are weighted by alpha, and alpha is unchanged. Not in place.
inline constexpr int32_t kMostOilRadius = 20, kMostOilLevels = 256;
Status OilPicture(PictureRecord& picture, int32_t radius, int32_t levels, const Work& work);

}  // namespace fotomill
