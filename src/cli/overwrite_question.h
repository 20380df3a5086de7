#pragma once

#include <string>

#include "cli/command.h"

namespace fotomill::cli {

// What becomes of a file that already has the name of an output.
enum class Overwrite : uint8_t { Ask, Replace, KeepBoth, Skip };

struct OverwriteAnswer {
  Overwrite choice = Overwrite::Skip;  // never Ask
  bool forAll = false;                 // and so for the rest of the run
};

// Asks on the standard error, and again until the answer is one of those offered. The end of the input is Skip for all.
OverwriteAnswer AskAboutOverwriting(const CommandContext& context, const std::string& path);

}  // namespace fotomill::cli
