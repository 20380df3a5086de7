#pragma once

#include <cstdint>
#include <string>

namespace fotomill {

// How faces are looked for.
struct FaceOptions {
  // The trained classifier: a path, or the name of one of those that come with OpenCV.
  std::string cascade = "haarcascade_frontalface_alt.xml";
  int32_t smallestPercent = 2;  // the smallest face that counts, in percent of the shorter edge

  bool operator==(const FaceOptions&) const = default;
};

}  // namespace fotomill
