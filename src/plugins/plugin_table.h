#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "core/fixed_text.h"
#include "plugins/fotomill_plugin.h"
#include "texts/texts.h"

namespace fotomill {

// The exports of a module, in the order in which they are looked up; absent ones are null.
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
  PathText path;           // the module
  PathText extension;      // the extension that this entry serves, without dot
  PathText textB;          // the formats' description
  PathText textA;          // the module's name
  void* module = nullptr;  // the loaded module; each entry holds its own load of it
  PluginExports exports;
  uint32_t flags1 = 0;  // deepest picture that the writer takes, bits per pixel
  uint32_t flags2 = 0;  // capability bits of the format row, always with FMT_SPARE
};
static_assert(sizeof(void*) != 4 || sizeof(PluginEntry) == 1088);  // as 32-bit plug-ins see it

// At most this many formats of one module are registered.
inline constexpr int32_t kFormatsPerModule = 32;

// Where modules are looked for, in this order: the folder "plugin" beside the program as it is
// built, "lib/fotomill/plugin" of the prefix that it is installed in, and "plugin" in the user's
// data folder.
std::vector<std::string> PluginFolders();
// Loads every module of `folder` (of PluginFolders() unless one is given; of modules with one name
// the first) and registers its formats, sorted by extension and then by module path. Modules that
// lack a required export or refuse are skipped in silence. Returns the number of formats. A second
// scan replaces the first.
int32_t ScanPlugins(const std::string& folder = {});
// The modules there, loaded or not, and the user's switch of each: one that is off is passed over
// by the next scan.
struct PluginModule {
  std::string name;    // of the file
  std::string folder;  // it is in
  bool on = true;
};
std::vector<PluginModule> PluginModules(const std::string& folder = {});
// Why the last scan could not load a module, by its path; empty where it could.
std::string WhyNotLoaded(const std::string& path);
// The modules that are off, by file name; all others are on.
void SetModulesOff(std::vector<std::string> names);
// By file name; from the next scan on. A module that is switched on is tried again even if it ended
// the program the last time.
void SwitchModule(const std::string& name, bool on);
// Unloads every module; formats that are bound to a row must not be used afterwards.
void UnloadPlugins();

// Rows of the table, 0 before a scan.
int32_t PluginFormatCount();
// Row `index` of the table, from 0; it lives until the next scan.
const PluginEntry& PluginRow(int32_t index);
// The extension of a row, and the deepest picture that it writes when it can write at all (else 0).
// False beyond the end.
bool PluginExtension(int32_t index, std::string& extension, uint32_t& flags1);
bool PluginTextA(int32_t index, std::string& text);  // the row's first text; false beyond the end
// The second one: the module's description of its formats.
bool PluginTextB(int32_t index, std::string& text);
// The first entry that serves a file's extension, ignoring case; null when none does.
const PluginEntry* FindPluginEntry(std::string_view fileName);
// Whether the entry of the file's extension can hold more than one picture (value 4 of flags 2).
bool PluginCanHandle(std::string_view fileName);

// Makes the formats of all modules known to the registry. Modules are loaded when a name matches no
// built-in row, or when a list asks for them, never before. `folder` as for ScanPlugins.
void EnablePlugins(const std::string& folder = {});

// Calls a row's own settings dialog. False when the module offers none; the text to show then is
// kNothingToConfigure.
bool ConfigurePlugin(int32_t index);
inline constexpr std::string_view kNothingToConfigure =
    TrLater("No configuration items are available for the selected plugin.");
// The help page of a module beneath the program's folder: "html\NAME", with the system's separator.
// Empty for a module without a name, or with one that leads elsewhere.
std::string PluginHelpPage(int32_t index);

}  // namespace fotomill
