#include "desktop/windows/edit/edit_canvas.h"

#include <wx/dc.h>

namespace fotomill::desktop {

EditCanvas::EditCanvas(wxWindow* parent, const wxString& name) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  Create(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxWANTS_CHARS | wxBORDER_NONE, name);
}

void EditCanvas::ShowProblem(const wxString& problem) {
  problem_ = problem;
  Refresh();
}

void EditCanvas::PaintProblem(wxDC& dc) const {
  if (problem_.empty()) return;
  dc.SetTextForeground(*wxWHITE);
  dc.SetBrush(wxBrush(wxColour(0, 0, 0, 170)));
  dc.SetPen(*wxTRANSPARENT_PEN);
  const wxSize extent = dc.GetMultiLineTextExtent(problem_) + FromDIP(wxSize(24, 14));
  const wxRect box = wxRect(extent).CentreIn(wxRect(GetClientSize()));
  dc.DrawRoundedRectangle(box, FromDIP(6));
  dc.DrawLabel(problem_, box, wxALIGN_CENTER);
}

}  // namespace fotomill::desktop
