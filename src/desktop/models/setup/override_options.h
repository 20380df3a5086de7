#pragma once

#include <string_view>
#include <vector>

#include "desktop/models/setup/setup_pages.h"
#include "formats/format_entry.h"

namespace fotomill::desktop {

// The options dialog's settings for a format, given any of its extensions, in any case; null if
// there are none or the format cannot be written.
const FormatSettings* FindOverrideOptions(std::string_view extension);
// Their rows as in Setup, those of the format first.
std::vector<SetupItem> ItemsOf(const FormatSettings& options);

}  // namespace fotomill::desktop
