#pragma once

#include <wx/window.h>

namespace fotomill::desktop {

// A canvas that shows a picture being edited, or a problem with it.
class EditCanvas : public wxWindow {
 public:
  EditCanvas(wxWindow* parent, const wxString& name);
  void ShowProblem(const wxString& problem);  // over the picture; empty: none

 protected:
  const wxString& Problem() const { return problem_; }
  void PaintProblem(wxDC& dc) const;

 private:
  wxString problem_;
};

}  // namespace fotomill::desktop
