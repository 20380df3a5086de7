#include "desktop/windows/metadata/day_dialog.h"

#include <wx/button.h>
#include <wx/calctrl.h>
#include <wx/dialog.h>
#include <wx/sizer.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

std::optional<std::string> AskForDay(wxWindow& parent, const std::string& text) {
  wxDialog dialog(&parent, wxID_ANY, Label("Date"), wxDefaultPosition, wxDefaultSize,
                  wxDEFAULT_DIALOG_STYLE, "DateBox");
  auto* calendar = new wxCalendarCtrl(&dialog, wxID_ANY);
  wxDateTime day;
  if (day.ParseFormat(Shown(text.substr(0, 10)), "%Y-%m-%d") && day.IsValid())
    calendar->SetDate(day);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  const int gap = parent.FromDIP(10);
  sizer->Add(calendar, wxSizerFlags(1).Expand().Border(wxALL, gap));
  auto* ok = new wxButton(&dialog, wxID_OK);
  sizer->Add(BuildAnswerRow(dialog, *ok),
             wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, gap));
  dialog.SetSizerAndFit(sizer);
  dialog.CentreOnParent();
  calendar->Bind(wxEVT_CALENDAR_DOUBLECLICKED,
                 [&dialog](wxCalendarEvent&) { dialog.EndModal(wxID_OK); });
  calendar->SetFocus();
  LogEvent("prompt", "date");
  if (dialog.ShowModal() != wxID_OK) return {};
  return Utf8(calendar->GetDate().Format("%Y-%m-%d"));
}

}  // namespace fotomill::desktop
