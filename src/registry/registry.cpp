#include "registry/registry.h"

#include <algorithm>
#include <atomic>

#include "core/text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Built at the first call; only the rows' switches and options change later.
FormatTable& Table() {
  static FormatTable table = MakeFormatTable();
  return table;
}

constinit thread_local FormatEntry spareRow = SpareRow();
const PluginSource* pluginSource = nullptr;
std::atomic<bool> pluginsOverride = false;

// A row matches an extension equal to its own, or one with the same first three characters; a row
// extension shorter than that must match completely.
bool RowMatches(std::string_view rowExtension, std::string_view extension) {
  return EqualIgnoringCase(extension, rowExtension) ||
         EqualIgnoringCase(extension.substr(0, 3), rowExtension.substr(0, 3));
}

}  // namespace

FormatEntry& FormatRow(int32_t index) {
  return index == kSpareRow ? spareRow : Table()[static_cast<size_t>(index)];
}

int32_t EnabledByDefault(int32_t index) {
  static const FormatTable asBuilt = MakeFormatTable();
  return asBuilt[static_cast<size_t>(index)].enabled;
}

int32_t FindFormatByName(std::string_view fileName, int32_t parameter) {
  const std::string_view extension = platform::ExtensionOf(fileName);
  for (int32_t i = 0; i < formatCount && !extension.empty(); ++i) {
    const FormatEntry& row = FormatRow(i);
    if ((row.flags & (FMT_SPARE | FMT_CLIPBOARD)) != 0) continue;
    if (row.enabled == 0 && pluginsOverride) continue;
    if (RowMatches(row.extension, extension)) return i;
  }
  return FindPluginFormat(fileName, parameter);
}

namespace {

// The row of a name, unless it cannot do it and has another extension, and a plug-in has the
// name's.
int32_t FindWhoCan(std::string_view fileName, bool (*can)(const FormatEntry& row)) {
  const int32_t named = FindFormatByName(fileName);
  if (named == kNoFormat || named == kSpareRow || can(FormatRow(named)) ||
      EqualIgnoringCase(FormatRow(named).extension, platform::ExtensionOf(fileName)))
    return named;
  const int32_t plugin = FindPluginFormat(fileName);
  return plugin != kNoFormat && can(FormatRow(plugin)) ? plugin : named;
}

}  // namespace

int32_t FindReaderByName(std::string_view fileName) { return FindWhoCan(fileName, CanRead); }

int32_t FindWriterByName(std::string_view fileName) { return FindWhoCan(fileName, CanWrite); }

void LetPluginsOverrideFormats(bool on) { pluginsOverride = on; }

void InstallPluginSource(const PluginSource* source) { pluginSource = source; }

int32_t FindPluginFormat(std::string_view fileName, int32_t parameter) {
  return pluginSource == nullptr ? kNoFormat : pluginSource->bind(fileName, parameter);
}

std::vector<PluginFormatFacts> PluginFormats() {
  return pluginSource == nullptr ? std::vector<PluginFormatFacts>{} : pluginSource->list();
}

std::vector<PluginLibrary> LibrariesOfPlugins() {
  return pluginSource == nullptr ? std::vector<PluginLibrary>{} : pluginSource->libraries();
}

std::string PluginDescription(const PluginFormatFacts& format) {
  return "(" + format.extension + ") Plugin" + (format.textB.empty() ? "" : " " + format.textB);
}

bool CanRead(const FormatEntry& row) {
  return row.canRead && (row.present == nullptr || row.present());
}

bool CanWrite(const FormatEntry& row) {
  return row.canWrite && (row.present == nullptr || row.present());
}

std::string_view WhyNot(const FormatEntry& row) {
  return CanRead(row) && CanWrite(row) ? std::string_view() : row.whyNot;
}

std::vector<const FormatSettings*> SettingsOfFormats() {
  std::vector<const FormatSettings*> all;
  for (const std::span<const FormatEntry> family : FormatFamilies()) {
    for (const FormatEntry& row : family) {
      if (row.settings != nullptr && std::ranges::find(all, row.settings) == all.end())
        all.push_back(row.settings);
    }
  }
  return all;
}

