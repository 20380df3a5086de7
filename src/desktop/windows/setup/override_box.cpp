#include "desktop/windows/setup/override_box.h"

#include "desktop/models/setup/override_options.h"
#include "desktop/windows/setup/setup_box.h"
#include "desktop/windows/widgets/wx_text.h"
#include "registry/registry.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// The `options` operation of rows; `parameter` is the row's index.
int32_t RowOptions(void* parentWindow, int32_t parameter) {
  return ShowOverrideBox(static_cast<wxWindow*>(parentWindow),
                         FormatRow(parameter).extension.view())
             ? 1
             : 0;
}

}  // namespace

bool HasOverrideBox(std::string_view extension) {
  return FindOverrideOptions(extension) != nullptr;
}

bool ShowOverrideBox(wxWindow* parent, std::string_view extension) {
  const FormatSettings* const options = FindOverrideOptions(extension);
  if (options == nullptr) return false;
  return ShowSettingsBox(parent, Label("%1 options", options->extension), options->box,
                         ItemsOf(*options));
}

bool ShiftOpensOverrideBox() { return settings.AllowDestinationOverrides != 0; }

void InstallOverrideBoxes() {
  for (int32_t index = 0; index < formatCount; ++index) {
    FormatEntry& row = FormatRow(index);
    if (row.hasOptionsBox && HasOverrideBox(row.extension.view())) row.options = RowOptions;
  }
}

}  // namespace fotomill::desktop
