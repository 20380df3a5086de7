#include "desktop/windows/widgets/app_icon.h"

#include <wx/eventfilter.h>
#include <wx/iconbndl.h>
#include <wx/toplevel.h>

namespace fotomill::desktop {

namespace {

wxIconBundle MakeIcons() {
  wxIconBundle icons;
  for (const int side : {16, 24, 32, 48, 64, 128}) {
    wxIcon icon;
    icon.CopyFromBitmap(AppIcon(side).GetBitmap(wxSize(side, side)));
    icons.AddIcon(icon);
  }
  return icons;
}

// Sees each window being shown, so that no window has to ask for its icon.
class IconGiver : public wxEventFilter {
 public:
  IconGiver() { wxEvtHandler::AddFilter(this); }
  ~IconGiver() override { wxEvtHandler::RemoveFilter(this); }

  int FilterEvent(wxEvent& event) override {
    if (event.GetEventType() != wxEVT_SHOW) return Event_Skip;
    auto* const window = dynamic_cast<wxTopLevelWindow*>(event.GetEventObject());
    if (window != nullptr && window->GetIcons().IsEmpty()) window->SetIcons(icons_);
    return Event_Skip;
  }

 private:
  const wxIconBundle icons_ = MakeIcons();
};

}  // namespace

wxBitmapBundle AppIcon(int side) {
  return wxBitmapBundle::FromSVG(kAppIconSvg, wxSize(side, side));
}

void GiveIconsToWindows() { static IconGiver giver; }

}  // namespace fotomill::desktop
