#pragma once

#include <cstdint>
#include <vector>

#include <libraw/libraw.h>

// The facts that the library knows about a picture, as an EXIF block, upright.
// Source: CIPA DC-008-2012 (Exif 2.3), sections 4.5 and 4.6.
std::vector<uint8_t> ExifOf(const libraw_data_t& raw);
