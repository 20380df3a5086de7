#pragma once

#include <span>

#include "formats/format_entry.h"

namespace fotomill {

// The rows of each family, from its rows.cpp. Their order, and so the row selected for a name, is
// up to the registry.
#define FAMILY(name) std::span<const FormatEntry> name##Rows();
#include "formats/families.def"
#undef FAMILY

}  // namespace fotomill
