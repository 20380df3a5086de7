#pragma once

#include <string>
#include <vector>

#include "cli/frame/command.h"

namespace fotomill::cli {

// Prepares what a command needs: the data folder of --data, the configuration, the values of --set,
// the formats' startup. Returns what is wrong with the command line, a whole sentence; empty if
// nothing is.
std::string PrepareFor(const Command& command, const GlobalOptions& global);
// What to tell about keys of --set that this build does not use, a sentence each.
std::vector<std::string> UnusedSettings(const GlobalOptions& global);
// The formats' shutdown, after the command.
void FinishAfter(const Command& command);

}  // namespace fotomill::cli
