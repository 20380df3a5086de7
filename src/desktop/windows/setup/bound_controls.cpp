#include "desktop/windows/setup/bound_controls.h"

#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "core/utf8.h"
#include "core/whole_number.h"
#include "desktop/windows/setup/color_button.h"
#include "desktop/windows/setup/mask_list.h"
#include "desktop/windows/widgets/wx_text.h"
#include "registry/registry.h"

namespace fotomill::desktop {

namespace {

// Converts every byte of a text that is not UTF-8 to the character with that number.
wxString AsCharacters(std::string_view text) {
  wxString shown;
  for (const char c : text) shown += static_cast<wchar_t>(static_cast<unsigned char>(c));
  return shown;
}

}  // namespace

void BoundControls::SetChecked(uint32_t control, bool checked) {
  if (auto* box = dynamic_cast<wxCheckBox*>(Find(control))) box->SetValue(checked);
}

bool BoundControls::IsChecked(uint32_t control) const {
  const auto* box = dynamic_cast<wxCheckBox*>(Find(control));
  return box != nullptr && box->IsChecked();
}

void BoundControls::SetText(uint32_t control, std::string_view text) {
  wxWindow* const window = Find(control);
  foreignTexts_.erase(control);
  wxString shown = wxString::FromUTF8(text.data(), text.size());
  if (!IsUtf8(text)) {
    shown = AsCharacters(text);
    foreignTexts_.insert({control, {std::string(text), shown}});
  }
  if (auto* mask = dynamic_cast<MaskList*>(window)) {
    mask->SetMask(ParseNumber<int32_t>(text).value_or(0));
  } else if (auto* spin = dynamic_cast<wxSpinCtrl*>(window)) {
    spin->SetValue(ParseNumber<int32_t>(text).value_or(0));
  } else if (auto* field = dynamic_cast<wxTextCtrl*>(window)) {
    field->ChangeValue(shown);
  }
}

std::string BoundControls::Text(uint32_t control) const {
  wxWindow* const window = Find(control);
  if (const auto* mask = dynamic_cast<const MaskList*>(window)) return std::to_string(mask->Mask());
  if (const auto* spin = dynamic_cast<wxSpinCtrl*>(window)) return Utf8(spin->GetTextValue());
  if (const auto* label = dynamic_cast<wxStaticText*>(window)) return Utf8(label->GetLabelText());
  const auto* field = dynamic_cast<wxTextCtrl*>(window);
  if (field == nullptr) return {};
  const auto foreign = foreignTexts_.find(control);
  const bool unchanged =
      foreign != foreignTexts_.end() && foreign->second.second == field->GetValue();
  return unchanged ? foreign->second.first : Utf8(field->GetValue());
}

void BoundControls::LimitText(uint32_t control, size_t bytes) {
  if (auto* field = dynamic_cast<wxTextCtrl*>(Find(control)))
    field->SetMaxLength(static_cast<unsigned long>(bytes));
}

void BoundControls::SetRange(uint32_t control, const SpinRange& range) {
  auto* spin = dynamic_cast<wxSpinCtrl*>(Find(control));
  if (spin == nullptr) return;
  spin->SetRange(range.minimum, range.maximum);
  spin->SetIncrement(range.step);
}

void BoundControls::SetColour(uint32_t control, int32_t color) {
  if (auto* button = dynamic_cast<ColorButton*>(Find(control))) button->SetSetting(color);
}

int32_t BoundControls::Color(uint32_t control) const {
  const auto* button = dynamic_cast<const ColorButton*>(Find(control));
  return button == nullptr ? 0 : button->Setting();
}

void BoundControls::SetChoices(uint32_t control, std::span<const std::string> texts) {
  auto* choice = dynamic_cast<wxChoice*>(Find(control));
  if (choice == nullptr) return;
  wxArrayString items;
  for (const std::string& text : texts) items.Add(Shown(text));
  // Clearing a list, even briefly, would lose the focus.
  if (choice->GetStrings() != items) choice->Set(items);
}

void BoundControls::Select(uint32_t control, int32_t position) {
  if (auto* choice = dynamic_cast<wxChoice*>(Find(control))) choice->SetSelection(position);
}

int32_t BoundControls::Selected(uint32_t control) const {
  const auto* choice = dynamic_cast<wxChoice*>(Find(control));
  return choice == nullptr ? -1 : choice->GetSelection();
}

std::vector<std::string> RegistryDestinations::Extensions() const {
  return fotomill::DestinationExtensions();
}

}  // namespace fotomill::desktop
