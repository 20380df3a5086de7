#pragma once

#include <optional>
#include <string>
#include <vector>

#include "cli/command.h"
#include "core/status.h"

namespace fotomill::cli {

// A file that a command line asks for.
struct SelectedFile {
  std::string name;            // as given, or folder and name joined
  std::string below;           // folder beneath the folder that was named, "" or "a/b": for outputs that keep the tree
  Status status = Status::Ok;  // FileOpenError: it is not there, or the folder `name` cannot be read
  std::string hint;            // what goes behind the message of such a failure
};

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
