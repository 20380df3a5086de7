#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Weighted sums of the pixels around each pixel, and what is made of them. Alpha stays; colors
// count by it as TapRows has it. Statuses as FilterRows.

// Weights row by row, not mirrored; as many as a square of an odd side has. v' = sum / divisor +
// bias.
Status ConvolvePicture(PictureRecord& picture, std::span<const double> weights, double divisor,
                       double bias, const Work& work);

// amount x the length of the gradient that the Sobel operator gives: black where nothing changes.
Status FindPictureEdges(PictureRecord& picture, double amount, const Work& work);

// 127.5 + depth x how fast levels rise away from the light, by the Sobel operator over 8. `angle`:
// where the light comes from, in degrees clockwise from the top.
Status EmbossPicture(PictureRecord& picture, double angle, double depth, const Work& work);

// How far the weights reach to either side.
int32_t KernelReach(size_t weights);

}  // namespace fotomill
