#pragma once

#include <wx/panel.h>

#include <string>
#include <vector>

#include "desktop/models/shell/key_map.h"

class wxButton;
class wxListView;
class wxStaticText;
class wxTextCtrl;

namespace fotomill::desktop {

// The keys of commands: a list, and a field in which a key is pressed. Says which other command has
// that key; assigning it takes it from there.
class KeysPanel : public wxPanel {
 public:
  KeysPanel(wxWindow* parent, std::vector<KeyedCommand> commands);

  // Saves the keys; whether they have changed.
  bool Store();
  // All built-in keys again, not saved yet.
  void Reset();

 private:
  void ShowKeys();
  void ShowCommand();
  void Pressed(wxKeyEvent& event);
  void ShowPressed(const std::string& key);
  void Assign(bool builtIn);
  const KeyedCommand& Command() const;

  const std::vector<KeyedCommand> commands_;
  KeyMap keys_;
  std::string pressed_;
  wxListView* list_;
  wxTextCtrl* field_;
  wxButton* assign_;
  wxStaticText* note_;
};

}  // namespace fotomill::desktop
