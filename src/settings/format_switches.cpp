#include "settings/format_switches.h"

#include "core/text.h"
#include "registry/registry.h"
#include "settings/settings.h"

namespace fotomill {

void TakeFormatSwitches() {
  TakePluginOverride();
  for (const int32_t index : FormatListRows()) FormatRow(index).enabled = EnabledByDefault(index);
  IniReader reader(ConfigurationText(), kFormatSection);
  for (IniEntry entry; reader.Next(entry);) {
    for (const int32_t index : FormatListRows()) {
      FormatEntry& row = FormatRow(index);
      if (row.extension.view() == entry.key) row.enabled = LeadingInteger(entry.value) != 0 ? 1 : 0;
    }
  }
}

void TakePluginOverride() { LetPluginsOverrideFormats(settings.AllowPluginFormatOverride != 0); }

SaveResult SwitchFormat(int32_t index, bool on) {
  FormatEntry& row = FormatRow(index);
  row.enabled = on ? 1 : 0;
  IniEdit edit{row.extension.view(), std::nullopt};
  if (row.enabled != EnabledByDefault(index)) edit.value = on ? "1" : "0";
  return StoreInSection(kFormatSection, {&edit, 1});
}

}  // namespace fotomill
