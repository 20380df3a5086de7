#include "settings/setup_dialog.h"

#include <algorithm>
#include <utility>

#include "core/text.h"
#include "settings/configuration.h"
#include "settings/setting_value.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

bool setupChanged = false;

std::vector<std::string> ChoiceTexts(const KeyRow& row) {
  std::vector<std::string> texts;
  for (const ChoiceEntry* entry = row.extra.choices; entry->text != nullptr; ++entry)
    texts.emplace_back(Tr(entry->text));
  return texts;
}

int32_t ValueAt(const KeyRow& row, int32_t position) {
  return (row.type & KEY_BY_VALUE) != 0 ? row.extra.choices[position].value : position;
}

// The list position of a number; numbers that are not listed are shown as the default, or else as
// the last entry.
int32_t PositionOf(const KeyRow& row, int32_t number) {
  int32_t last = 0, byDefault = -1;
  for (; row.extra.choices[last].text != nullptr; ++last) {
    if (ValueAt(row, last) == number) return last;
    if (ValueAt(row, last) == DefaultNumber(row)) byDefault = last;
  }
  return byDefault >= 0 ? byDefault : last - 1;
}

int32_t NumberOf(const KeyRow& row, SetupValues values) {
  return values == SetupValues::Default ? DefaultNumber(row) : NumberIn(row);
}

std::string_view TextOf(const KeyRow& row, SetupValues values) {
  return values == SetupValues::Default ? DefaultText(row) : TextIn(row);
}

int32_t DestinationPosition(std::span<const std::string> extensions, std::string_view wanted) {
  const auto found = std::ranges::find_if(
      extensions, [&](const std::string& one) { return EqualIgnoringCase(one, wanted); });
  return found == extensions.end() ? -1 : static_cast<int32_t>(found - extensions.begin());
}

void FillDestinations(SetupDialog& dialog, const DestinationSource& destinations, const KeyRow& row,
                      SetupValues values) {
  const std::vector<std::string> extensions = destinations.Extensions();
  dialog.SetChoices(row.control, extensions);
  dialog.Select(row.control, DestinationPosition(extensions, TextOf(row, values)));
}

// The dialog's own range for a spin control takes precedence.
SpinRange RangeIn(const SetupDialog& dialog, const KeyRow& row) {
  const uint32_t control = row.control + kSpinRangeControl;
  const auto range = dialog.Has(control) ? ParseSpinRange(dialog.Text(control)) : std::nullopt;
  return range ? *range : SpinRangeOf(row);
}

void FillControl(SetupDialog& dialog, const DestinationSource& destinations, const KeyRow& row,
                 SetupValues values) {
  if ((row.type & KEY_FLAG) != 0) {
    dialog.SetChecked(row.control, NumberOf(row, values) != 0);
  } else if ((row.type & KEY_DESTINATION) != 0) {
    FillDestinations(dialog, destinations, row, values);
  } else if ((row.type & KEY_TEXT) != 0) {
    dialog.LimitText(row.control, TextLimit(row));
    if ((row.type & KEY_FILLED_TEXT) == 0) dialog.SetText(row.control, TextOf(row, values));
  } else if ((row.type & KEY_CHOICE) != 0) {
    dialog.SetChoices(row.control, ChoiceTexts(row));
    dialog.Select(row.control, PositionOf(row, NumberOf(row, values)));
  } else if ((row.type & KEY_COLOR) != 0) {
    dialog.SetColour(row.control, NumberOf(row, values));
  } else {
    if ((row.type & KEY_SPIN) != 0) dialog.SetRange(row.control, RangeIn(dialog, row));
    dialog.SetText(row.control, std::to_string(NumberOf(row, values)));
  }
}

// The contents of a key's control.
struct ControlValue {
  const KeyRow* row;
  std::string text;   // the value in configuration file syntax
  std::string fault;  // the valid values, if this is not one
};

// A check box only knows off and on: an unchanged number is kept, and turning it on sets 1, or the
// default of a loose flag.
int32_t FlagIn(const SetupDialog& dialog, const KeyRow& row) {
  const bool checked = dialog.IsChecked(row.control);
  if (checked == (NumberIn(row) != 0)) return NumberIn(row);
  return checked ? std::max(IsLooseFlag(row) ? DefaultNumber(row) : 1, 1) : 0;
}

