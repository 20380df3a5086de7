#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace fotomill {

// The MD5 digest (RFC 1321) as 32 lower-case hexadecimal digits. For names that others give their
// files, not for secrets.
std::string Md5Text(std::span<const uint8_t> bytes);

}  // namespace fotomill
