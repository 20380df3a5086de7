#pragma once

#include <string>

#include "cli/frame/command.h"
#include "cli/selection/file_selection.h"
#include "printing/page_kind.h"

namespace fotomill::cli {

// Options that all commands that make pages share, besides those of the kinds of pages.
struct PageCommandOptions {
  SelectionOptions selection;
  std::string out, to, dest, printer;
  std::string overwrite = "refuse";
  int32_t dpi = 0;
  int32_t jobs = 0;
  bool dryRun = false;
  bool json = false;
};

// Declares the selection and the options for output.
void AddPageOutput(CLI::App& app, PageCommandOptions& options, CommandContext& context);

// Reads the selection, makes the pages and writes them as a PDF file, as pictures, or to a printer.
// Returns the exit status.
int RunPages(const PageCommandOptions& options, PagePlan plan, const CommandContext& context);

}  // namespace fotomill::cli
