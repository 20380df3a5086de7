#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace fotomill {

// Photoshop image resources, as in APP13 segments of JPEG files and in TIFF files.
inline constexpr std::string_view kPhotoshopHead("Photoshop 3.0\0", 14);  // of the segments
inline constexpr uint16_t kIptcResource = 0x0404;
inline constexpr uint16_t kIptcDigestResource = 0x0425;  // MD5 of the IPTC data, 16 bytes
inline constexpr uint16_t kProfileResource = 0x040F;     // ICC
inline constexpr uint16_t kExifResource = 0x0422;        // starting at the byte order
inline constexpr uint16_t kXmpResource = 0x0424;

struct PhotoshopResource {
  uint16_t number = 0;
  std::span<const uint8_t> data;   // without padding
  std::span<const uint8_t> whole;  // with header and padding
};

// The complete resources of a block, in order. `complete` is false if something follows them that
// is not a resource.
std::vector<PhotoshopResource> PhotoshopResources(std::span<const uint8_t> block, bool& complete);

// The data of the first resource with a number; empty if there is none.
std::span<const uint8_t> FindPhotoshopResource(std::span<const uint8_t> block, uint16_t number);

// A copy of a block with the data of resources replaced: those with the number of an item get its
// data, all else stays the same. Resources that are not there are not added.
struct NewResource {
  uint16_t number = 0;
  std::span<const uint8_t> data;
};
std::vector<uint8_t> ReplacePhotoshopResources(std::span<const uint8_t> block,
                                               std::span<const NewResource> items);

}  // namespace fotomill
