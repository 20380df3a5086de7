#pragma once

#include <wx/dialog.h>

#include <string>
#include <vector>

#include "plugins/plugin_table.h"

class wxDataViewListCtrl;
class wxStaticText;

namespace fotomill::desktop {

// The formats of all plug-ins, what each can do, the switches of their modules, and the way to
// their own settings.
class PluginBox : public wxDialog {
 public:
  explicit PluginBox(wxWindow* parent);

 private:
  void FillList();
  void AddModule(const PluginModule& module);
  void Turn(int line);
  void Configure();
  void OpenHelp();

  wxDataViewListCtrl* list_ = nullptr;
  struct Line {
    std::string module;  // its file name
    int32_t row;         // of the plug-in table, -1 for a module that is not loaded
  };
  std::vector<Line> lines_;
  wxStaticText* note_ = nullptr;
};

}  // namespace fotomill::desktop
