#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

#include "formats/format_entry.h"
#include "texts/texts.h"

namespace fotomill {

inline constexpr int32_t kSpareRow = 77;  // index of SpareRow
inline constexpr int32_t formatCount = 78;  // including the spare row
using FormatTable = std::array<FormatEntry, formatCount>;

// The rows exported by the codec families, in the
// order of formats/families.def. They are static.
std::vector<std::span<const FormatEntry>> FormatFamilies();

// All rows in registry order: those of the
// families, and the formats without a codec.
FormatTable MakeFormatTable();

// The placeholder row for a plug-in format.
constexpr FormatEntry SpareRow() {
  return {.flags = FMT_SPARE, .whyNot = TrLater("No plug-in uses this row.")};
}

}  // namespace fotomill
