#pragma once

#include <cstdint>
#include <string>

namespace fotomill {

// When a picture was taken, from the EXIF entry DateTimeOriginal, by the camera's clock:
// 20040831223208 for "2004:08:31 22:32:08". 0 if missing or unreadable. Plug-ins are asked about
// files of their formats.
int64_t TakenDate(const std::string& path);

}  // namespace fotomill
