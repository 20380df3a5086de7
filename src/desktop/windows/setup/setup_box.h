#pragma once

#include <wx/dialog.h>

#include <functional>
#include <vector>

#include "desktop/models/shell/key_map.h"
#include "desktop/windows/setup/language_panel.h"
#include "desktop/windows/setup/settings_panel.h"

class wxListBox;
class wxSearchCtrl;
class wxStaticText;

namespace fotomill::desktop {

class KeysPanel;

// All settings: list of pages on the left, search
// field above, controls of one page on the right.
class SetupBox : public wxDialog {
 public:
  // `applied` is called after settings have been changed and saved.
  // `commands` are those whose keys can be changed.
  SetupBox(wxWindow* parent, std::vector<KeyedCommand> commands, std::function<void()> applied,
           SetupPage first = SetupPage::Browsing);

 private:
  void BuildPages(wxSizer& column, std::vector<KeyedCommand> commands);
  wxSizer* BuildButtons();
  void ShowPages();             // fills the list: all pages, or search results
  void ChooseLine(bool focus);  // shows the selected item
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
  KeysPanel* keys_ = nullptr;
  std::vector<SetupItem> found_;  // list contents during a search
  bool searching_ = false;
  SetupPage page_;
  wxSearchCtrl* search_ = nullptr;
  wxListBox* list_ = nullptr;
  wxStaticText* title_ = nullptr;
};

// A dialog for a few settings with OK and Cancel: options of a format, or of the file history. True
// if confirmed and saved.
bool ShowSettingsBox(wxWindow* parent, const wxString& title, const wxString& name,
                     const std::vector<SetupItem>& items);

}  // namespace fotomill::desktop
