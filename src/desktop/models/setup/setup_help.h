#pragma once

#include <string>
#include <string_view>

namespace fotomill::desktop {

// Pages of the documentation that are part of the program; docs/user/settings.md is in
// settings/key_help.h.
extern const std::string_view kConfigurationPage;  // docs/user/configuration.md
extern const std::string_view kDesktopPage;        // docs/user/desktop.md, the manual

// A text of the documentation, ready to be shown.
struct HelpText {
  std::string title;
  std::string text;  // paragraphs, divided by empty lines; blocks that are set in keep their lines
};
// The topic that stands for the whole manual.
inline constexpr std::string_view kManual = "desktop";
// The entry of a key, the part of the manual for a topic that a Help button names, or the manual;
// for anything else the page about the configuration as a whole.
HelpText HelpOn(std::string_view topic);
// Whether a key has an entry of its own.
bool HasHelpEntry(std::string_view key);

}  // namespace fotomill::desktop
