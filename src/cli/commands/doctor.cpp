#include "cli/commands/doctor.h"

#include <algorithm>
#include <map>
#include <string>

#include "cli/frame/libraries.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/data_folder.h"
#include "core/shown_text.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/shared_library.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/configuration.h"

namespace fotomill::cli {

namespace {

void Tell(ResultOutput& output, std::string_view label, std::string_view fact) {
  std::string line(label);
  line.append(line.size() < 16 ? 16 - line.size() : 1, ' ');
  output.Line(line + EscapeControls(fact));
}

std::string FolderFact(const std::string& folder) {
  if (folder.empty()) return "none";
  if (platform::IsFolder(folder)) return folder;
  return folder + (platform::FileExists(folder) ? " (not a folder)" : " (not there yet)");
}

void TellConfiguration(ResultOutput& output) {
  Tell(output, "Data folder", FolderFact(DataFolder()));
  std::string state;
  switch (StateOfConfiguration()) {
    case ConfigurationState::NotLoaded:
    case ConfigurationState::Missing: state = " (not there: the defaults are in force)"; break;
    case ConfigurationState::Unreadable: state = " (cannot be read: the defaults are in force, and nothing will be saved)"; break;
    case ConfigurationState::Loaded: break;
  }
  Tell(output, "Configuration", ConfigurationPath() + state);
  for (const ValueComplaint& complaint : ConfigurationComplaints()) {
    Tell(output, "  line " + std::to_string(complaint.line),
         std::string(complaint.row->name) + "=" + complaint.value + ": " + FaultMessage(*complaint.row, complaint.fault));
  }
}

bool IsRegistered(const std::string& path) {
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    if (PluginRow(i).path.view() == path) return true;
  }
  return false;
}

// The formats of each module, and the modules that gave none.
void TellPlugins(ResultOutput& output, bool wanted) {
  const std::string folder = platform::JoinFolder(platform::ProgramFolder(), "plugin");
  Tell(output, "Plug-in folder", FolderFact(folder) + (wanted ? "" : " (switched off by --no-plugins)"));
  if (!wanted) return;
  (void)ScanPlugins();
  std::map<std::string, std::string> formats;
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    std::string& list = formats[std::string(PluginRow(i).path)];
    list += (list.empty() ? "" : " ") + UpperCase(PluginRow(i).extension);
  }
  for (const auto& [path, list] : formats) Tell(output, "  " + EscapeControls(platform::FileNameOf(path)), list);
  for (const platform::FolderEntry& entry : platform::ListFolder(folder).value_or(std::vector<platform::FolderEntry>())) {
    const bool module = UpperCase(entry.name).starts_with("FMWPL") && entry.name.ends_with(platform::kModuleExtension);
    if (module && !IsRegistered(platform::JoinFolder(folder, entry.name))) {
      Tell(output, "  " + EscapeControls(entry.name), "not used: no module of this system, or it refuses to work here");
    }
  }
}

void TellFormats(ResultOutput& output) {
  int readable = 0, writable = 0;
  std::string off;
  std::map<std::string, std::string> reasons;  // sentence, extensions
  for (const int32_t index : FormatListRows()) {
    const FormatEntry& row = FormatRow(index);
    readable += CanRead(row) ? 1 : 0;
    writable += CanWrite(row) ? 1 : 0;
    const std::string extension = " " + std::string(row.extension);
    if (row.enabled == 0) off += extension;
    if (!WhyNot(row).empty()) reasons[std::string(WhyNot(row))] += extension;
  }
  Tell(output, "Formats", std::to_string(readable) + " can be read, " + std::to_string(writable) + " written");
  if (!off.empty()) output.Line("  Switched off:" + off);
  for (const auto& [reason, extensions] : reasons) output.Line("  " + reason.substr(0, reason.size() - 1) + ":" + extensions);
}

int RunDoctor(const CommandContext& context) {
  ResultOutput output(context, false);
  Tell(output, "Version", FOTOMILL_VERSION);
  Tell(output, "Program", platform::ProgramPath());
  TellConfiguration(output);
  Tell(output, "Working files", FolderFact(platform::SpecialFolderPath(platform::SpecialFolder::Temporary)));
  Tell(output, "Cores", std::to_string(platform::CoreCount()));
  TellPlugins(output, !context.global.noPlugins);
  for (const Library& library : Libraries()) {
    Tell(output, "Library", std::string(library.name) + " " + library.version + ", for " + library.purpose);
  }
  TellFormats(output);
  return kExitOk;
}

}  // namespace

void SetUpDoctor(CLI::App& app, CommandContext& context) {
  SetFooter(app, "Example: fotomill doctor");
  context.run = [&context] { return RunDoctor(context); };
}

}  // namespace fotomill::cli
