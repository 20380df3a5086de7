#pragma once

#include <cstdint>
#include <string>

namespace fotomill::desktop {

// Formats a time by choice::DateMode: "Saturday, November 21, 2026 7:05:09 p.m.", the same with
// 19:05:09, "2026-11-21 7:05 p.m.", "2026-11-21 19:05". Empty if out of range.
std::string HistoryDate(int64_t seconds, int32_t mode);

}  // namespace fotomill::desktop
