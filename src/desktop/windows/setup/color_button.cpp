#include "desktop/windows/setup/color_button.h"

#include <wx/bmpbndl.h>
#include <wx/colordlg.h>
#include <wx/dcmemory.h>
#include <wx/settings.h>

namespace fotomill::desktop {

namespace {

wxColour ColorOf(int32_t setting) {
  return wxColour(static_cast<unsigned long>(setting) & 0xFFFFFF);
}
int32_t SettingOf(const wxColour& color) { return static_cast<int32_t>(color.GetRGB()); }

wxBitmap Swatch(const wxWindow& window, const wxColour& color) {
  wxBitmap bitmap;
  bitmap.CreateWithDIPSize(wxSize(32, 14), window.GetDPIScaleFactor());
  wxMemoryDC dc(bitmap);
  dc.SetPen(wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT));
  dc.SetBrush(color);
  dc.DrawRectangle(wxPoint(), bitmap.GetLogicalSize());
  return bitmap;
}

}  // namespace

std::optional<int32_t> SelectColor(wxWindow* parent, int32_t color, const wxString& title) {
  static wxColourData data;
  data.SetChooseFull(true);
  data.SetColour(ColorOf(color));
  wxColourDialog dialog(parent, &data);
  dialog.SetTitle(title);
  dialog.SetName(kColorSelectBox);
  if (dialog.ShowModal() != wxID_OK) return std::nullopt;
  data = dialog.GetColourData();
  return SettingOf(data.GetColour());
}

ColorButton::ColorButton(wxWindow* parent, wxWindowID id, const wxString& title)
    : wxButton(parent, id, "#000000"), title_(title) {
  SetSetting(0);
  Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) {
    const auto chosen = SelectColor(wxGetTopLevelParent(this), color_, title_);
    if (!chosen || *chosen == color_) return;
    SetSetting(*chosen);
    event.Skip();
  });
}

void ColorButton::SetSetting(int32_t color) {
  color_ = color & 0xFFFFFF;
  const wxColour shown = ColorOf(color_);
  SetBitmap(wxBitmapBundle(Swatch(*this, shown)));
  SetLabel(shown.GetAsString(wxC2S_HTML_SYNTAX));
}

}  // namespace fotomill::desktop
