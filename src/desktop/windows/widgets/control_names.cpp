#include "desktop/windows/widgets/control_names.h"

#include <wx/app.h>
#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/dataview.h>
#include <wx/eventfilter.h>
#include <wx/listctrl.h>
#include <wx/radiobox.h>
#include <wx/radiobut.h>
#include <wx/scrolwin.h>
#include <wx/slider.h>
#include <wx/spinctrl.h>
#include <wx/splitter.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/tglbtn.h>
#include <wx/toolbar.h>
#include <wx/treectrl.h>
#include <wx/treelist.h>
#include <wx/weakref.h>

#include <algorithm>
#include <vector>

#include "desktop/windows/widgets/screen_reader.h"

namespace fotomill::desktop {

namespace {

// Whether a window has an individual name, not the default of its wxWidgets class.
bool HasOwnName(const wxWindow& window) {
  static const wxString kNamesOfKinds[] = {
      wxEmptyString,         wxPanelNameStr,    wxControlNameStr,   wxTextCtrlNameStr,
      wxStaticTextNameStr,   wxButtonNameStr,   wxCheckBoxNameStr,  wxRadioButtonNameStr,
      wxRadioBoxNameStr,     wxChoiceNameStr,   wxComboBoxNameStr,  wxListBoxNameStr,
      wxListCtrlNameStr,     wxTreeCtrlNameStr, wxSliderNameStr,    wxSearchCtrlNameStr,
      wxDataViewCtrlNameStr, "wxSpinCtrl",      "wxSpinCtrlDouble", "scrolledWindow"};
  return std::ranges::find(kNamesOfKinds, window.GetName()) == std::end(kNamesOfKinds);
}

bool ShowsItsText(wxWindow& window) {
  return !window.GetLabel().empty() &&
         (dynamic_cast<wxAnyButton*>(&window) != nullptr || dynamic_cast<wxCheckBox*>(&window) != nullptr ||
          dynamic_cast<wxRadioButton*>(&window) != nullptr);
}

wxString PlainText(const wxString& label) {
  wxString text = wxControl::RemoveMnemonics(label);
  text.EndsWith(":", &text);
  return text.Strip(wxString::both);
}

// The text of a label created just before a control.
wxString TextBefore(const wxWindow& window) {
  const auto* const text = dynamic_cast<wxStaticText*>(window.GetPrevSibling());
  return text == nullptr ? wxString() : PlainText(text->GetLabel());
}

// Whether a control consists of internal child windows.
bool IsComposite(wxWindow* window) {
  return dynamic_cast<wxListCtrl*>(window) != nullptr ||
         dynamic_cast<wxTreeListCtrl*>(window) != nullptr;
}

// Empty if the window's own text is sufficient, or if there is nothing better.
wxString NameOf(wxWindow& window) {
  if (HasOwnName(window)) return window.GetName();
  if (IsComposite(window.GetParent())) return NameOf(*window.GetParent());
  if (ShowsItsText(window) || dynamic_cast<wxControl*>(&window) == nullptr) return {};
  const wxString before = TextBefore(window);
  return before.empty() ? window.GetToolTipText().BeforeFirst('\n') : before;
}

void NameControl(wxWindow& window) {
  // Toolbar buttons already have names.
  if (window.IsTopLevel() || dynamic_cast<wxStaticText*>(&window) != nullptr ||
      dynamic_cast<wxToolBar*>(&window) != nullptr)
    return;
  const wxString name = NameOf(window);
  if (!name.empty()) ReportToScreenReader(window, name);
}

// New windows may get their name during construction, so they are named when idle.
class Newcomers : public wxEventFilter {
 public:
  Newcomers() { wxEvtHandler::AddFilter(this); }
  ~Newcomers() override { wxEvtHandler::RemoveFilter(this); }

  int FilterEvent(wxEvent& event) override {
    if (event.GetEventType() != wxEVT_CREATE) return Event_Skip;
    auto* const window = static_cast<wxWindowCreateEvent&>(event).GetWindow();
    if (window == nullptr) return Event_Skip;
    if (waiting_.empty()) wxTheApp->CallAfter([this] { NameAll(); });
    waiting_.emplace_back(window);
    return Event_Skip;
  }

 private:
  void NameAll() {
    for (const wxWeakRef<wxWindow>& window : std::exchange(waiting_, {})) {
      if (window != nullptr && !window->IsBeingDeleted()) NameControl(*window);
    }
  }
  std::vector<wxWeakRef<wxWindow>> waiting_;
};

}  // namespace

void NameControlsAsTheyCome() { static Newcomers newcomers; }

}  // namespace fotomill::desktop
