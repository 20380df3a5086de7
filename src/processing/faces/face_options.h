#pragma once

#include <cstdint>
#include <string>

namespace fotomill {

// Options for finding faces.
struct FaceOptions {
  // The trained classifier: a path, or the name of one from OpenCV.
  std::string cascade = "haarcascade_frontalface_alt.xml";
  int32_t smallestPercent = 2;  // minimum face size, in percent of the shorter edge

  bool operator==(const FaceOptions&) const = default;
};

}  // namespace fotomill
