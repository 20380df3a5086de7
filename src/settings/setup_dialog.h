#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "settings/key_table.h"
#include "settings/spin_range.h"

namespace fotomill {

// The controls of a Setup dialog, by number. Implemented by the user interface; the functions below
// define what is shown and read. Texts are UTF-8 unless they come from an older version with
// another encoding.
class SetupDialog {
 public:
  virtual ~SetupDialog() = default;
  // Whether the dialog has that control. All other functions are called for existing controls only.
  virtual bool Has(uint32_t control) const = 0;

  virtual void SetChecked(uint32_t control, bool checked) = 0;  // check box or radio button
  virtual bool IsChecked(uint32_t control) const = 0;
  // Of an edit field, or any other control with text.
  virtual void SetText(uint32_t control, std::string_view text) = 0;
  virtual std::string Text(uint32_t control) const = 0;  // as set by SetText or edited
  virtual void LimitText(uint32_t control, size_t bytes) = 0;  // limits the input length
  virtual void SetRange(uint32_t control, const SpinRange& range) = 0;  // of a spin control
  virtual void SetColour(uint32_t control, int32_t color) = 0;  // 0x00BBGGRR
  virtual int32_t Color(uint32_t control) const = 0;  // 0x00BBGGRR
  // Combo or list box; positions start at 0, -1 is none.
  virtual void SetChoices(uint32_t control, std::span<const std::string> texts) = 0;
  virtual void Select(uint32_t control, int32_t position) = 0;  // -1: none
  virtual int32_t Selected(uint32_t control) const = 0;  // -1: none
};

// The entries of a combo box for destination formats: extensions in display order.
class DestinationSource {
 public:
  virtual ~DestinationSource() = default;
  // Lowercase, without dot.
  virtual std::vector<std::string> Extensions() const = 0;
};

// Which values to show.
enum class SetupValues { InForce, Default };

// Sets every key's control to the key's value, with its limit, range or choices. Showing defaults
// changes no key until ReadSetupDialog.
void FillSetupDialog(SetupDialog& dialog, const DestinationSource& destinations,
                     std::span<const KeyRow> rows = Keys(),
                     SetupValues values = SetupValues::InForce);
// Whether a row's control shows the row's default.
bool ShowsDefault(const SetupDialog& dialog, const DestinationSource& destinations,
                  const KeyRow& row);

// A control with an invalid value.
struct SetupFault {
  uint32_t control;
  std::string message;  // the valid values, as a sentence
};

// For the dialog's OK button: stores the values of the controls, all or none. Returns the first
// control with an invalid value; then no key has changed. Changed keys are saved by the next
// SaveConfiguration even if they were set by --set.
std::optional<SetupFault> ReadSetupDialog(const SetupDialog& dialog,
                                          const DestinationSource& destinations,
                                          std::span<const KeyRow> rows = Keys());

// To be called when the user changes a control: sets the setup-changed mark if the control's key
// has KEY_SETUP.
void NoteControlChanged(uint32_t control);
// The setup-changed mark: whether windows must be refreshed. Reading clears it.
bool TakeSetupChanged();

// The help page for a control: its key's name, or that of the general Setup page.
std::string_view HelpPageFor(uint32_t control);
inline constexpr std::string_view kGeneralHelpPage = "configuration";  // the general Setup page

}  // namespace fotomill
