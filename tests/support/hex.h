#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

namespace fotomill::test {

// Bytes from annotated hex: pairs of digits in any grouping; text from '#' to the end of the line
// is a comment.
std::vector<uint8_t> Hex(std::string_view text);

}  // namespace fotomill::test
