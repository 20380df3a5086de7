#include "desktop/windows/setup/override_box.h"

#include "desktop/models/setup/override_options.h"
#include "desktop/windows/setup/setup_box.h"
#include "desktop/windows/widgets/wx_text.h"
#include "registry/registry.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// The boxes of rows whose table entry has one. The rest of the formats with options reach theirs by ShowOverrideBox.
template <size_t index>
int32_t RowOptions(void* parentWindow, int32_t) {
  static constexpr const char* kExtensions[] = {"HDP", "ICO", "JPG", "PNG", "TIF", "WEBP"};
  return ShowOverrideBox(static_cast<wxWindow*>(parentWindow), kExtensions[index]) ? 1 : 0;
}

struct RowBox {
  const char* extension;
  OptionsOperation options;
};
constexpr RowBox kRowBoxes[] = {
    {"HDP", RowOptions<0>}, {"ICO", RowOptions<1>}, {"JPG", RowOptions<2>},
    {"PNG", RowOptions<3>}, {"TIF", RowOptions<4>}, {"WEBP", RowOptions<5>},
};

}  // namespace

bool HasOverrideBox(std::string_view extension) { return FindOverrideOptions(extension) != nullptr; }

bool ShowOverrideBox(wxWindow* parent, std::string_view extension) {
  const OverrideOptions* const options = FindOverrideOptions(extension);
  if (options == nullptr) return false;
  return ShowSettingsBox(parent, wxString(options->extension) + " options", options->box, ItemsOf(*options));
}

bool ShiftOpensOverrideBox() { return settings.AllowDestinationOverrides != 0; }

void InstallOverrideBoxes() {
  for (const RowBox& box : kRowBoxes) {
    if (!HasOverrideBox(box.extension)) continue;
    const int32_t row = FindFormatByName(std::string("a.") + box.extension);
    if (row != kNoFormat) FormatRow(row).options = box.options;
  }
}

}  // namespace fotomill::desktop
