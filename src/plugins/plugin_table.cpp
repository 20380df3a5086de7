#include "plugins/plugin_table.h"

#include <algorithm>
#include <map>
#include <type_traits>
#include <utility>
#include <vector>

#include "core/data_folder.h"
#include "core/plain_name.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/shared_library.h"
#include "plugins/bad_modules.h"
#include "plugins/module_call.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// An entry with the library handle that keeps its exports valid.
struct LoadedEntry {
  PluginEntry entry;
  platform::SharedLibrary library;
};

std::vector<LoadedEntry>& Table() {
  static std::vector<LoadedEntry> table;
  return table;
}

// Modules disabled by the user.
std::vector<std::string>& ModulesOff() {
  static std::vector<std::string> names;
  return names;
}

// System errors from loading modules in the last scan, by path.
std::map<std::string, std::string>& Unloadable() {
  static std::map<std::string, std::string> reasons;
  return reasons;
}

bool IsOn(std::string_view name) {
  return std::ranges::find(ModulesOff(), name) == ModulesOff().end();
}

// "FMWPL*.so", a module's file name. "_x64" marks the 64-bit twin of a 32-bit module and
// is never loaded.
bool IsModuleName(std::string_view name) {
  const std::string_view extension = platform::kModuleExtension;
  return name.size() >= 5 + extension.size() && EqualIgnoringCase(name.substr(0, 5), "FMWPL") &&
         EqualIgnoringCase(name.substr(name.size() - extension.size()), extension) &&
         LowerCase(name).find("_x64") == std::string::npos;
}

PluginExports LookUpExports(const platform::SharedLibrary& library) {
  PluginExports exports;
  exports.getVersion =
      library.FunctionNamed<std::remove_pointer_t<FMW_GET_VERSION>>("PLUGIN11GetVersion");
  exports.getCopyright =
      library.FunctionNamed<std::remove_pointer_t<FMW_GET_COPYRIGHT>>("PLUGIN11GetCopyright");
  exports.getParams =
      library.FunctionNamed<std::remove_pointer_t<FMW_GET_PARAMS>>("PLUGIN11GetPluginParams");
  exports.readImage =
      library.FunctionNamed<std::remove_pointer_t<FMW_READ_IMAGE>>("PLUGIN11ReadImage");
  exports.writeImage =
      library.FunctionNamed<std::remove_pointer_t<FMW_WRITE_IMAGE>>("PLUGIN11WriteImage");
  exports.getInfo = library.FunctionNamed<std::remove_pointer_t<FMW_GET_INFO>>("PLUGIN11GetInfo");
  exports.getComment =
      library.FunctionNamed<std::remove_pointer_t<FMW_GET_COMMENT>>("PLUGIN11GetComment");
  exports.configure =
      library.FunctionNamed<std::remove_pointer_t<FMW_CONFIGURE_CALL>>("PLUGIN11DoConfigure");
  return exports;
}

// Texts from modules may lack the terminating NUL.
template <size_t size>
std::string_view TextOf(const char (&text)[size]) {
  const std::string_view whole(text, size - 1);
  return whole.substr(0, whole.find('\0'));
}

// Item `index` of a list separated by one or more ";", empty if out of range.
std::string_view ListItem(std::string_view list, int32_t index) {
  list.remove_prefix(std::min(list.find_first_not_of(';'), list.size()));
  for (; index > 0; --index) {
    const size_t end = list.find(';');
    if (end == std::string_view::npos) return {};
    list.remove_prefix(end);
    list.remove_prefix(std::min(list.find_first_not_of(';'), list.size()));
  }
  return list.substr(0, list.find(';'));
}

// Registers format number `index` of a module. False after the module's last format.
bool RegisterFormat(const std::string& path, int32_t index, std::vector<LoadedEntry>& table) {
  LoadedEntry loaded;
  const ModuleCall call(path, ModuleStage::Loading);
  if (!loaded.entry.path.Assign(path) || !loaded.library.Load(path)) {
    Unloadable()[path] = loaded.library.Error();
    return false;
  }
  PluginEntry& entry = loaded.entry;
  entry.exports = LookUpExports(loaded.library);
  if (entry.exports.getParams == nullptr || entry.exports.readImage == nullptr ||
      entry.exports.getInfo == nullptr) {
    return false;
  }
  FMW_PLUGIN_PARAMS params = {};
  params.size = sizeof params;
  params.version = FMW_PLUGIN_VERSION;
  if (entry.exports.getParams(&params, 0) == 0) return false;
  const std::string_view extension = ListItem(TextOf(params.extensions), index);
  if (extension.empty()) return false;
  entry.extension.AssignCut(extension);
  entry.textA.AssignCut(TextOf(params.textA));
  entry.textB.AssignCut(TextOf(params.textB));
  entry.module = loaded.library.Handle();
  entry.flags1 = params.flags1;
  entry.flags2 = params.flags2 | FMT_SPARE;
  table.push_back(std::move(loaded));
  return true;
}

