#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/programs.h"

namespace fotomill::platform {

// The texts in which free desktops keep what programs there are for which files. Sources: freedesktop.org, "Desktop Entry
// Specification", "Association between MIME types and applications", "Shared MIME-info Database".

// The type of a file by its name, from the text of a file "globs2": lines "WEIGHT:TYPE:PATTERN". Of several patterns the
// heaviest counts, then the longest. Empty when none matches; patterns with marks other than one leading "*" match nothing.
std::string MimeTypeIn(std::string_view globs, std::string_view name);

// What a file "mimeapps.list" or "mimeinfo.cache" says of a type: names of desktop entries.
struct Associations {
  std::vector<std::string> programs;  // the default first
  std::vector<std::string> removed;
};
// Those of one type in the text of a "mimeapps.list" or "mimeinfo.cache".
Associations AssociationsIn(std::string_view list, std::string_view type);

// The program of a desktop entry's text. nullopt for an entry that is hidden, is no application or runs in a terminal.
std::optional<Program> ProgramOfEntry(std::string_view entry);

// The words of an entry's command line with its quotes and escapes taken off; nullopt for a quote that does not close.
std::optional<std::vector<std::string>> SplitExec(std::string_view line);

}  // namespace fotomill::platform
