// Connects the plug-in table to the registry: modules are loaded when the registry first
// asks for them.

#include <mutex>

#include "core/text.h"
#include "plugins/plugin_bridge.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

std::mutex scanMutex;
bool scanned = false;
std::string pluginFolder;

void ScanOnce() {
  const std::lock_guard lock(scanMutex);
  if (!scanned) (void)ScanPlugins(pluginFolder);
  scanned = true;
}

int32_t BindForRegistry(std::string_view fileName, int32_t) {
  ScanOnce();
  return BindPluginFormat(fileName);
}

std::vector<PluginFormatFacts> ListForRegistry() {
  ScanOnce();
  std::vector<PluginFormatFacts> formats;
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    const PluginEntry& entry = PluginRow(i);
    // if two modules share an extension, the first one gets it
    if (i > 0 && EqualIgnoringCase(PluginRow(i - 1).extension, entry.extension)) continue;
    formats.push_back(
        {UpperCase(entry.extension.view()), std::string(entry.textB.view()), entry.flags1, entry.exports.writeImage != nullptr});
  }
  return formats;
}

constexpr PluginSource kPluginSource = {BindForRegistry, ListForRegistry};

}  // namespace

void EnablePlugins(const std::string& folder) {
  const std::lock_guard lock(scanMutex);
  scanned = false;
  pluginFolder = folder;
  InstallPluginSource(&kPluginSource);
}

}  // namespace fotomill
