#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Replaces each of `count` values by its entry in a table of 256 bytes.
using TableRow = void (*)(const uint8_t* table, uint8_t* values, size_t count);

// For this processor, and portable. The results are identical.
TableRow TableRowHere();
TableRow BaselineTableRow();

}  // namespace fotomill
