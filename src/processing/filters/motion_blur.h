#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Averages along lines and arcs. Colors are weighted by alpha; alpha is blurred as well. Edges are
// repeated. Statuses: EmptyImage, MemoryAllocationError, FunctionCancelled; the picture is then
// unchanged, or promoted.

// The mean of `length` points spaced one pixel apart in the direction of `angle`: degrees
// clockwise, 0 is to the right. Points between pixels are interpolated.
Status MotionBlurPicture(PictureRecord& picture, double length, double angle, const Work& work);
int32_t MotionReach(double length);

// The mean of points along an arc of `amount` degrees around a center, or along a radial line of
// `amount` percent of the distance; half of it on either side. One point per pixel of path length,
// at most 64; up to 8 are interpolated between pixels.
enum class RadialKind : int32_t { Spin, Zoom };
Status RadialBlurPicture(PictureRecord& picture, RadialKind kind, double amount, double centerX,
                         double centerY, const Work& work);

}  // namespace fotomill