bool ComesBefore(const LoadedEntry& a, const LoadedEntry& b) {
  const std::string left = LowerCase(a.entry.extension.view()),
                    right = LowerCase(b.entry.extension.view());
  return left != right ? left < right : a.entry.path.view() < b.entry.path.view();
}

}  // namespace

std::vector<std::string> PluginFolders() {
  const std::string program = platform::ProgramFolder();
  std::vector<std::string> folders = {
      platform::JoinFolder(program, "plugin"),
      platform::JoinFolder(platform::FolderOf(program), "lib/fotomill/plugin")};
  if (!DataFolder().empty()) folders.push_back(platform::JoinFolder(DataFolder(), "plugin"));
  return folders;
}

int32_t ScanPlugins(const std::string& folder) {
  UnloadPlugins();
  Unloadable().clear();
  std::vector<LoadedEntry> table;
  for (const PluginModule& module : PluginModules(folder)) {
    if (!module.on) continue;
    const std::string path = platform::JoinFolder(module.folder, module.name);
    if (IsBadModule(path)) {
      Unloadable()[path] = Tr("it crashed the program when it was loaded");
      continue;
    }
    int32_t registered = 0;
    while (registered < kFormatsPerModule && RegisterFormat(path, registered, table)) ++registered;
  }
  std::stable_sort(table.begin(), table.end(), ComesBefore);
  Table() = std::move(table);
  return PluginFormatCount();
}

std::vector<PluginModule> PluginModules(const std::string& folder) {
  std::vector<PluginModule> modules;
  for (const std::string& place : folder.empty() ? PluginFolders() : std::vector{folder}) {
    const auto entries = platform::ListFolder(place);
    if (!entries) continue;
    for (const platform::FolderEntry& entry : *entries) {
      const bool known =
          std::ranges::find(modules, entry.name, &PluginModule::name) != modules.end();
      if (IsModuleName(entry.name) && !known)
        modules.push_back({entry.name, place, IsOn(entry.name)});
    }
  }
  return modules;
}

std::string WhyNotLoaded(const std::string& path) {
  const auto found = Unloadable().find(path);
  return found == Unloadable().end() ? std::string() : found->second;
}

void SetModulesOff(std::vector<std::string> names) { ModulesOff() = std::move(names); }

void SwitchModule(const std::string& name, bool on) {
  std::erase(ModulesOff(), name);
  if (!on) ModulesOff().push_back(name);
  if (on) (void)ForgiveModule(name);
}

void UnloadPlugins() { Table().clear(); }

int32_t PluginFormatCount() { return static_cast<int32_t>(Table().size()); }

const PluginEntry& PluginRow(int32_t index) { return Table()[static_cast<size_t>(index)].entry; }

bool PluginExtension(int32_t index, std::string& extension, uint32_t& flags1) {
  if (index < 0 || index >= PluginFormatCount()) return false;
  const PluginEntry& entry = PluginRow(index);
  extension = entry.extension.view();
  flags1 = entry.exports.writeImage == nullptr ? 0 : entry.flags1;
  return true;
}

bool PluginTextA(int32_t index, std::string& text) {
  if (index < 0 || index >= PluginFormatCount()) return false;
  text = PluginRow(index).textA.view();
  return true;
}

bool PluginTextB(int32_t index, std::string& text) {
  if (index < 0 || index >= PluginFormatCount()) return false;
  text = PluginRow(index).textB.view();
  return true;
}

const PluginEntry* FindPluginEntry(std::string_view fileName) {
  const std::string_view extension = platform::ExtensionOf(fileName);
  if (extension.empty()) return nullptr;
  for (const LoadedEntry& loaded : Table()) {
    if (EqualIgnoringCase(loaded.entry.extension, extension)) return &loaded.entry;
  }
  return nullptr;
}

bool PluginCanHandle(std::string_view fileName) {
  const PluginEntry* entry = FindPluginEntry(fileName);
  return entry != nullptr && (entry->flags2 & FMW_FORMAT_MULTI) != 0;
}

bool ConfigurePlugin(int32_t index) {
  if (index < 0 || index >= PluginFormatCount() || PluginRow(index).exports.configure == nullptr)
    return false;
  const ModuleCall call(std::string(PluginRow(index).path.view()), ModuleStage::Working);
  FMW_CONFIGURE block = {};
  block.size = sizeof block;
  block.version = FMW_PLUGIN_VERSION;
  return PluginRow(index).exports.configure(&block) != 0;
}

std::string PluginHelpPage(int32_t index) {
  if (index < 0 || index >= PluginFormatCount()) return {};
  const std::string_view name = PluginRow(index).textA.view();
  if (name.empty() || !IsPlainName(name)) return {};
  return platform::JoinFolder(platform::JoinFolder(platform::ProgramFolder(), "html"), name);
}

}  // namespace fotomill
