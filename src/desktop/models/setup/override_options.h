#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "desktop/models/setup/setup_pages.h"

namespace fotomill::desktop {

// The options of one format that a destination step offers: what its box is named, and which settings it shows.
struct OverrideOptions {
  const char* extension;  // of the format's row in the registry
  const char* box;        // "OverrideJpgBox"
  std::vector<KeyNumber> keys;
};

// The options of a format by its extension, in any case and by any of its rows' extensions; null when it has none.
const OverrideOptions* FindOverrideOptions(std::string_view extension);
// Their rows as Setup has them, those of the format first.
std::vector<SetupItem> ItemsOf(const OverrideOptions& options);
const std::vector<OverrideOptions>& AllOverrideOptions();

}  // namespace fotomill::desktop
