#include <cstdint>
#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

#include "core/ini_file.h"
#include "settings/folder_override.h"
#include "settings/history_list.h"
#include "settings/setting_value.h"
#include "settings/settings.h"
#include "settings/spin_range.h"

namespace fotomill {
namespace {

using Entries = std::vector<std::pair<std::string, std::string>>;

void Require(bool holds) {
  if (!holds) std::abort();
}

Entries EntriesOf(std::string_view text, std::string_view section,
                  std::span<const IniEdit> without) {
  Entries entries;
  IniReader reader(text, section);
  for (IniEntry entry; reader.Next(entry);) {
    bool edited = false;
    for (const IniEdit& edit : without) edited = edited || edit.key == entry.key;
    if (!edited) entries.emplace_back(entry.key, entry.value);
  }
  return entries;
}

// Any file may set any key; stored values must stay within their variables.
void TryValues(std::string_view text) {
  settings = defaultSettings;
  IniReader reader(text, "Fotomill");
  for (IniEntry entry; reader.Next(entry);) {
    const KeyRow* const row = FindKey(entry.key);
    if (row == nullptr) continue;
    for (const ValueSource source : {ValueSource::File, ValueSource::Person}) {
      const SettingValue value = ReadValue(*row, entry.value, source);
      (void)FaultMessage(*row, value.fault);
      if (!value.usable) continue;
      StoreValue(*row, value);
      Require(HoldsValue(*row, value));
    }
    const std::string saved = ValueText(*row);
    const SettingValue again = ReadValue(*row, saved, ValueSource::File);
    Require(again.fault == ValueFault::Internal || (again.usable && HoldsValue(*row, again)));
  }
}

// An edit must change its keys only, and repeating it must change nothing.
void TryEdits(std::string_view text) {
  const std::vector<IniEdit> edits{
      {"JpegCompression", "5"}, {"NewKey", " new "}, {"PrefixCrop", std::nullopt}};
  const std::string edited = EditIni(text, "Fotomill", edits);
  Require(FindIniValue(edited, "Fotomill", "JpegCompression") == "5");
  Require(FindIniValue(edited, "Fotomill", "NewKey") == " new ");
  Require(!FindIniValue(edited, "Fotomill", "PrefixCrop"));
  Require(EntriesOf(edited, "Fotomill", edits) == EntriesOf(text, "Fotomill", edits));
  Require(EntriesOf(edited, "Other", {}) == EntriesOf(text, "Other", {}));
  Require(EditIni(edited, "Fotomill", edits) == edited);
  Require(EditIni(text, "Fotomill", {}) == text);
}

void TryLists(std::string_view text) {
  std::string lines;
  const std::vector<std::string> entries = ParseHistoryList(text, 100);
  for (const std::string& entry : entries) lines += entry + "\n";
  Require(ParseHistoryList(lines, 100) == entries);

  lines.clear();
  const std::vector<RecentFile> files = ParseRecentFiles(text, 100);
  for (const RecentFile& file : files)
    lines += file.path + "," + std::to_string(file.number) + "\n";
  Require(ParseRecentFiles(lines, 100) == files);
}

}  // namespace
}  // namespace fotomill

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  const std::string text(data, data + size);
  TryValues(text);
  TryEdits(text);
  TryLists(text);
  const BrowserModes modes = ModesInOverride(text, {});
  Require(modes.thumbnails >= 0 && modes.thumbnails <= 3 && modes.view >= 0 && modes.view <= 4 &&
          modes.sort >= 0);
  (void)ParseSpinRange(text);
  return 0;
}
