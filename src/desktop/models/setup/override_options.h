#pragma once

#include <string_view>
#include <vector>

#include "desktop/models/setup/setup_pages.h"
#include "formats/format_entry.h"

namespace fotomill::desktop {

// The options that a destination step offers for one format, by its extension, in any case and by
// any of its rows' extensions; null when it has none or cannot be written.
const FormatSettings* FindOverrideOptions(std::string_view extension);
// Their rows as Setup has them, those of the format first.
std::vector<SetupItem> ItemsOf(const FormatSettings& options);

}  // namespace fotomill::desktop
