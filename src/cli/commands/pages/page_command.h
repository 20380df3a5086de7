#pragma once

#include <optional>
#include <string>

#include "cli/frame/command.h"
#include "cli/selection/file_selection.h"
#include "pages/model/paper.h"
#include "pages/page_run.h"

namespace fotomill::cli {

// Options that all commands that make pages share.
struct PageCommandOptions {
  SelectionOptions selection;
  std::string out, to, dest, printer;
  std::string paper = "A4", margin;
  std::string overwrite = "refuse";
  int32_t dpi = 0;
  int32_t jobs = 0;
  int32_t brightness = 0, contrast = 0;
  bool landscape = false;
  bool dryRun = false;
  bool json = false;
};

// The page itself. Lengths in millimeters.
struct PageSetup {
  PaperSize paper;
  double margin = 0;
};

// Declares the selection and the shared options.
void AddPageOptions(CLI::App& app, PageCommandOptions& options, CommandContext& context);

// Parses paper and margin. Returns an error message, empty on success. `margin` is the default.
std::string ReadPageSetup(const PageCommandOptions& options, double margin, PageSetup& setup);
// Parses a grid, "4x5": columns and rows from 1 to 100. False if it is none.
bool ReadGrid(const std::string& text, int32_t& columns, int32_t& rows);
// Parses a color, RRGGBB. nullopt if it is none.
std::optional<Color> ReadColor(std::string_view text);

// What a command makes of the shared options.
struct PageCommand {
  PageRunOptions run;
  std::string prefix;     // of the names of pages with --to
  double usualDpi = 300;  // of pages with --to
  std::string leftOut = {};  // why a picture may be on no page, printed after the message
};

// Reads the selection, makes the pages and writes them as a PDF file, as pictures, or to a printer.
// Returns the exit status.
int RunPages(const PageCommandOptions& options, PageCommand command, const CommandContext& context);

}  // namespace fotomill::cli
