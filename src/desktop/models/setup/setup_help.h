#pragma once

#include <string>
#include <string_view>

#include "settings/key_table.h"

namespace fotomill::desktop {

// Documentation pages built into the program;
// docs/user/settings.md is in settings/key_help.h.
extern const std::string_view kConfigurationPage;  // docs/user/configuration.md
extern const std::string_view kDesktopPage;        // docs/user/desktop.md, the manual
extern const std::string_view kFormatsPage;        // docs/user/formats.md

// A documentation text, ready for display.
struct HelpText {
  std::string title;
  std::string text;  // paragraphs, separated by empty lines; indented blocks keep their lines
};
// The topic of the whole manual.
inline constexpr std::string_view kManual = "desktop";
// The topic of the formats page, for the format list in Setup.
inline constexpr std::string_view kFormatsTopic = "formats";
// The entry of a key, the part of the manual for a topic of a Help button, or one of the pages
// above; for anything else, the configuration page.
HelpText HelpOn(std::string_view topic);
// Whether a key has an entry.
bool HasHelpEntry(std::string_view key);

// The numbers a key accepts, "0 to 100"; empty if any.
std::string LimitsText(const KeyRow& row);
// Tooltip of a key's control: the first paragraph of its help, if the language is English, and its
// name.
std::string ControlTip(const KeyRow& row);

}  // namespace fotomill::desktop
