#include "settings/folder_override.h"

#include "core/choice_lists.h"
#include "core/ini_file.h"
#include "core/limits.h"
#include "core/whole_number.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

constexpr std::string_view kOverrideFile = "fmwpro.override";

void TakeMode(std::string_view text, std::string_view key, int32_t last, int32_t& mode) {
  const auto value = FindIniValue(text, kConfigurationSection, key);
  const auto number = value ? ParseNumber(*value) : std::nullopt;
  if (number && *number >= 0 && *number <= last) mode = *number;
}

}  // namespace

BrowserModes ModesForFolder(const std::string& folder, const BrowserModes& current) {
  if (settings.UseFolderOverrides == 0) return current;
  std::string text;
  const auto read = platform::ReadWholeFile(platform::JoinFolder(folder, kOverrideFile),
                                            limits.listFileBytes, text);
  return read == platform::ReadResult::Done ? ModesInOverride(text, current) : current;
}

BrowserModes ModesInOverride(std::string_view text, const BrowserModes& current) {
  BrowserModes modes = current;
  TakeMode(text, "ThumbnailMode", choice::kLocalDatabase, modes.thumbnails);
  TakeMode(text, "ViewMode", choice::kViewLarge, modes.view);
  TakeMode(text, "SortMode", choice::kSortDimensions, modes.sort);
  return modes;
}

}  // namespace fotomill
