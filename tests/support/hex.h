#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

namespace fotomill::test {

// Bytes from annotated hex: pairs of digits in any grouping; everything after a '#' up to the
// line's end is a remark.
std::vector<uint8_t> Hex(std::string_view text);

}  // namespace fotomill::test
