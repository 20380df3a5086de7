#include "cli/commands/formats.h"

#include <memory>
#include <string>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct FormatsOptions {
  bool json = false;
  bool destinations = false;
  bool filter = false;
};

Json RowAsJson(int32_t index) {
  const FormatEntry& row = FormatRow(index);
  Json element;
  element["index"] = index;
  element["extension"] = row.extension.view();
  element["description"] = row.description.view();
  element["enabled"] = row.enabled != 0;
  element["flags"] = row.flags;
  element["maxBits"] = row.maxBits;
  if (row.limits.width < INT32_MAX) element["maxWidth"] = row.limits.width;
  if (row.limits.height < INT32_MAX) element["maxHeight"] = row.limits.height;
  if (row.limits.exact) element["exactSize"] = true;
  element["writesPages"] = row.sequence != nullptr;
  element["childProcess"] = row.childTask != nullptr;
  element["details"] = row.details != nullptr;
  element["options"] = row.options != nullptr;
  element["startup"] = row.canStartUp;
  element["read"] = CanRead(row);
  element["write"] = CanWrite(row);
  if (const std::string_view reason = WhyNot(row); !reason.empty()) element["reason"] = reason;
  return element;
}

std::string RowAsText(int32_t index) {
  const FormatEntry& row = FormatRow(index);
  char front[48];
  std::snprintf(front, sizeof front, "%2d  %-6.6s  %-5s %-5s  ", index, row.extension.c_str(),
                CanRead(row) ? "read" : "", CanWrite(row) ? "write" : "");
  std::string line = EscapeControls(front) + EscapeControls(row.description);
  if (row.enabled == 0) line += std::string(" ") + Tr("(disabled)");
  return line;
}

std::string PluginAsText(const PluginFormatFacts& format) {
  char front[48];
  std::snprintf(front, sizeof front, "    %-6.6s  read  %-5s  ", format.extension.c_str(),
                format.canWrite ? "write" : "");
  return EscapeControls(front) + EscapeControls(PluginDescription(format));
}

int RunFormats(const FormatsOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  if (options.destinations) {
    for (const std::string& extension : DestinationExtensions()) output.Line(extension);
  } else if (options.filter) {
    for (const FilterPair& pair : OpenFileFilter())
      output.Line(pair.description + "\t" + pair.patterns);
  } else {
    for (int32_t index = 0; index < formatCount; ++index) {
      if (output.IsJson()) {
        output.Element(RowAsJson(index));
      } else if ((FormatRow(index).flags & FMT_SPARE) == 0) {
        output.Line(RowAsText(index));
      }
    }
    for (const PluginFormatFacts& format : PluginFormats()) {
      if (!output.IsJson()) output.Line(PluginAsText(format));
    }
  }
  return kExitOk;
}

}  // namespace

void SetUpFormats(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<FormatsOptions>();
  CLI::Option* json =
      AddFlag(app, "--json", options->json,
              "Print a JSON array of {index, extension, description, enabled, flags, maxBits, "
              "writesPages, childProcess, details, options, startup, read, write, reason}");
  CLI::Option* destinations = AddFlag(app, "--destinations", options->destinations,
                                      "List the output formats, one per line");
  CLI::Option* filter =
      AddFlag(app, "--filter", options->filter,
              "List the file filters of the Open dialog: description, tab, patterns");
  Exclude(destinations, json);
  Exclude(destinations, filter);
  Exclude(filter, json);
  SetFooter(app, "Columns: index, extension, capabilities of this build, description.",
            "fotomill formats --json");
  context.run = [options, &context] { return RunFormats(*options, context); };
}

}  // namespace fotomill::cli
