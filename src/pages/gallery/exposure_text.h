#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill {

// Camera, exposure time, aperture, sensitivity and focal length of an EXIF block, as far as it has
// them: "Canon DIGITAL IXUS · 1/320 s · f/4 · ISO 100 · 10.8 mm".
std::string ExposureText(std::span<const uint8_t> exif);

}  // namespace fotomill
