#pragma once

#include <string>
#include <vector>

#include "cli/frame/command.h"

namespace fotomill::cli {

// Initializes what a command needs: the data folder from --data, the configuration,
// --set, the format registry. Returns an error message for an invalid command line, else
// empty.
std::string PrepareFor(const Command& command, const GlobalOptions& global);
// Warnings about --set keys that this build does not use, a sentence each.
std::vector<std::string> UnusedSettings(const GlobalOptions& global);
// Shuts down the format registry, after the command.
void FinishAfter(const Command& command);

}  // namespace fotomill::cli
