#pragma once

#include <wx/scrolwin.h>

#include <functional>
#include <vector>

#include "desktop/models/setup/setup_pages.h"
#include "desktop/windows/setup/bound_controls.h"

class wxSizer;
class wxStaticText;

namespace fotomill::desktop {

// A page of settings: a box per group, with a labeled control
// for each key, and marks for keys that differ from their
// defaults. The caller binds the controls to the settings.
class SettingsPanel : public wxScrolledWindow {
 public:
  // `changed` is called after the user has changed a control. `above` is shown above the groups, if
  // given.
  SettingsPanel(wxWindow* parent, std::vector<SetupItem> items, std::function<void()> changed,
                const std::function<wxWindow*(wxWindow*)>& above = {});

  // The rows it was created from.
  const std::vector<SetupItem>& Items() const { return items_; }
  // Marks controls that differ from their defaults; returns their number.
  size_t UpdateMarks(const BoundControls& controls);
  // The key rows, to reset them together.
  std::vector<KeyRow> Rows() const;

 private:
  void AddItem(wxWindow* box, wxSizer* grid, const SetupItem& item);

  const std::vector<SetupItem> items_;
  int labelWidth_ = 0;
  std::vector<wxStaticText*> marks_;
};

// F1 in a settings window shows help on the focused control.
void BindSettingsHelp(wxWindow& window);

}  // namespace fotomill::desktop
