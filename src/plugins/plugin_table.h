#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "core/fixed_text.h"
#include "plugins/fotomill_plugin.h"
#include "texts/texts.h"

namespace fotomill {

// A module's exports, in lookup order; missing ones are null.
struct PluginExports {
  FMW_GET_VERSION getVersion = nullptr;
  FMW_GET_COPYRIGHT getCopyright = nullptr;
  FMW_GET_PARAMS getParams = nullptr;
  FMW_READ_IMAGE readImage = nullptr;
  FMW_WRITE_IMAGE writeImage = nullptr;
  FMW_GET_INFO getInfo = nullptr;
  FMW_GET_COMMENT getComment = nullptr;
  FMW_CONFIGURE_CALL configure = nullptr;
};

// One format of one module: a row of the plug-in table.
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

// Maximum number of formats registered per module.
inline constexpr int32_t kFormatsPerModule = 32;

// The module search path, in order: the folder "plugin" next
// to the program in a build tree, "lib/fotomill/plugin" in the
// installation prefix, and "plugin" in the user's data folder.
std::vector<std::string> PluginFolders();
// Loads every module in `folder` (default: PluginFolders(); of modules with the same name, the
// first) and registers its formats, sorted by extension and then by module path. Modules that lack
// a required export or decline are silently skipped. Returns the number of formats. A second scan
// replaces the first.
int32_t ScanPlugins(const std::string& folder = {});
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
// Row `index` of the table, from 0; valid until the next scan.
const PluginEntry& PluginRow(int32_t index);
// The extension of a row, and the maximum bits per pixel it can write (0 if it cannot write). False
// past the end.
bool PluginExtension(int32_t index, std::string& extension, uint32_t& flags1);
bool PluginTextA(int32_t index, std::string& text);  // the module's name; false past the end
// The module's description of its formats.
bool PluginTextB(int32_t index, std::string& text);
// The first entry for a file's extension, ignoring case; null if there is none.
const PluginEntry* FindPluginEntry(std::string_view fileName);
// Whether the entry for the file's extension supports multiple pictures (value 4 of flags 2).
bool PluginCanHandle(std::string_view fileName);

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
