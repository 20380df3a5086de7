#pragma once

#include <span>

#include "formats/format_entry.h"

namespace fotomill {

// The rows of each family, as its rows.cpp has them. Where a row is in the registry, and so
// which one a name selects, is the registry's matter.
#define FAMILY(name) std::span<const FormatEntry> name##Rows();
#include "formats/families.def"
#undef FAMILY

}  // namespace fotomill
