#pragma once

#include <wx/treelist.h>

#include <span>

#include "desktop/models/info/info_report.h"

namespace fotomill::desktop {

// Shows sections of lines as a tree with two columns, name and value.
class ReportTree : public wxTreeListCtrl {
 public:
  explicit ReportTree(wxWindow* parent);

  // Replaces the contents.
  void Show(std::span<const InfoSection> sections);
  // The value of the selected line, or the title of a section; empty without a selection.
  wxString SelectedValue() const;

 private:
  void OpenLink(wxTreeListItem item);
};

}  // namespace fotomill::desktop
