#pragma once

#include <optional>
#include <span>
#include <string_view>

namespace fotomill {

// A size in millimeters.
struct PaperSize {
  double width = 0, height = 0;
  PaperSize Turned() const { return {height, width}; }
  bool operator==(const PaperSize&) const = default;
};

// A paper or print size by name, upright.
struct NamedSize {
  const char* name;
  PaperSize size;
  bool upright = false;  // never turned: faces on identity cards
};

// Papers: ISO 216 (A and B series), JIS B, and the usual American ones.
std::span<const NamedSize> Papers();
// Sizes of prints: common photo sizes, and those of passports and identity cards (ISO/IEC 7810).
std::span<const NamedSize> PrintSizes();

// The limits for a side of a page, in millimeters: those of PDF readers, 14400 points.
inline constexpr double kLeastSide = 1, kMostSide = 5080;

// Parses a length with a unit, "10mm", "2.5cm", "4in", "72pt"; without a unit, `unit` millimeters
// are one. nullopt if it is not a length or negative.
std::optional<double> ParseLength(std::string_view text, double unit = 1);
// Parses a size: a name from `names` (case is ignored), or "WxH" with a unit: "10x15cm", "4x6in",
// "100x150" in millimeters. Both sides must be within the limits.
std::optional<PaperSize> ParseSize(std::string_view text, std::span<const NamedSize> names);

}  // namespace fotomill
