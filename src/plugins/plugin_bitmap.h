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

// The largest block that a module may return for a picture of that size, which CheckPackedSize has
// allowed.
uint64_t LargestModuleBitmap(int32_t width, int32_t height);

// The reverse: the packed bitmap of a picture for a module, 32 bits if there is an alpha plane. Its
// size, and the bitmap itself in a block of that size.
uint64_t ModuleBitmapSize(const PackedImage& image, const PackedImage& alpha);
void PutModuleBitmap(const PackedImage& image, const PackedImage& alpha, std::span<uint8_t> block);

}  // namespace fotomill
