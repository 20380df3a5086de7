#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// A 64-bit perceptual hash: the hashes of similar pictures differ in few bits, regardless of size,
// format, compression and brightness.
//
// The picture is scaled to 32 x 32 pixels and converted to luma. Each bit
// is set if one of the 8 x 8 lowest frequencies of the discrete cosine
// transform is above their median. Source: C. Zauner, "Implementation and
// Benchmarking of Perceptual Image Hash Functions" (2010), section 3.2.1.
using PictureHash = uint64_t;

// The hashes of a picture unchanged, mirrored horizontally, mirrored vertically and rotated by 180
// degrees, and the same four after transposing it: all eight orientations.
using PictureHashes = std::array<PictureHash, 8>;

// The picture may be a reduced decode. Statuses of ScaleFiltered.
Status HashPicture(const PictureRecord& picture, PictureHashes& hashes);

// Number of differing bits.
int32_t HashDistance(PictureHash a, PictureHash b);

// A digest of the pixels, 32 characters: equal for pictures that look exactly the same, regardless
// of depth. MemoryAllocationError.
Status DigestPixels(const PictureRecord& picture, std::string& digest);

}  // namespace fotomill
