#include "cli/commands/plugins.h"

#include <algorithm>
#include <memory>
#include <string_view>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "platform/paths.h"
#include "plugins/plugin_table.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct PluginsOptions {
  bool json = false;
};

Json OptionAsJson(const ModuleOption& option, int32_t value) {
  constexpr const char* kKinds[] = {"switch", "number", "choice"};
  Json object{{"name", option.name},
              {"label", option.label},
              {"kind", kKinds[std::clamp(option.kind, 0, 2)]},
              {"value", value},
              {"default", option.standard}};
  if (option.kind == FMW_OPTION_NUMBER) {
    object["minimum"] = option.least;
    object["maximum"] = option.most;
  }
  if (!option.choices.empty()) object["choices"] = option.choices;
  return object;
}

// The lines of a module's list of libraries.
Json LibrariesAsJson(std::string_view list) {
  Json libraries = Json::array();
  while (!list.empty()) {
    const std::string_view line = list.substr(0, list.find('\n'));
    list.remove_prefix(std::min(line.size() + 1, list.size()));
    const size_t first = line.find('\t'), second = line.rfind('\t');
    if (first == std::string_view::npos || first == second) continue;
    libraries.push_back({{"name", line.substr(0, first)},
                         {"version", line.substr(first + 1, second - first - 1)},
                         {"license", line.substr(second + 1)}});
  }
  return libraries;
}

Json EntryAsJson(const PluginEntry& entry, const ModuleFacts& facts) {
  Json object;
  PutName(object, "path", entry.path);
  PutName(object, "extension", entry.extension);
  PutName(object, "textA", entry.textA);
  PutName(object, "textB", entry.textB);
  object["flags1"] = entry.flags1;
  object["flags2"] = entry.flags2;
  object["canRead"] = true;
  object["canWrite"] = facts.writes;
  object["version"] = facts.version;
  object["copyright"] = facts.copyright;
  object["libraries"] = LibrariesAsJson(facts.libraries);
  object["apart"] = entry.module == nullptr;
  object["options"] = Json::array();
  const std::string module(platform::FileNameOf(entry.path.view()));
  const ModuleOptionValues values = OptionValuesOf(module, facts);
  for (size_t i = 0; i < facts.options.size(); ++i)
    object["options"].push_back(OptionAsJson(facts.options[i], values[i]));
  return object;
}

int RunPlugins(const PluginsOptions& options, const CommandContext& context) {
  ResultOutput output(context, options.json);
  if (!context.global.noPlugins) (void)ScanPlugins();
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    const PluginEntry& entry = PluginRow(i);
    if (options.json) {
      output.Element(EntryAsJson(entry, PluginFacts(i)));
    } else {
      const char* writes = PluginFacts(i).writes ? "read, write" : "read";
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
  AddFlag(
      app, "--json", options->json,
      "Print a JSON array of {path, extension, textA, textB, flags1, flags2, canRead, canWrite, "
      "version, copyright, libraries, apart, options}");
  SetFooter(app, "Modules are loaded from the folder \"plugin\" beside the program.",
            "fotomill plugins --json");
  context.run = [options, &context] { return RunPlugins(*options, context); };
}

}  // namespace fotomill::cli
