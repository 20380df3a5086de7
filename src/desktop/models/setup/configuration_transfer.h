#pragma once

#include <string>

namespace fotomill::desktop {

// What became of an import or export: a sentence or two for people.
struct Transfer {
  bool ok = false;
  std::string message;
};

// Writes the configuration file as it is, behind its comment header, to a file of the user's; one
// that is there is replaced in one step. What was changed and not saved yet is saved first.
Transfer ExportConfiguration(const std::string& path);
// Takes the values of all keys that a file of that form holds, and saves them; other keys stay as
// they are. Values that no key takes are passed over and counted.
Transfer ImportConfiguration(const std::string& path);

}  // namespace fotomill::desktop
