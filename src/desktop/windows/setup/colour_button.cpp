#include "desktop/windows/setup/colour_button.h"

#include <wx/bmpbndl.h>
#include <wx/colordlg.h>
#include <wx/dcmemory.h>
#include <wx/settings.h>

namespace fotomill::desktop {

namespace {

wxColour ColourOf(int32_t setting) { return wxColour(static_cast<unsigned long>(setting) & 0xFFFFFF); }
int32_t SettingOf(const wxColour& colour) { return static_cast<int32_t>(colour.GetRGB()); }

wxBitmap Swatch(const wxWindow& window, const wxColour& colour) {
  wxBitmap bitmap;
  bitmap.CreateWithDIPSize(wxSize(32, 14), window.GetDPIScaleFactor());
  wxMemoryDC dc(bitmap);
  dc.SetPen(wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT));
  dc.SetBrush(colour);
  dc.DrawRectangle(wxPoint(), bitmap.GetLogicalSize());
  return bitmap;
}

}  // namespace

std::optional<int32_t> SelectColour(wxWindow* parent, int32_t colour, const wxString& title) {
  static wxColourData data;
  data.SetChooseFull(true);
  data.SetColour(ColourOf(colour));
  wxColourDialog dialog(parent, &data);
  dialog.SetTitle(title);
  dialog.SetName(kColourSelectBox);
  if (dialog.ShowModal() != wxID_OK) return std::nullopt;
  data = dialog.GetColourData();
  return SettingOf(data.GetColour());
}

ColourButton::ColourButton(wxWindow* parent, wxWindowID id, const wxString& title)
    : wxButton(parent, id, "#000000"), title_(title) {
  SetSetting(0);
  Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) {
    const auto chosen = SelectColour(wxGetTopLevelParent(this), colour_, title_);
    if (!chosen || *chosen == colour_) return;
    SetSetting(*chosen);
    event.Skip();
  });
}

void ColourButton::SetSetting(int32_t colour) {
  colour_ = colour & 0xFFFFFF;
  const wxColour shown = ColourOf(colour_);
  SetBitmap(wxBitmapBundle(Swatch(*this, shown)));
  SetLabel(shown.GetAsString(wxC2S_HTML_SYNTAX));
}

}  // namespace fotomill::desktop
