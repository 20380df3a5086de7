#pragma once

#include <wx/bitmap.h>
#include <wx/scrolwin.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/drawing/list_palette.h"
#include "desktop/models/info/side_report.h"

namespace fotomill::desktop {

// Preview and facts of a file, below each other; scrolls if they do not fit.
class SideView : public wxScrolled<wxWindow> {
 public:
  // `activated`: the preview was double-clicked.
  SideView(wxWindow* parent, std::function<void()> activated);

  // Shows a sentence only.
  void ShowHint(const wxString& hint);
  // Shows a file until its report is available; `thumbnail` may be empty.
  void ShowStandIn(const std::string& name, const RgbImage& thumbnail, bool folder);
  void ShowReport(SideReport report);
  // The edge of the square for previews, in device pixels.
  int PreviewSide() const;

 private:
  // A piece of the contents, placed relative to the top.
  struct Piece {
    enum Kind { Preview, Levels, Text } kind;
    wxRect place;
    wxString text = {};  // wrapped
    Shade ListPalette::*color = &ListPalette::text;
    bool bold = false;
  };
  void Changed();
  void Arrange();
  void AddText(const std::string& text, Shade ListPalette::*color, bool bold);
  void AddLines(const std::vector<std::string>& lines, Shade ListPalette::*color);
  void OnPaint(wxPaintEvent& event);
  void Draw(wxDC& dc, const Piece& piece, const ListPalette& palette);
  void DrawPreview(wxDC& dc, const wxRect& place, const ListPalette& palette);
  void ShowMenu();
  int ContentWidth() const;

  const std::function<void()> activated_;
  SideReport report_;
  bool folder_ = false;
  bool ready_ = false;  // the report is complete
  wxString hint_;
  wxBitmap preview_;
  std::vector<Piece> pieces_;
  int bottom_ = 0;  // where the next piece goes
  int width_ = 0;   // for which they were placed
};

}  // namespace fotomill::desktop
