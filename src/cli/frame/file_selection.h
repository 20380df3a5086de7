#pragma once

#include <optional>
#include <string>
#include <vector>

#include "batch/run.h"
#include "cli/frame/command.h"

namespace fotomill::cli {

// A file that a command line asks for. Its name is as given, or folder and name joined; `below` is
// the folder beneath the folder that was named.
using SelectedFile = BatchFile;

// How the named files and folders become a selection.
struct SelectionOptions {
  bool recursive = false;
  std::string filesFrom;
  bool zeroTerminated = false;
};

// Declares the FILE... names of a command and the options that choose files.
void AddSelection(CLI::App& app, SelectionOptions& options, CommandContext& context);

// The files of a command line in order: files as named; for a folder, its files whose name selects
// a format, in byte order (with `recursive` also those of subfolders, except behind links); then
// the names read from a list. A missing file is in the result with its status. nullopt, after a
// message, if nothing was named or the list cannot be read: a usage error.
std::optional<std::vector<SelectedFile>> SelectFiles(const SelectionOptions& options,
                                                     const CommandContext& context);

}  // namespace fotomill::cli
