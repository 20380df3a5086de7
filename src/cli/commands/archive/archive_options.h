#pragma once

#include <string>

#include "cli/frame/command.h"
#include "files/numbered_name.h"

namespace fotomill::cli {

// Source of a password. Never the command line itself, which other users can see.
struct PasswordOptions {
  std::string file;
  bool ask = false;
};

// Reads the password from the first line of --password-file. Returns an error message, empty on
// success. `password` stays empty without the option.
std::string ReadPassword(const PasswordOptions& options, std::string& password);

// Sets the default for --overwrite. Returns an
// error message, empty if the value is valid.
std::string SettleOverwrite(const CommandContext& context, std::string& overwrite);
void AddOverwrite(CLI::App& app, std::string& overwrite);

// Replaces a path with a free numbered variant; false if there is none.
bool KeepBoth(std::string& path, const TakenTest& taken);

}  // namespace fotomill::cli
