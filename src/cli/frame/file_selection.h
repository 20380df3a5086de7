#pragma once

#include <optional>
#include <string>
#include <vector>

#include "batch/run.h"
#include "cli/frame/command.h"

namespace fotomill::cli {

// A file that a command line asks for. Its name is as given, or folder and name joined; `below` is the folder beneath the
// folder that was named.
using SelectedFile = BatchFile;

// How the named files and folders become a selection.
struct SelectionOptions {
  bool recursive = false;
  std::string filesFrom;
  bool zeroTerminated = false;
};

// Declares the FILE... names of a command and the options that choose files.
void AddSelection(CLI::App& app, SelectionOptions& options, CommandContext& context);

// The files of a command line: named ones in order, a folder in place of which its files stand (in byte order, those
// whose name selects a format; with `recursive` those of its folders as well, links to folders left out), names read
// from a list behind them. What is not there is in the list with its status. nullopt, after a message, when nothing was
// named or the list of names cannot be read: a usage error.
std::optional<std::vector<SelectedFile>> SelectFiles(const SelectionOptions& options, const CommandContext& context);

}  // namespace fotomill::cli
