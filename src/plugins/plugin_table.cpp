#include "plugins/plugin_table.h"

#include <algorithm>
#include <map>
#include <utility>
#include <vector>

#include "core/data_folder.h"
#include "core/plain_name.h"
#include "core/text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/shared_library.h"
#include "platform/work_apart.h"
#include "plugins/bad_modules.h"
#include "plugins/facts_cache.h"
#include "plugins/module_apart.h"
#include "plugins/module_call.h"
#include "plugins/plugin_bridge.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

std::vector<PluginFormat>& Table() {
  static std::vector<PluginFormat> table;
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

// Whether modules run in worker processes.
bool apart = true;

std::map<std::string, int32_t>& SetOptions() {
  static std::map<std::string, int32_t> values;
  return values;
}

// Adds the formats of a module to the table.
void AddFormats(const std::string& path, const std::shared_ptr<const ModuleFacts>& facts,
                const std::shared_ptr<const LoadedModule>& here, std::vector<PluginFormat>& table) {
  for (int32_t i = 0; i < kFormatsPerModule; ++i) {
    const std::string_view extension = ListItem(facts->extensions, i);
    PluginFormat format{{}, facts, here};
    PluginEntry& entry = format.entry;
    if (extension.empty() || !entry.path.Assign(path)) return;
    entry.extension.AssignCut(extension);
    entry.textA.AssignCut(facts->textA);
    entry.textB.AssignCut(facts->textB);
    entry.flags1 = facts->flags1;
    entry.flags2 = facts->flags2 | FMT_SPARE;
    if (here != nullptr) {
      entry.module = here->library.Handle();
      entry.exports = here->exports;
    }
    table.push_back(std::move(format));
  }
}

// Loads a module into this process; null on failure.
std::shared_ptr<const LoadedModule> LoadHere(const std::string& path, ModuleFacts& facts) {
  auto module = std::make_shared<LoadedModule>();
  const ModuleCall call(path, ModuleStage::Loading);
  facts = {};
  if (LoadModule(path, *module, facts, Unloadable()[path])) {
    Unloadable().erase(path);
    return module;
  }
  return nullptr;
}

// Asks a module in a worker process. A module that crashes is not asked again.
bool AskApart(const std::string& path, FactsCache& cache, bool cached, ModuleFacts& facts) {
  if (cached && cache.Find(path, facts)) return true;
  std::string error;
  switch (AskFactsApart(path, facts, error)) {
    case FactsResult::Known: cache.Put(path, facts); return true;
    case FactsResult::Crashed:
      RecordBadModule(path);
      Unloadable()[path] = Tr("it crashed when it was loaded");
      return false;
    case FactsResult::Declined:
    case FactsResult::Unasked: Unloadable()[path] = error; return false;
  }
  return false;
}

void RegisterModule(const std::string& path, FactsCache& cache, bool cached,
                    std::vector<PluginFormat>& table) {
  ModuleFacts facts;
  std::shared_ptr<const LoadedModule> here;
  if (apart && !AskApart(path, cache, cached, facts)) return;
  if (!apart || (facts.flags2 & FMW_FORMAT_IN_PROGRAM) != 0) {
    here = LoadHere(path, facts);
    if (here == nullptr) return;
  }
  AddFormats(path, std::make_shared<const ModuleFacts>(std::move(facts)), here, table);
}

bool ComesBefore(const PluginFormat& a, const PluginFormat& b) {
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

int32_t ScanPlugins(const std::string& folder, PluginScan scan) {
  UnloadPlugins();
  Unloadable().clear();
  if (scan == PluginScan::Fresh) platform::EndIdleProcesses();  // they keep modules loaded
  FactsCache cache;
  std::vector<PluginFormat> table;
  for (const PluginModule& module : PluginModules(folder)) {
    if (!module.on) continue;
    const std::string path = platform::JoinFolder(module.folder, module.name);
    if (IsBadModule(path)) {
      Unloadable()[path] = Tr("it crashed when it was loaded");
      continue;
    }
    RegisterModule(path, cache, scan == PluginScan::Cached, table);
  }
  cache.Save();
  std::ranges::stable_sort(table, ComesBefore);
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

void RunModulesApart(bool on) { apart = on; }

void UseModuleHere(const std::string& path, const LoadedModule& module, const ModuleFacts& facts) {
  const auto known = [&path](const PluginFormat& format) {
    return format.entry.path.view() == path;
  };
  if (std::ranges::any_of(Table(), known)) return;
  static constexpr PluginSource kSource = {
      [](std::string_view fileName, int32_t) { return BindPluginFormat(fileName); },
      [] { return std::vector<PluginFormatFacts>(); }, [] { return std::vector<PluginLibrary>(); }};
  InstallPluginSource(&kSource);
  // not owned
  const std::shared_ptr<const LoadedModule> here(std::shared_ptr<void>(), &module);
  AddFormats(path, std::make_shared<const ModuleFacts>(facts), here, Table());
}

const PluginEntry& PluginRow(int32_t index) { return Table()[static_cast<size_t>(index)].entry; }

const ModuleFacts& PluginFacts(int32_t index) { return *Table()[static_cast<size_t>(index)].facts; }

void SetModuleOptions(std::map<std::string, int32_t> values) { SetOptions() = std::move(values); }

ModuleOptionValues OptionValuesOf(const std::string& module, const ModuleFacts& facts) {
  ModuleOptionValues values = {};
  for (size_t i = 0; i < facts.options.size(); ++i) {
    const ModuleOption& option = facts.options[i];
    const auto set = SetOptions().find(module + "." + option.name);
    values[i] = set == SetOptions().end() ? option.standard : option.Nearest(set->second);
  }
  return values;
}

bool PluginExtension(int32_t index, std::string& extension, uint32_t& flags1) {
  if (index < 0 || index >= PluginFormatCount()) return false;
  const PluginEntry& entry = PluginRow(index);
  extension = entry.extension.view();
  flags1 = PluginFacts(index).writes ? entry.flags1 : 0;
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

const PluginFormat* PluginFormatOf(std::string_view fileName) {
  const std::string_view extension = platform::ExtensionOf(fileName);
  if (extension.empty()) return nullptr;
  for (const PluginFormat& format : Table()) {
    if (EqualIgnoringCase(format.entry.extension, extension)) return &format;
  }
  return nullptr;
}

bool PluginCanHandle(std::string_view fileName) {
  const PluginFormat* format = PluginFormatOf(fileName);
  return format != nullptr && (format->entry.flags2 & FMW_FORMAT_MULTI) != 0;
}

bool ConfigurePlugin(int32_t index) {
  if (index < 0 || index >= PluginFormatCount() || !PluginFacts(index).hasDialog) return false;
  const std::string path(PluginRow(index).path.view());
  // A dialog needs the program's windows; the module is loaded as long as it is open.
  std::shared_ptr<const LoadedModule> here = Table()[static_cast<size_t>(index)].here;
  ModuleFacts facts;
  if (here == nullptr) here = LoadHere(path, facts);
  if (here == nullptr || here->exports.configure == nullptr) return false;
  const ModuleCall call(path, ModuleStage::Working);
  FMW_CONFIGURE block = {};
  block.size = sizeof block;
  block.version = FMW_PLUGIN_VERSION;
  return here->exports.configure(&block) != 0;
}

std::string PluginHelpPage(int32_t index) {
  if (index < 0 || index >= PluginFormatCount()) return {};
  const std::string_view name = PluginRow(index).textA.view();
  if (name.empty() || !IsPlainName(name)) return {};
  return platform::JoinFolder(platform::JoinFolder(platform::ProgramFolder(), "html"), name);
}

}  // namespace fotomill
