#include "cli/commands/plugins.h"

#include <memory>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "plugins/plugin_table.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct PluginsOptions {
  bool json = false;
};

Json EntryAsJson(const PluginEntry& entry) {
  Json object;
  PutName(object, "path", entry.path);
  PutName(object, "extension", entry.extension);
  PutName(object, "textA", entry.textA);
  PutName(object, "textB", entry.textB);
  object["flags1"] = entry.flags1;
  object["flags2"] = entry.flags2;
  object["canRead"] = entry.exports.readImage != nullptr;
  object["canWrite"] = entry.exports.writeImage != nullptr;
  return object;
}

int RunPlugins(const PluginsOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  if (!context.global.noPlugins) (void)ScanPlugins();
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    const PluginEntry& entry = PluginRow(i);
    if (options.json) {
      output.Element(EntryAsJson(entry));
    } else {
      const char* writes = entry.exports.writeImage != nullptr ? "read, write" : "read";
      output.Line(output.Shown(entry.extension) + "\t" + writes + "\t" + output.Shown(entry.textA) +
                  "\t" + output.Shown(entry.path));
    }
  }
  if (PluginFormatCount() == 0) output.Note(Tr("No plug-ins are loaded."));
  return kExitOk;
}

}  // namespace

void SetUpPlugins(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<PluginsOptions>();
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {path, extension, textA, textB, flags1, flags2, canRead, canWrite}");
  SetFooter(app, "Modules are loaded from the folder \"plugin\" beside the program.",
            "fotomill plugins --json");
  context.run = [options, &context] { return RunPlugins(*options, context); };
}

}  // namespace fotomill::cli