std::vector<FormatLibrary> LibrariesOfFormats() {
  std::vector<FormatLibrary> all;
  for (const std::span<const FormatEntry> family : FormatFamilies()) {
    for (const FormatEntry& row : family) {
      for (const FormatLibrary& library : row.libraries) {
        const auto same = [&](const FormatLibrary& known) {
          return std::string_view(known.name) == library.name;
        };
        if (std::ranges::none_of(all, same)) all.push_back(library);
      }
    }
  }
  return all;
}

void RunFormatStartup() {
  for (const FormatEntry& row : Table()) {
    if (row.startup != nullptr) (void)row.startup();
  }
}

void RunFormatShutdown() {
  for (const FormatEntry& row : Table()) {
    if (row.shutdown != nullptr) (void)row.shutdown();
  }
}

std::string DescribeFileType(std::string_view fileName) {
  const std::string extension = UpperCase(platform::ExtensionOf(fileName));
  for (const FormatEntry& row : Table()) {
    if (row.enabled == 0 || (row.flags & (FMT_WALLPAPER | FMT_CLIPBOARD | FMT_SPARE)) != 0)
      continue;
    if (EqualIgnoringCase(row.extension, extension)) return std::string(row.description.view());
  }
  return "(" + extension + ") " + extension + " file";
}

std::vector<FilterPair> OpenFileFilter() {
  std::vector<FilterPair> pairs(1, {TrLater("All pictures"), ""});
  for (const FormatEntry& row : Table()) {
    if ((row.flags & (FMT_WALLPAPER | FMT_CLIPBOARD | FMT_NO_OPEN | FMT_SPARE)) != 0) continue;
    const std::string pattern = "*." + std::string(row.extension.view());
    pairs.push_back({std::string(row.description.view()), pattern});
    pairs[0].patterns += (pairs[0].patterns.empty() ? "" : ";") + pattern;
  }
  for (const PluginFormatFacts& format : PluginFormats()) {
    pairs.push_back({PluginDescription(format), "*." + format.extension});
    pairs[0].patterns += ";*." + format.extension;
  }
  return pairs;
}

std::vector<int32_t> DestinationRows() {
  constexpr uint32_t kExcluded =
      FMT_WALLPAPER | FMT_CLIPBOARD | FMT_SECONDARY | FMT_ANIMATED | FMT_SPARE;
  std::vector<int32_t> rows;
  for (int32_t i = 0; i < formatCount; ++i) {
    const uint32_t flags = FormatRow(i).flags;
    if ((flags & FMT_SAVE_ANYWAY) != 0 || (flags & kExcluded) == 0) rows.push_back(i);
  }
  return rows;
}

std::vector<std::string> DestinationExtensions() {
  std::vector<std::string> extensions;
  for (const int32_t index : DestinationRows()) {
    if (CanWrite(FormatRow(index)))
      extensions.push_back(LowerCase(FormatRow(index).extension.view()));
  }
  for (const PluginFormatFacts& format : PluginFormats()) {
    if (format.canWrite) extensions.push_back(LowerCase(format.extension));
  }
  return extensions;
}

std::vector<int32_t> FormatListRows() {
  std::vector<int32_t> rows;
  for (int32_t i = 0; i < formatCount; ++i) {
    if ((FormatRow(i).flags & (FMT_CLIPBOARD | FMT_SPARE)) == 0) rows.push_back(i);
  }
  return rows;
}

std::vector<int32_t> ChoiceRows() {
  std::vector<int32_t> rows;
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    if (row.enabled == 1 && (row.flags & (FMT_CLIPBOARD | FMT_HIDDEN | FMT_SPARE)) == 0)
      rows.push_back(i);
  }
  return rows;
}

std::string FormatListLine(int32_t index) {
  const FormatEntry& row = FormatRow(index);
  return (row.enabled != 0 ? "\xc3\x97\t" : " \t") + std::string(row.description.view());
}

}  // namespace fotomill
