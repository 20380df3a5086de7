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

// The controls of one Setup dialog, by number. Faces implement it; the binding below says what goes
// in and what comes out. Texts are bytes, UTF-8 unless the user of an older version chose
// otherwise.
class SetupDialog {
 public:
  virtual ~SetupDialog() = default;
  // Whether the dialog has that control. The rest is asked of those that it has only.
  virtual bool Has(uint32_t control) const = 0;

  virtual void SetChecked(uint32_t control, bool checked) = 0;  // a check box or radio button
  virtual bool IsChecked(uint32_t control) const = 0;
  // Of an edit field, or of any control that shows a text.
  virtual void SetText(uint32_t control, std::string_view text) = 0;
  virtual std::string Text(uint32_t control) const = 0;  // what SetText has set, or the user
  virtual void LimitText(uint32_t control, size_t bytes) = 0;  // no more can be typed
  virtual void SetRange(uint32_t control, const SpinRange& range) = 0;  // of a spin control
  virtual void SetColour(uint32_t control, int32_t color) = 0;  // 0x00BBGGRR
  virtual int32_t Color(uint32_t control) const = 0;  // 0x00BBGGRR
  // A combo or list box; positions count from 0, -1 is none.
  virtual void SetChoices(uint32_t control, std::span<const std::string> texts) = 0;
  virtual void Select(uint32_t control, int32_t position) = 0;  // -1: nothing
  virtual int32_t Selected(uint32_t control) const = 0;  // -1: nothing
};

// What a combo of destination formats offers: extensions in the order in which they are shown.
class DestinationSource {
 public:
  virtual ~DestinationSource() = default;
  // Lower case, without dot.
  virtual std::vector<std::string> Extensions() const = 0;
};

// Which values controls are filled with.
enum class SetupValues { InForce, Default };

// Fills every control of the dialog that edits a key with the key's value, its limit, range or
// choices. With the defaults no key changes until ReadSetupDialog takes them up.
void FillSetupDialog(SetupDialog& dialog, const DestinationSource& destinations,
                     std::span<const KeyRow> rows = Keys(),
                     SetupValues values = SetupValues::InForce);
// Whether the control of a row shows what it would show for the row's default.
bool ShowsDefault(const SetupDialog& dialog, const DestinationSource& destinations,
                  const KeyRow& row);

// A control whose value cannot be taken.
struct SetupFault {
  uint32_t control;
  std::string message;  // what it takes, a whole sentence
};

// The dialog's OK: takes up what its controls hold, all or nothing. Returns the first control that
// holds what its key cannot; then no key has changed. Changed keys are saved by the next
// SaveConfiguration even if --set gave them.
std::optional<SetupFault> ReadSetupDialog(const SetupDialog& dialog,
                                          const DestinationSource& destinations,
                                          std::span<const KeyRow> rows = Keys());

// To be called when the user changes a control: sets the setup-changed mark when the control's key
// asks for it.
void NoteControlChanged(uint32_t control);
// The mark: whether windows have to show something else now. Asking clears it.
bool TakeSetupChanged();

// The help page for a control: the name of its key, or that of the page about Setup as a whole.
std::string_view HelpPageFor(uint32_t control);
inline constexpr std::string_view kGeneralHelpPage = "configuration";  // about Setup as a whole

}  // namespace fotomill
