#pragma once

#include <cstdint>
#include <string>

namespace fotomill {

// When a picture was taken, by the EXIF entry DateTimeOriginal, on the camera's clock:
// 20040831223208 for "2004:08:31 22:32:08". 0 if the file has no such date or cannot be read.
int64_t TakenDate(const std::string& path);

}  // namespace fotomill
