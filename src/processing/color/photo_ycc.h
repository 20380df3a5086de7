#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Converts PhotoYCC samples, one luma and two chroma per pixel, to blue, green, red for a screen.
// PhotoYCC goes beyond white; such highlights are compressed, not clipped. Source: Kodak, "Fully
// Utilizing Photo CD Images, Article No. 4: PhotoYCC Color Encoding and Compression Schemes"
// (PCD045), with a simpler curve instead of its look-up table for screens.
void PhotoYccToColors(const uint8_t* luma, const uint8_t* chroma1, const uint8_t* chroma2,
                      size_t count, uint8_t* bgr);

}  // namespace fotomill
