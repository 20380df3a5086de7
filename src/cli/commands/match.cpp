#include "cli/commands/match.h"

#include <memory>
#include <string>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "platform/paths.h"
#include "registry/registry.h"

namespace fotomill::cli {

namespace {

struct MatchOptions {
  bool json = false;
};

// By which rule a row was found, for people who wonder why .pict is no PCT.
std::string RuleOf(const std::string& name, const FormatEntry& row) {
  const std::string extension = UpperCase(platform::ExtensionOf(name));
  if (EqualIgnoringCase(extension, row.extension)) return "extension";
  return "first three characters";
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
      output.Line(output.Shown(name) + ": no format");
    } else {
      const FormatEntry& row = FormatRow(index);
      output.Line(output.Shown(name) + ": " + extension + ", " + EscapeControls(row.description) + ", by its " +
                  RuleOf(name, row));
    }
  }
  return allMatch ? kExitOk : kExitFailed;
}

}  // namespace

void SetUpMatch(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<MatchOptions>();
  context.names.Declare("NAME...", "File names; they need not exist", 1);
  AddFlag(app, "--json", options->json, "One JSON array of {name, index, extension, typeName}");
  SetFooter(app, "The exit status is 1 when a name selects no format.\n\nExample: fotomill match scan.tiff photo.jpeg");
  context.run = [options, &context] { return RunMatch(*options, context); };
}

}  // namespace fotomill::cli
