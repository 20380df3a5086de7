#include "cli/commands/transcode.h"

#include <memory>
#include <string>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "plugins/plugin_transcode.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct TranscodeOptions {
  SelectionOptions selection;
  std::string to, dest;
  bool replace = false, dryRun = false, json = false;
};

// The destination's path: the source's name with the other extension, beside it or in --dest.
std::string DestinationOf(const std::string& source, const TranscodeOptions& options) {
  const platform::PathParts parts = platform::SplitPath(source);
  const std::string folder = options.dest.empty() ? platform::FolderOf(source) : options.dest;
  const std::string name = std::string(parts.base) + "." + LowerCase(options.to);
  return folder.empty() ? name : platform::JoinFolder(folder, name);
}

std::string HintFor(Status status, const std::string& destination) {
  switch (status) {
    case Status::UnsupportedFunction: return Tr("No plug-in stores these formats without loss.");
    case Status::UnsupportedFormat: return Tr("The file cannot be stored without loss.");
    case Status::ErrorCreatingFile:
      return platform::FileExists(destination) ? Tr("The destination exists; see --replace.")
                                               : std::string();
    default: return {};
  }
}

int RunTranscode(const TranscodeOptions& options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  output.Expect(selection->files.size());
  if (!options.dest.empty() && !options.dryRun) (void)platform::MakeFolders(options.dest);
  const auto existing = options.replace ? platform::Existing::Replace : platform::Existing::Refuse;
  for (const SelectedFile& file : selection->files) {
    if (!output.GoesOn()) break;
    const std::string destination = DestinationOf(file.name, options);
    Status status = file.status;
    if (status == Status::Ok && !options.dryRun)
      status = TranscodePicture(file.name, destination, existing);
    if (status == Status::Ok) {
      output.FileDone(file.name, destination);
    } else {
      output.FileFailed(file.name, status,
                        file.hint.empty() ? HintFor(status, destination) : file.hint);
    }
  }
  return output.Finish();
}

}  // namespace

void SetUpTranscode(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<TranscodeOptions>();
  AddSelection(app, options->selection, context);
  AddChoice(app, "--to", options->to, "EXT", "The other format", {"jxl", "jpg"});
  AddText(app, "--dest", options->dest, "DIR", "Write to this folder, not beside the files");
  AddFlag(app, "--replace", options->replace, "Replace existing files");
  AddFlag(app, "--dry-run", options->dryRun, "Only print what would be written");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
  SetFooter(app,
            "JPEG files become JPEG XL files, about a fifth smaller, that give the same JPEG files "
            "back, byte for byte.\nThat is checked before anything is written.",
            "fotomill transcode holiday --to jxl --dest smaller");
  context.run = [options, &context] {
    if (options->to.empty()) return UsageError(context, Tr("Choose --to jxl or --to jpg."));
    return RunTranscode(*options, context);
  };
}

}  // namespace fotomill::cli
