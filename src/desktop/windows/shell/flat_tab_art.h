#pragma once

#include <wx/aui/auibook.h>

namespace fotomill::desktop {

// Draws tabs as plain texts; the current one is underlined in the color of the selection. Uses the
// system's colors of the moment.
class FlatTabArt : public wxAuiGenericTabArt {
 public:
  wxAuiTabArt* Clone() override { return new FlatTabArt(*this); }
  void DrawBorder(wxDC&, wxWindow*, const wxRect&) override {}
  void DrawBackground(wxDC& dc, wxWindow* window, const wxRect& rect) override;
  void DrawTab(wxDC& dc, wxWindow* window, const wxAuiNotebookPage& page, const wxRect& place,
               int closeState, wxRect* tab, wxRect* button, int* extent) override;
  wxSize GetTabSize(wxDC& dc, wxWindow* window, const wxString& caption,
                    const wxBitmapBundle& bitmap, bool active, int closeState,
                    int* extent) override;
  int GetBorderWidth(wxWindow*) override { return 0; }
  int GetAdditionalBorderSpace(wxWindow*) override { return 0; }
  int GetIndentSize() override { return 0; }
};

}  // namespace fotomill::desktop
