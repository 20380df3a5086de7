#include "cli/commands/verify.h"

#include <memory>
#include <string>

#include "batch/picture_failure.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "registry/verify_picture.h"
#include "settings/job_options.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct VerifyOptions {
  SelectionOptions selection;
  bool json = false;
};

int RunVerify(const VerifyOptions& options, const CommandContext& context) {
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  output.Expect(selection->files.size());
  for (const SelectedFile& file : selection->files) {
    if (!output.GoesOn()) break;
    std::string hint = file.hint, note;
    const Status status = file.status == Status::Ok
                              ? VerifyPicture(file.name, ReadOptionsFromSettings(), hint, note)
                              : file.status;
    if (output.IsJson()) {
      Json element;
      PutName(element, "file", file.name);
      PutStatus(element, status);
      output.Element(element);
    }
    if (status != Status::Ok) {
      output.Failure(file.name, status, hint.empty() ? OpenHint(file.name, status) : hint);
      continue;
    }
    output.CountFile();
    if (!output.IsJson()) output.Line(output.Shown(file.name) + ": " + StatusText(status));
    if (context.global.verbose && !note.empty())
      output.Note(output.Shown(file.name) + ": " + output.Shown(note));
  }
  return output.Finish();
}

}  // namespace

void SetUpVerify(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<VerifyOptions>();
  AddSelection(app, options->selection, context);
  AddFlag(app, "--json", options->json, "Print a JSON array of {file, status, message}");
  SetFooter(app, "Decodes every page of every file; writes nothing.", "fotomill verify -r holiday");
  context.run = [options, &context] { return RunVerify(*options, context); };
}

}  // namespace fotomill::cli
