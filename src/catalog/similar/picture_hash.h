#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// What a picture looks like in 64 bits: pictures that look alike have hashes that differ in few of
// them, whatever their size, format, compression and brightness.
//
// The picture is scaled to 32 x 32 pixels and turned to luma. A bit tells whether one of the 8 x 8
// lowest frequencies of its discrete cosine transform is above the median of all. Source: C.
// Zauner, "Implementation and Benchmarking of Perceptual Image Hash Functions" (2010),
// section 3.2.1.
using PictureHash = uint64_t;

// The hashes of a picture as it is, mirrored across, mirrored down, turned by 180 degrees, and the
// same four after its rows became its columns: all ways in which it can be turned and mirrored.
using PictureHashes = std::array<PictureHash, 8>;

// Statuses as ScaleFiltered. The picture may be one that was decoded smaller than it is.
Status HashPicture(const PictureRecord& picture, PictureHashes& hashes);

// In how many bits two hashes differ.
int32_t HashDistance(PictureHash a, PictureHash b);

// The digest of a picture's pixels, 32 characters: equal for pictures that look exactly the same,
// whatever their depth. MemoryAllocationError.
Status DigestPixels(const PictureRecord& picture, std::string& digest);

}  // namespace fotomill
