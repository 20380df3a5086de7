// Connects the plug-in table to the registry: modules are loaded when the registry first
// asks for them.

#include <algorithm>
#include <mutex>

#include "core/text.h"
#include "platform/paths.h"
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
  if (!scanned) (void)ScanPlugins(pluginFolder, PluginScan::Cached);
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
    formats.push_back({UpperCase(entry.extension.view()), std::string(entry.textB.view()),
                       entry.flags1, PluginFacts(i).writes});
  }
  return formats;
}

// The lines of each module's list: name, version, license, separated by tabs.
std::vector<PluginLibrary> LibrariesForRegistry() {
  ScanOnce();
  std::vector<PluginLibrary> libraries;
  for (int32_t i = 0; i < PluginFormatCount(); ++i) {
    for (std::string_view rest = PluginFacts(i).libraries; !rest.empty();) {
      const std::string_view line = rest.substr(0, rest.find('\n'));
      rest.remove_prefix(std::min(line.size() + 1, rest.size()));
      const size_t tab = line.find('\t');
      if (tab == std::string_view::npos) continue;
      const std::string_view version = line.substr(tab + 1);
      libraries.push_back(
          {std::string(line.substr(0, tab)), std::string(version.substr(0, version.find('\t')))});
    }
  }
  return libraries;
}

// A built-in format with exactly the extension of the file keeps the modules from being loaded for
// nothing.
bool MetadataForTags(const std::string& path, ForeignMetadata& metadata) {
  const std::string_view extension = platform::ExtensionOf(path);
  for (int32_t i = 0; i < kSpareRow; ++i) {
    if (EqualIgnoringCase(FormatRow(i).extension, extension)) return false;
  }
  ScanOnce();
  return PluginMetadata(path, metadata);
}

constexpr PluginSource kPluginSource = {BindForRegistry, ListForRegistry, LibrariesForRegistry};

}  // namespace

void EnablePlugins(const std::string& folder) {
  const std::lock_guard lock(scanMutex);
  scanned = false;
  pluginFolder = folder;
  InstallPluginSource(&kPluginSource);
  InstallForeignReader(MetadataForTags);
}

}  // namespace fotomill
