#pragma once

#include <string>

#include "cli/frame/command.h"
#include "files/numbered_name.h"

namespace fotomill::cli {

// Where a password comes from. Never from the command line itself, which other users can see.
struct PasswordOptions {
  std::string file;
  bool ask = false;
};

// Reads the password of --password-file, its first line. Returns what is wrong, a sentence; empty
// if nothing is. `password` stays empty without the option.
std::string ReadPassword(const PasswordOptions& options, std::string& password);

// What happens to existing files: the value of --overwrite, or its default. Returns what is wrong
// with it, a sentence; empty if nothing is.
std::string SettleOverwrite(const CommandContext& context, std::string& overwrite);
void AddOverwrite(CLI::App& app, std::string& overwrite);

// Replaces a path by its free numbered variant; false if there is none.
bool KeepBoth(std::string& path, const TakenTest& taken);

}  // namespace fotomill::cli