// A choice whose position is unchanged keeps its number.
int32_t ChoiceIn(const SetupDialog& dialog, const KeyRow& row) {
  const int32_t position = dialog.Selected(row.control);
  return position < 0 || position == PositionOf(row, NumberIn(row)) ? NumberIn(row)
                                                                    : ValueAt(row, position);
}

std::string DestinationIn(const SetupDialog& dialog, const DestinationSource& destinations,
                          const KeyRow& row) {
  const std::vector<std::string> extensions = destinations.Extensions();
  const auto position = static_cast<size_t>(dialog.Selected(row.control));
  if (position >= extensions.size() || EqualIgnoringCase(extensions[position], TextIn(row)))
    return std::string(TextIn(row));
  return extensions[position];
}

std::string ValueIn(const SetupDialog& dialog, const DestinationSource& destinations,
                    const KeyRow& row) {
  if ((row.type & KEY_FLAG) != 0) return std::to_string(FlagIn(dialog, row));
  if ((row.type & KEY_DESTINATION) != 0) return DestinationIn(dialog, destinations, row);
  if ((row.type & KEY_CHOICE) != 0) return std::to_string(ChoiceIn(dialog, row));
  if ((row.type & KEY_COLOR) != 0) return std::to_string(dialog.Color(row.control));
  return dialog.Text(row.control);
}

ControlValue ReadControl(const SetupDialog& dialog, const DestinationSource& destinations,
                         const KeyRow& row) {
  ControlValue control{&row, ValueIn(dialog, destinations, row), {}};
  if (control.text == ValueText(row)) return control;  // unchanged
  const SettingValue value = ReadValue(row, control.text, ValueSource::Person);
  if (!value.usable) {
    control.fault = FaultMessage(row, value.fault);
  } else if ((row.type & KEY_SPIN) != 0) {
    const SpinRange range = RangeIn(dialog, row);
    if (value.number < range.minimum || value.number > range.maximum) {
      control.fault =
          Tr("%1 takes a number from %2 to %3.", row.name, range.minimum, range.maximum);
    }
  }
  return control;
}

}  // namespace

void FillSetupDialog(SetupDialog& dialog, const DestinationSource& destinations,
                     std::span<const KeyRow> rows, SetupValues values) {
  for (const KeyRow& row : rows) {
    if (row.control != 0 && dialog.Has(row.control)) FillControl(dialog, destinations, row, values);
  }
}

bool ShowsDefault(const SetupDialog& dialog, const DestinationSource& destinations,
                  const KeyRow& row) {
  if ((row.type & KEY_FLAG) != 0) return dialog.IsChecked(row.control) == (DefaultNumber(row) != 0);
  if ((row.type & KEY_DESTINATION) != 0) {
    return dialog.Selected(row.control) ==
           DestinationPosition(destinations.Extensions(), DefaultText(row));
  }
  if ((row.type & KEY_CHOICE) != 0)
    return dialog.Selected(row.control) == PositionOf(row, DefaultNumber(row));
  if ((row.type & KEY_COLOR) != 0) return dialog.Color(row.control) == DefaultNumber(row);
  return dialog.Text(row.control) == DefaultValueText(row);
}

std::optional<SetupFault> ReadSetupDialog(const SetupDialog& dialog,
                                          const DestinationSource& destinations,
                                          std::span<const KeyRow> rows) {
  std::vector<ControlValue> controls;
  for (const KeyRow& row : rows) {
    if (row.control == 0 || !dialog.Has(row.control)) continue;
    ControlValue control = ReadControl(dialog, destinations, row);
    if (!control.fault.empty()) return SetupFault{row.control, control.fault};
    controls.push_back(std::move(control));
  }
  for (const ControlValue& control : controls) {
    const SettingValue value = ReadValue(*control.row, control.text, ValueSource::Person);
    if (!value.usable || HoldsValue(*control.row, value)) continue;
    StoreValue(*control.row, value);
    KeepSetting(*control.row);
    if ((control.row->type & KEY_SETUP) != 0) setupChanged = true;
  }
  return std::nullopt;
}

void NoteControlChanged(uint32_t control) {
  const KeyRow* const row = FindKeyOfControl(control);
  if (row != nullptr && (row->type & KEY_SETUP) != 0) setupChanged = true;
}

bool TakeSetupChanged() { return std::exchange(setupChanged, false); }

std::string_view HelpPageFor(uint32_t control) {
  const KeyRow* const row = FindKeyOfControl(control);
  return row == nullptr ? kGeneralHelpPage : std::string_view(row->name);
}

}  // namespace fotomill
