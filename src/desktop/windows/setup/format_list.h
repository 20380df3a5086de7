#pragma once

#include <wx/dataview.h>

namespace fotomill::desktop {

// The format list: all formats with a check box and their capabilities in this build. Changes take
// effect and are saved immediately.
class FormatList : public wxDataViewListCtrl {
 public:
  explicit FormatList(wxWindow* parent);

 private:
  void Turn(const wxDataViewItem& item);
};

}  // namespace fotomill::desktop
