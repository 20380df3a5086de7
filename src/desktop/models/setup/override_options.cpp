#include "desktop/models/setup/override_options.h"

#include <algorithm>

#include "registry/registry.h"

namespace fotomill::desktop {

const FormatSettings* FindOverrideOptions(std::string_view extension) {
  const int32_t row = FindFormatByName("a." + std::string(extension));
  return row == kNoFormat || !CanWrite(FormatRow(row)) ? nullptr : FormatRow(row).settings;
}

std::vector<SetupItem> ItemsOf(const FormatSettings& options) {
  std::vector<SetupItem> items;
  for (const FormatSetting& setting : options.keys) {
    const auto named = [&](const SetupItem& item) { return KeyOf(item.key).name == setting.key; };
    const auto found = std::ranges::find_if(SetupItems(), named);
    if (found != SetupItems().end()) items.push_back(*found);
  }
  return items;
}

}  // namespace fotomill::desktop
