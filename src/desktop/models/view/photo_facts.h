#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace fotomill::desktop {

// What a photographer wants to know of an EXIF block, a line each for camera, lens, exposure and
// date; lines about which the block says nothing are left out. "1/125 s   f/2.8   ISO 400   50 mm"
// is such a line.
std::vector<std::string> PhotoFacts(std::span<const uint8_t> exif);

}  // namespace fotomill::desktop
