#pragma once

#include <wx/dialog.h>

#include <functional>
#include <vector>

#include "desktop/windows/setup/language_panel.h"
#include "desktop/windows/setup/settings_panel.h"

class wxListBox;
class wxSearchCtrl;
class wxSimplebook;
class wxStaticText;

namespace fotomill::desktop {

// All settings: pages at the left, a search field over all of them above, the controls of one page
// at the right.
class SetupBox : public wxDialog {
 public:
  // `applied` is called whenever settings have changed and were saved.
  SetupBox(wxWindow* parent, std::function<void()> applied, SetupPage first = SetupPage::Browsing);

 private:
  void BuildPages();
  wxSizer* BuildButtons();
  void ShowPages();             // fills the list at the left: all pages, or what the search found
  void ChooseLine(bool focus);  // shows what the list has selected
  void ShowPage(SetupPage page);
  void ControlChanged();
  bool Apply();
  void ResetPage();
  void Import();
  void Export();
  void OpenDataFolder();
  void Report(bool ok, const std::string& message);
  SettingsPanel& Panel() const;

  const std::function<void()> applied_;
  BoundControls controls_;
  RegistryDestinations destinations_;
  std::vector<SettingsPanel*> panels_;
  LanguagePanel* language_ = nullptr;
  std::vector<SetupItem> found_;  // what the list shows while something is searched for
  bool searching_ = false;
  SetupPage page_;
  wxSearchCtrl* search_ = nullptr;
  wxListBox* list_ = nullptr;
  wxStaticText* title_ = nullptr;
  wxSimplebook* book_ = nullptr;
};

// A box of a few settings with OK and Cancel: the options of a format, of the file history. True
// when the user confirmed; the settings are saved then.
bool ShowSettingsBox(wxWindow* parent, const wxString& title, const wxString& name,
                     const std::vector<SetupItem>& items);

}  // namespace fotomill::desktop
