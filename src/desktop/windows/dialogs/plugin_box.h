#pragma once

#include <wx/dialog.h>

#include <string>
#include <vector>

#include "plugins/plugin_table.h"

class wxDataViewListCtrl;
class wxStaticText;

namespace fotomill::desktop {

// The formats of all plug-ins with their capabilities, check boxes for the modules, and access to
// their settings.
class PluginBox : public wxDialog {
 public:
  explicit PluginBox(wxWindow* parent);

 private:
  void FillList();
  void AddModule(const PluginModule& module);
  void Turn(int line);
  void Configure();
  void ChangeOptions(const std::string& module, int32_t row);
  void OpenHelp();

  wxDataViewListCtrl* list_ = nullptr;
  struct Line {
    std::string module;  // file name
    int32_t row;         // in the plug-in table, -1: module not loaded
  };
  std::vector<Line> lines_;
  wxStaticText* note_ = nullptr;
};

}  // namespace fotomill::desktop
