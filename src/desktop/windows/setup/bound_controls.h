#pragma once

#include <wx/window.h>

#include <string>
#include <unordered_map>
#include <utility>

#include "settings/setup_dialog.h"

namespace fotomill::desktop {

// Adapts the controls below a window to the settings binding: the number of a control is its window
// ID.
class BoundControls : public SetupDialog {
 public:
  explicit BoundControls(wxWindow& root) : root_(root) {}

  bool Has(uint32_t control) const override { return Find(control) != nullptr; }
  void SetChecked(uint32_t control, bool checked) override;
  bool IsChecked(uint32_t control) const override;
  void SetText(uint32_t control, std::string_view text) override;
  std::string Text(uint32_t control) const override;
  void LimitText(uint32_t control, size_t bytes) override;
  void SetRange(uint32_t control, const SpinRange& range) override;
  void SetColour(uint32_t control, int32_t color) override;
  int32_t Color(uint32_t control) const override;
  void SetChoices(uint32_t control, std::span<const std::string> texts) override;
  void Select(uint32_t control, int32_t position) override;
  int32_t Selected(uint32_t control) const override;

  // The window of a control; null if there is none.
  wxWindow* Find(uint32_t control) const { return root_.FindWindow(static_cast<long>(control)); }

 private:
  wxWindow& root_;
  // Texts that are not UTF-8: original bytes and displayed text; if unchanged, they are stored back
  // byte for byte.
  std::unordered_map<uint32_t, std::pair<std::string, wxString>> foreignTexts_;
};

// The formats in a destination list.
class RegistryDestinations : public DestinationSource {
 public:
  std::vector<std::string> Extensions() const override;
};

}  // namespace fotomill::desktop
