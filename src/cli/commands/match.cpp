#include "cli/commands/match.h"

#include <memory>
#include <string>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct MatchOptions {
  bool json = false;
};

// "EXT, DESCRIPTION, by its extension": the rule explains why .pict does not select PCT.
std::string MatchText(const std::string& name, const FormatEntry& row) {
  const std::string description = EscapeControls(row.description);
  const bool whole = EqualIgnoringCase(platform::ExtensionOf(name), row.extension);
  return whole ? Tr("%1, %2, by its extension", row.extension.view(), description)
               : Tr("%1, %2, by its first three characters", row.extension.view(), description);
}

int RunMatch(const MatchOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  bool allMatch = true;
  for (const std::string& name : context.names.values) {
    const int32_t index = FindFormatByName(name);
    allMatch = allMatch && index != kNoFormat;
    const std::string extension(index == kNoFormat ? "" : FormatRow(index).extension.view());
    if (output.IsJson()) {
      Json element;
      PutName(element, "name", name);
      element["index"] = index;
      element["extension"] = extension;
      PutName(element, "typeName", DescribeFileType(name));
      output.Element(element);
    } else if (index == kNoFormat) {
      output.Line(output.Shown(name) + ": " + Tr("no format"));
    } else {
      output.Line(output.Shown(name) + ": " + MatchText(name, FormatRow(index)));
    }
  }
  return allMatch ? kExitOk : kExitFailed;
}

}  // namespace

void SetUpMatch(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<MatchOptions>();
  context.names.Declare("NAME...", "File names; they need not exist", 1);
  AddFlag(app, "--json", options->json, "Print a JSON array of {name, index, extension, typeName}");
  SetFooter(app, "The exit status is 1 if a name selects no format.",
            "fotomill match scan.tiff photo.jpeg");
  context.run = [options, &context] { return RunMatch(*options, context); };
}

}  // namespace fotomill::cli
