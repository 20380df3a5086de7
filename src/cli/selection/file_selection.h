#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "batch/batch_file.h"
#include "cli/frame/command.h"
#include "cli/selection/standard_input.h"

namespace fotomill::cli {

// A file from the command line. Its name is as given, or joined from folder and name; `below` is
// the subfolder relative to the given folder.
using SelectedFile = BatchFile;

// Options for selecting files.
struct SelectionOptions {
  bool recursive = false;
  bool hidden = false;
  std::string filesFrom;
  bool zeroTerminated = false;
  std::string sort;  // empty: files as given, folders in natural order
  bool reverse = false;
  bool takesInput = false;  // "-" is standard input
  std::string from;         // its format; empty: detect
};

// The selected files.
struct Selection {
  std::vector<SelectedFile> files;
  std::string leftOut;  // summary of ignored files in folders, a sentence or empty
  // standard input, if selected
  std::shared_ptr<StandardInput> input = {};
};

// Whether "-" is among the names.
bool NamesInput(const CommandContext& context);

// Declares the FILE... names and the options that
// select files. Set `options.takesInput` first.
void AddSelection(CLI::App& app, SelectionOptions& options, CommandContext& context);

// Selects the files of a command line: given files in their order; for a folder, its readable files
// in natural order (with `recursive` also in subfolders, but not through links), hidden ones only
// on request; then the names from a list. `sort` and `reverse` apply to all of them together.
// Missing files are included with their status. nullopt, after printing a message, for a usage
// error: no names, or the list cannot be read.
std::optional<Selection> SelectFiles(const SelectionOptions& options,
                                     const CommandContext& context);

}  // namespace fotomill::cli
