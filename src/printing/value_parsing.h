#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "pages/model/page.h"
#include "pages/model/paper.h"

namespace fotomill {

// Functions that read values of options. They return what is wrong with a text, translated, and
// keep the old value then, as they do for an empty text; empty on success.

// A length in millimeters; without a unit, `unit` millimeters are one.
std::string ReadLength(const std::string& text, double& length, double unit = 1);
// A grid, "4x5": columns and rows from 1 to 100.
std::string ReadGrid(const std::string& text, int32_t& columns, int32_t& rows);
// A color, RRGGBB, with or without "#".
std::string ReadColor(const std::string& text, Color& color);
// Whether the macros of a text are known.
std::string CheckMacros(const std::string& text);

// The names of sizes, in their order.
std::vector<std::string> NamesOf(std::span<const NamedSize> sizes);

}  // namespace fotomill
