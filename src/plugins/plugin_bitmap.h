#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "picture/packed_image.h"

namespace fotomill {

// Converts a device-independent bitmap returned by a module: a BITMAPINFOHEADER of at least 40
// bytes, 1, 4, 8, 24 or 32 bits, uncompressed, bottom-up or top-down. The fourth byte of 32-bit
// pixels goes into `alpha`. DamagedFile (2) if the block is smaller than its header claims or the
// header is invalid, UnsupportedFormat (8) for other depths and for compression,
// MemoryAllocationError (6). `palette` receives the colors of up to 8 bits.
Status TakeModuleBitmap(std::span<const uint8_t> block, PackedImage& image, PackedImage& alpha,
                        Palette& palette);

// The reverse: a new module block with the packed bitmap of a picture, 32 bits if there is an alpha
// plane. The caller frees it with platform::FreeModuleBlock. Null if memory runs out.
void* NewModuleBitmap(const PackedImage& image, const PackedImage& alpha);

}  // namespace fotomill
