#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace fotomill::desktop {

// The main facts in an EXIF block, one line each for camera, lens,
// exposure and date, if available, such as "1/125 s   f/2.8   ISO 400   50
// mm".
std::vector<std::string> PhotoFacts(std::span<const uint8_t> exif);

// The same and more facts one by one, with labels in English: "Exposure time", "1/125 s".
struct PhotoFact {
  const char* label;
  std::string value;
};
std::vector<PhotoFact> PhotoTable(std::span<const uint8_t> exif);

}  // namespace fotomill::desktop
