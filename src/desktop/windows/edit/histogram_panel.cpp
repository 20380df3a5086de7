#include "desktop/windows/edit/histogram_panel.h"

#include <wx/dcbuffer.h>

#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

HistogramPanel::HistogramPanel(wxWindow* parent) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  Create(parent, wxID_ANY, wxDefaultPosition, parent->FromDIP(wxSize(200, 72)), wxBORDER_NONE,
         Label("Histogram"));
  SetMinSize(GetSize());
  SetToolTip(Label("Histogram of the result"));
  Bind(wxEVT_PAINT, &HistogramPanel::OnPaint, this);
  Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    Refresh();
    event.Skip();
  });
}

void HistogramPanel::Show(const PackedImage& image) {
  auto made = std::make_unique<Histogram>(HistogramOf(image));
  if (histogram_ != nullptr && *made == *histogram_) return;
  histogram_ = std::move(made);
  Refresh();
}

void HistogramPanel::Clear() {
  histogram_.reset();
  Refresh();
}

void HistogramPanel::OnPaint(wxPaintEvent&) {
  wxAutoBufferedPaintDC dc(this);
  const Shade background = CurrentPalette().background;
  dc.SetBackground(wxBrush(ToWx(background)));
  dc.Clear();
  if (histogram_ == nullptr) return;
  const double scale = GetContentScaleFactor();
  const wxSize size = GetClientSize() * scale;
  dc.DrawBitmap(BitmapOf(HistogramPixels(*histogram_, size.x, size.y, background), scale), 0, 0);
}

}  // namespace fotomill::desktop
