#pragma once

#include <string>
#include <string_view>

namespace fotomill::desktop {

// Pages of the documentation that the program carries with it, as docs/ has them.
extern const std::string_view kSettingsPage;       // docs/settings.md: an entry "### KEY" for each key that Setup shows
extern const std::string_view kConfigurationPage;  // docs/configuration.md

struct HelpText {
  std::string title;
  std::string text;  // paragraphs, divided by empty lines; blocks that are set in keep their lines
};
// The entry of a key; of a page that has none, the page about the configuration as a whole.
HelpText HelpOn(std::string_view page);
// Whether a key has an entry of its own.
bool HasHelpEntry(std::string_view key);

}  // namespace fotomill::desktop
