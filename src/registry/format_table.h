#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

#include "formats/format_entry.h"
#include "texts/texts.h"

namespace fotomill {

inline constexpr int32_t kSpareRow = 77;  // number of SpareRow
inline constexpr int32_t formatCount = 78;  // rows, the spare one included
using FormatTable = std::array<FormatEntry, formatCount>;

// The rows as the families of codecs export them, in the order of formats/families.def. They live
// as long as the program.
std::vector<std::span<const FormatEntry>> FormatFamilies();

// All rows in the order of the registry: those of the families, and between them the formats that
// no codec knows.
FormatTable MakeFormatTable();

// The row that waits for a plug-in's format.
constexpr FormatEntry SpareRow() {
  return {.flags = FMT_SPARE, .whyNot = TrLater("No plug-in uses this row.")};
}

}  // namespace fotomill
