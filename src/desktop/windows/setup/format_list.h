#pragma once

#include <wx/dataview.h>

namespace fotomill::desktop {

// The format list: every format with its switch and what this build can do with it. A switch that
// is turned takes effect and is saved at once.
class FormatList : public wxDataViewListCtrl {
 public:
  explicit FormatList(wxWindow* parent);

 private:
  void Turn(const wxDataViewItem& item);
};

}  // namespace fotomill::desktop
