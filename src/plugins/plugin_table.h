#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "core/fixed_text.h"
#include "plugins/fotomill_plugin.h"
#include "plugins/loaded_module.h"
#include "plugins/module_facts.h"
#include "texts/texts.h"

namespace fotomill {

// One format of one module: a row of the plug-in table. Module and exports are set only if the
// module is loaded into this process.
struct PluginEntry {
  PathText path;           // the module's file
  PathText extension;      // without dot
  PathText textB;          // description of the formats
  PathText textA;          // name of the module
  void* module = nullptr;  // the loaded module; each entry holds its own reference
  PluginExports exports;
  uint32_t flags1 = 0;  // maximum bits per pixel the writer accepts
  uint32_t flags2 = 0;  // capability bits of the format row, always including FMT_SPARE
};
static_assert(sizeof(void*) != 4 || sizeof(PluginEntry) == 1088);  // the 32-bit ABI

// An entry and how its module is reached.
struct PluginFormat {
  PluginEntry entry;
  std::shared_ptr<const ModuleFacts> facts;  // never null
  std::shared_ptr<const LoadedModule> here;  // null: it runs in worker processes
};

// Maximum number of formats registered per module.
inline constexpr int32_t kFormatsPerModule = 32;

// The module search path, in order: the folder "plugin" next
// to the program in a build tree, "lib/fotomill/plugin" in the
// installation prefix, and "plugin" in the user's data folder.
std::vector<std::string> PluginFolders();
// Asks every module in `folder` (default: PluginFolders(); of modules with the same name, the
// first) about itself and registers its formats, sorted by extension and then by module path.
// Modules that lack a required export or decline are silently skipped. Returns the number of
// formats. A second scan replaces the first.
enum class PluginScan {
  Fresh,   // loads every module
  Cached,  // loads only those that have changed since they were asked last
};
int32_t ScanPlugins(const std::string& folder = {}, PluginScan scan = PluginScan::Fresh);
// Whether modules run in worker processes, which is the default, or in this one.
void RunModulesApart(bool on);
// In a worker process: registers the formats of a module that it has loaded, which stays loaded,
// for pictures that the module itself loads.
void UseModuleHere(const std::string& path, const LoadedModule& module, const ModuleFacts& facts);
// The modules found, loaded or not, each with the user's on/off switch; the next scan skips modules
// that are off.
struct PluginModule {
  std::string name;    // file name
  std::string folder;  // containing folder
  bool on = true;
};
std::vector<PluginModule> PluginModules(const std::string& folder = {});
// Why the last scan failed to load a module, by path; empty if it was loaded.
std::string WhyNotLoaded(const std::string& path);
// Sets the modules that are off, by file name; all others are on.
void SetModulesOff(std::vector<std::string> names);
// By file name; takes effect at the next scan. A module that is switched on is tried again even if
// it crashed the program before.
void SwitchModule(const std::string& name, bool on);
// Unloads all modules; rows bound to their formats must not be used afterwards.
void UnloadPlugins();

// Number of rows, 0 before a scan.
int32_t PluginFormatCount();
// Row `index` of the table, from 0, and what its module said; valid until the next scan.
const PluginEntry& PluginRow(int32_t index);
const ModuleFacts& PluginFacts(int32_t index);
// The extension of a row, and the maximum bits per pixel it can write (0 if it cannot write). False
// past the end.
bool PluginExtension(int32_t index, std::string& extension, uint32_t& flags1);
bool PluginTextA(int32_t index, std::string& text);  // the module's name; false past the end
// The module's description of its formats.
bool PluginTextB(int32_t index, std::string& text);
// The first row for a file's extension, ignoring case; null if there is none.
const PluginFormat* PluginFormatOf(std::string_view fileName);
// Whether the entry for the file's extension supports multiple pictures (value 4 of flags 2).
bool PluginCanHandle(std::string_view fileName);

// The options of modules that the user has set, by "MODULE.OPTION", such as
// "FMWPL_avif.so.Quality"; all others have their standard values.
void SetModuleOptions(std::map<std::string, int32_t> values);
// The values for a call, in the order of the module's options.
ModuleOptionValues OptionValuesOf(const std::string& module, const ModuleFacts& facts);

// Makes plug-in formats available to the registry. Modules are loaded only when a name matches no
// built-in row or when a list asks for them. `folder` as for ScanPlugins.
void EnablePlugins(const std::string& folder = {});

// Opens the module's settings dialog. False if it has none; the text to show
// then is kNothingToConfigure.
bool ConfigurePlugin(int32_t index);
inline constexpr std::string_view kNothingToConfigure =
    TrLater("No configuration items are available for the selected plugin.");
// The help page of a module below the program's folder: "html\NAME", with the system's separator.
// Empty for a module without a name, or with an unsafe one.
std::string PluginHelpPage(int32_t index);

}  // namespace fotomill
