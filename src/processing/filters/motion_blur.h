#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Means of pixels along a line. A color counts by its alpha; alpha is blurred as well. Edges
// repeat. Statuses: EmptyImage, MemoryAllocationError, FunctionCancelled; the picture is then
// unchanged, or promoted.

// The mean of `length` points one pixel apart, in the direction of `angle`: degrees clockwise, 0 is
// to the right. Points between pixels are interpolated.
Status MotionBlurPicture(PictureRecord& picture, double length, double angle, const Work& work);
int32_t MotionReach(double length);

// The mean of points along an arc around a center, `amount` degrees long, or along a line from it,
// `amount` per cent of the distance long; half of it to either side. As many points as the way has
// pixels, at most 64; up to 8 are interpolated between pixels.
enum class RadialKind : int32_t { Spin, Zoom };
Status RadialBlurPicture(PictureRecord& picture, RadialKind kind, double amount, double centerX,
                         double centerY, const Work& work);

}  // namespace fotomill
