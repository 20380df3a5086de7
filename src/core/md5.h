#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill {

// The MD5 digest (RFC 1321) as 32 lowercase hex digits. For file names defined by others,
// not for security.
std::string Md5Text(std::span<const uint8_t> bytes);

}  // namespace fotomill
