#include "desktop/windows/shell/startup_window.h"

#include <wx/dcmemory.h>
#include <wx/settings.h>
#include <wx/splash.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/app_icon.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/configuration.h"

namespace fotomill::desktop {

namespace {

constexpr int kWidth = 420, kHeight = 170, kSymbol = 64;
constexpr int kLongestMs = 60'000;

wxBitmap Logo() {
  wxBitmap bitmap(kWidth, kHeight);
  wxMemoryDC dc(bitmap);
  const wxColour text = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
  dc.SetBackground(wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW));
  dc.Clear();
  dc.SetPen(text);
  dc.SetBrush(*wxTRANSPARENT_BRUSH);
  dc.DrawRectangle(0, 0, kWidth, kHeight);
  const wxBitmap symbol = AppIcon(kSymbol).GetBitmap(wxSize(kSymbol, kSymbol));
  dc.DrawBitmap(symbol, 28, (kHeight - kSymbol) / 2, true);
  const wxFont font = wxSystemSettings::GetFont(wxSYS_DEFAULT_GUI_FONT);
  dc.SetTextForeground(text);
  dc.SetFont(font.Bold().Scaled(1.7f));
  dc.DrawText("Fotomill Professional", 112, kHeight / 2 - dc.GetCharHeight());
  dc.SetFont(font);
  dc.DrawText(Label("Version %1", FOTOMILL_VERSION), 112, kHeight / 2 + 8);
  return bitmap;
}

}  // namespace

void ShowStartupWindow(const EarlySettings& early) {
  if (early.showStartupWindow == 0 || early.logoDelay <= 0) return;
  const int delay = std::min(early.logoDelay, kLongestMs);
  auto* const window =
      new wxSplashScreen(Logo(), wxSPLASH_CENTRE_ON_SCREEN | wxSPLASH_TIMEOUT, delay, nullptr,
                         wxID_ANY, wxDefaultPosition, wxDefaultSize, wxBORDER_NONE);
  window->Bind(wxEVT_DESTROY, [](wxWindowDestroyEvent& event) {
    LogEvent("startup-window", "closed");
    event.Skip();
  });
  LogEvent("startup-window", std::to_string(delay));
  window->Update();
}

}  // namespace fotomill::desktop
