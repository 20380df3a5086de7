#pragma once

#include <string>
#include <vector>

#include "cli/frame/command.h"

namespace fotomill::cli {

// Initializes what a command needs: the data folder from --data, the configuration, --set, the
// format registry. Returns an error message for an invalid command line, else empty. Adds warnings
// to `notes`, a sentence each: copied settings of a previous version, --set keys that this build
// does not use.
std::string PrepareFor(const Command& command, const GlobalOptions& global,
                       std::vector<std::string>& notes);
// Shuts down the format registry, after the command.
void FinishAfter(const Command& command);

}  // namespace fotomill::cli
