#pragma once

#include <string>

#include "cli/frame/command.h"

namespace fotomill::cli {

// Gets ready what a command needs: the data folder of --data, the configuration, the values of --set on top, the
// formats' own start. Returns what is wrong with the command line, a whole sentence; empty when all is well.
std::string PrepareFor(const Command& command, const GlobalOptions& global);
// The formats' own end, once the command has run.
void FinishAfter(const Command& command);

}  // namespace fotomill::cli
