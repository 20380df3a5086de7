#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "batch/run.h"
#include "cli/frame/command.h"
#include "cli/selection/standard_input.h"

namespace fotomill::cli {

// A file that a command line asks for. Its name is as given, or folder and name joined; `below` is
// the folder beneath the folder that was named.
using SelectedFile = BatchFile;

// How the named files and folders become a selection.
struct SelectionOptions {
  bool recursive = false;
  bool hidden = false;
  std::string filesFrom;
  bool zeroTerminated = false;
  std::string sort;  // empty: named files as named, folders in natural order
  bool reverse = false;
  bool takesInput = false;  // "-" is standard input
  std::string from;         // its format
};

// What a command line asks for.
struct Selection {
  std::vector<SelectedFile> files;
  std::string leftOut;  // what was left out of folders, a sentence; empty if nothing was
  // standard input, if it is one of the files
  std::shared_ptr<StandardInput> input = {};
};

// Whether a command line names standard input as a picture.
bool NamesInput(const CommandContext& context);

// Declares the FILE... names of a command and the options that choose files. `options.takesInput`
// counts before.
void AddSelection(CLI::App& app, SelectionOptions& options, CommandContext& context);

// The files of a command line: files as named; for a folder, its files that this build can read, in
// natural order (with `recursive` also those of subfolders, except behind links), hidden ones only
// if asked for; then the names read from a list. `sort` and `reverse` are applied to all of them
// together. A missing file is in the result with its status. nullopt, after a message, if nothing
// was named or the list cannot be read: a usage error.
std::optional<Selection> SelectFiles(const SelectionOptions& options,
                                     const CommandContext& context);

}  // namespace fotomill::cli
