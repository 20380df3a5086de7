#pragma once

#include <wx/scrolwin.h>

#include <functional>
#include <vector>

#include "desktop/models/setup/setup_pages.h"
#include "desktop/windows/setup/bound_controls.h"

class wxSizer;
class wxStaticText;

namespace fotomill::desktop {

// A page of settings: a box for each group, in it a labeled control for each key, and a mark
// before those that do not show their default. It fills nothing: whoever made it binds its
// controls.
class SettingsPanel : public wxScrolledWindow {
 public:
  // `changed` is called after the user changed a control. `above` is on top of the groups, if
  // given.
  SettingsPanel(wxWindow* parent, std::vector<SetupItem> items, std::function<void()> changed,
                const std::function<wxWindow*(wxWindow*)>& above = {});

  // The rows that it was made of.
  const std::vector<SetupItem>& Items() const { return items_; }
  // Marks what differs from its default; how many do.
  size_t UpdateMarks(const BoundControls& controls);
  // The rows of the keys, for resetting them together.
  std::vector<KeyRow> Rows() const;

 private:
  void AddItem(wxWindow* box, wxSizer* grid, const SetupItem& item);

  const std::vector<SetupItem> items_;
  int labelWidth_ = 0;
  std::vector<wxStaticText*> marks_;
};

// F1 in a window of settings: shows the help page of the control that has the focus.
void BindSettingsHelp(wxWindow& window);

}  // namespace fotomill::desktop
