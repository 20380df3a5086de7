#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "containers/jpeg_segments.h"

namespace fotomill {

// XMP beyond the size of a segment is stored in a second packet, split over APP1 segments: after
// the signature follow the digest of that packet (32 hex digits), its size and the offset of this
// part (4 bytes each, big-endian). Source: XMP specification part 3, section 1.1.3.1.
inline constexpr std::string_view kExtendedXmpHead("http://ns.adobe.com/xmp/extension/\0", 35);
inline constexpr size_t kExtendedXmpFields = 32 + 4 + 4;

// The part of a segment; empty for other segments.
struct ExtendedXmpPart {
  std::string_view digest;
  uint32_t size = 0, offset = 0;  // of the packet, and of the part in it
  std::span<const uint8_t> data;
};
ExtendedXmpPart ExtendedXmpPartOf(const JpegSegment& segment);

// The packet with a digest, put together; empty if it is not complete.
std::vector<uint8_t> JoinExtendedXmp(const JpegHead& head, std::string_view digest);

}  // namespace fotomill
