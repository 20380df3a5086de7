#pragma once

#include <string>

namespace fotomill::desktop {

// The result of an import or export, a sentence or two.
struct Transfer {
  bool ok = false;
  std::string message;
};

// Copies the configuration file, with its comment header, to another file, atomically replacing an
// existing one. Unsaved changes are saved first.
Transfer ExportConfiguration(const std::string& path);
// Imports all keys from such a file and saves them; other keys are unchanged. Invalid values are
// ignored and counted.
Transfer ImportConfiguration(const std::string& path);

}  // namespace fotomill::desktop
