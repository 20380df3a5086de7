#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Turns PhotoYCC samples, one of luma and two of chroma for each pixel, into pixels of blue, green,
// red for a screen. PhotoYCC goes beyond white; such lights are compressed, not clipped.
// Source: Kodak, "Fully Utilizing Photo CD Images, Article No. 4: PhotoYCC Color Encoding and
// Compression Schemes" (PCD045), whose look-up table for screens is replaced by a simpler curve.
void PhotoYccToColors(const uint8_t* luma, const uint8_t* chroma1, const uint8_t* chroma2,
                      size_t count, uint8_t* bgr);

}  // namespace fotomill
