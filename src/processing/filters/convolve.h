#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Convolution, and effects based on it. Alpha is unchanged; colors are weighted by it as in
// TapRows. Statuses as FilterRows.

// Weights row by row, not mirrored; a square
// with an odd edge. v' = sum / divisor + bias.
Status ConvolvePicture(PictureRecord& picture, std::span<const double> weights, double divisor,
                       double bias, const Work& work);

// amount x gradient magnitude of the Sobel operator: flat areas become black.
Status FindPictureEdges(PictureRecord& picture, double amount, const Work& work);

// 127.5 + depth x slope away from the light, by the Sobel operator over 8. `angle` is the direction
// the light comes from, in degrees clockwise from the top.
Status EmbossPicture(PictureRecord& picture, double angle, double depth, const Work& work);

// How many pixels the kernel extends to each side.
int32_t KernelReach(size_t weights);

}  // namespace fotomill
