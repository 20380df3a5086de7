#pragma once

#include <wx/treelist.h>

#include <span>

#include "desktop/models/info/info_report.h"

namespace fotomill::desktop {

// Sections of lines as a tree of two columns, name and value.
class ReportTree : public wxTreeListCtrl {
 public:
  explicit ReportTree(wxWindow* parent);

  // Replaces what is shown.
  void Show(std::span<const InfoSection> sections);
  // The value of the selected line; of a section, its title. Empty without a selection.
  wxString SelectedValue() const;
};

}  // namespace fotomill::desktop
