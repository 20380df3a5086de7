#include "cli/commands/doctor.h"

#include <algorithm>
#include <map>
#include <memory>
#include <string>

#include "cli/frame/libraries.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/data_folder.h"
#include "core/limits.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "core/utf8.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/shared_library.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// Prints one fact; the label is in English.
void Report(ResultOutput& output, const std::string& label, std::string_view fact) {
  constexpr size_t kColumn = 16;
  if (output.IsJson()) {
    Json element{{"item", label.substr(std::min(label.find_first_not_of(' '), label.size()))}};
    PutName(element, "value", fact);
    return output.Element(element);
  }
  const std::string shown = Tr(label);
  const size_t width = CharacterCount(shown);
  output.Line(shown + std::string(width < kColumn ? kColumn - width : 1, ' ') +
              EscapeControls(fact));
}

std::string FolderFact(const std::string& folder) {
  if (folder.empty()) return Tr("none");
  if (platform::IsFolder(folder)) return folder;
  return platform::FileExists(folder) ? Tr("%1 (not a folder)", folder)
                                      : Tr("%1 (does not exist yet)", folder);
}

void ReportConfiguration(ResultOutput& output) {
  Report(output, TrLater("Data folder"), FolderFact(DataFolder()));
  std::string path = ConfigurationPath();
  switch (StateOfConfiguration()) {
    case ConfigurationState::NotLoaded:
    case ConfigurationState::Missing:
      path = Tr("%1 (does not exist; the defaults apply)", path);
      break;
    case ConfigurationState::Unreadable:
      path = Tr("%1 (cannot be read; the defaults apply and nothing is saved)", path);
      break;
    case ConfigurationState::Loaded: break;
  }
  Report(output, TrLater("Configuration"), path);
  for (const ValueComplaint& complaint : ConfigurationComplaints()) {
    const std::string line = output.IsJson() ? "line " + std::to_string(complaint.line)
                                             : "  " + Tr("line %1", complaint.line);
    Report(output, line,
           std::string(complaint.row->name) + "=" + complaint.value + ": " +
               FaultMessage(*complaint.row, complaint.fault));
  }
}

bool IsRegistered(const std::string& path) {
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    if (PluginRow(i).path.view() == path) return true;
  }
  return false;
}

// Modules that the build has left out for lack of a library: a file with a line NAME tab LIBRARIES
// each, beside the modules.
void ReportLeftOut(ResultOutput& output, const std::string& folder) {
  std::string text;
  if (platform::ReadWholeFile(platform::JoinFolder(folder, "left-out.txt"), limits.listFileBytes,
                              text) != platform::ReadResult::Done)
    return;
  for (std::string_view rest = text; !rest.empty();) {
    const std::string_view line = rest.substr(0, rest.find('\n'));
    rest.remove_prefix(std::min(line.size() + 1, rest.size()));
    const size_t tab = line.find('\t');
    if (tab == std::string_view::npos) continue;
    Report(output, "  " + EscapeControls(line.substr(0, tab)),
           Tr("left out of this build: %1 not found", line.substr(tab + 1)));
  }
}

// Lists the formats of each module, and modules without formats.
void ReportPlugins(ResultOutput& output, bool enabled) {
  for (const std::string& folder : PluginFolders()) {
    Report(output, TrLater("Plug-in folder"),
           enabled ? FolderFact(folder) : Tr("%1 (disabled by --no-plugins)", FolderFact(folder)));
  }
  if (!enabled) return;
  (void)ScanPlugins();
  std::map<std::string, std::string> formats;
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    std::string& list = formats[std::string(PluginRow(i).path)];
    list += (list.empty() ? "" : " ") + UpperCase(PluginRow(i).extension);
  }
  for (const auto& [path, list] : formats)
    Report(output, "  " + EscapeControls(platform::FileNameOf(path)), list);
  for (const std::string& folder : PluginFolders()) ReportLeftOut(output, folder);
  for (const PluginModule& module : PluginModules()) {
    const std::string path = platform::JoinFolder(module.folder, module.name);
    if (!module.on) {
      Report(output, "  " + EscapeControls(module.name), Tr("disabled"));
    } else if (!IsRegistered(path)) {
      const std::string reason = WhyNotLoaded(path);
      Report(output, "  " + EscapeControls(module.name),
             reason.empty() ? Tr("not used: not a module for this system, or it failed to start")
                            : Tr("not used: %1", reason));
    }
  }
}

void ReportFormats(ResultOutput& output) {
  int readable = 0, writable = 0;
  std::string off;
  std::map<std::string, std::string> reasons;  // sentence, extensions
  for (const int32_t index : FormatListRows()) {
    const FormatEntry& row = FormatRow(index);
    readable += CanRead(row) ? 1 : 0;
    writable += CanWrite(row) ? 1 : 0;
    const std::string extension = " " + std::string(row.extension);
    if (row.enabled == 0) off += extension;
    if (!WhyNot(row).empty()) reasons[Tr(WhyNot(row))] += extension;
  }
  Report(output, TrLater("Formats"), Tr("%1 can be read, %2 can be written", readable, writable));
  const auto list = [&](const std::string& title, const std::string& extensions) {
    if (!output.IsJson()) return output.Line("  " + title + ":" + extensions);
    output.Element({{"item", title}, {"value", extensions.substr(1)}});
  };
  if (!off.empty()) list(Tr("Disabled"), off);
  for (const auto& [reason, extensions] : reasons)
    list(reason.substr(0, reason.size() - 1), extensions);
}

int RunDoctor(const CommandContext& context, bool json) {
  ResultOutput output(context, json);
  Report(output, TrLater("Version"), FOTOMILL_VERSION);
  Report(output, TrLater("Program"), platform::ProgramPath());
  ReportConfiguration(output);
  Report(output, TrLater("Temporary files"),
         FolderFact(platform::SpecialFolderPath(platform::SpecialFolder::Temporary)));
  Report(output, TrLater("Cores"), std::to_string(platform::CoreCount()));
  ReportPlugins(output, !context.global.noPlugins);
  for (const Library& library : Libraries()) {
    Report(output, TrLater("Library"),
           Tr("%1 %2, for %3", library.name, VersionText(library), Tr(library.purpose)));
  }
  ReportFormats(output);
  return kExitOk;
}

}  // namespace

void SetUpDoctor(CLI::App& app, CommandContext& context) {
  const auto json = std::make_shared<bool>(false);
  AddFlag(app, "--json", *json, "Print a JSON array of {item, value}");
  SetFooter(app, nullptr, "fotomill doctor");
  context.run = [json, &context] { return RunDoctor(context, *json); };
}

}  // namespace fotomill::cli
