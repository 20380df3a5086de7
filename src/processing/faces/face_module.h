#pragma once

#include <cstddef>
#include <cstdint>

// The boundary between the program and its face detector, a module that is loaded where a process
// of its own looks for faces (modules/faces). The module knows only this header.

extern "C" {

// A face in a gray picture, in pixels from the top left corner.
struct FotomillFace {
  int32_t x, y, width, height;
};

// Looks for faces in a picture of 8-bit gray samples, rows from the top and `stride` bytes apart.
// `cascade` is the path of the trained classifier (OpenCV's XML); `smallest` the edge of the
// smallest face that counts, in pixels. At most `most` faces are stored. Returns their number, or
// kFotomillNoCascade.
using FotomillFindFaces = int32_t(const uint8_t* gray, int32_t width, int32_t height,
                                  ptrdiff_t stride, const char* cascade, int32_t smallest,
                                  FotomillFace* faces, int32_t most);
inline constexpr int32_t kFotomillNoCascade = -1;
inline constexpr char kFotomillFindFaces[] = "FotomillFindFacesOf";  // the module's export

}  // extern "C"
