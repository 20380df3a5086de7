#pragma once

#include <cstddef>
#include <cstdint>

// Interface between the program and its face detector, a module loaded only in a worker process
// (modules/faces). The module depends on nothing else.

extern "C" {

// A face in a gray picture, in pixels from the top left corner.
struct FotomillFace {
  int32_t x, y, width, height;
};

// Finds faces in a picture of 8-bit gray samples, top row first, rows
// `stride` bytes apart. `cascade` is the path of the trained classifier
// (OpenCV's XML); `smallest` the minimum face size in pixels. At most
// `most` faces are stored. Returns their number, or kFotomillNoCascade.
using FotomillFindFaces = int32_t(const uint8_t* gray, int32_t width, int32_t height,
                                  ptrdiff_t stride, const char* cascade, int32_t smallest,
                                  FotomillFace* faces, int32_t most);
inline constexpr int32_t kFotomillNoCascade = -1;
inline constexpr char kFotomillFindFaces[] = "FotomillFindFacesOf";  // the module's export

}  // extern "C"
