#pragma once

#include <wx/dialog.h>

class wxDataViewListCtrl;

namespace fotomill::desktop {

// The formats of all plug-ins, what each can do, and the way to their own settings.
class PluginBox : public wxDialog {
 public:
  explicit PluginBox(wxWindow* parent);

 private:
  void FillList();
  void Configure();

  wxDataViewListCtrl* list_ = nullptr;
};

}  // namespace fotomill::desktop
