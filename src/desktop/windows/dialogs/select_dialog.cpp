#include "desktop/windows/dialogs/select_dialog.h"

#include <wx/button.h>
#include <wx/dialog.h>
#include <wx/radiobox.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

wxString& LastPattern() {
  static wxString pattern = "*.jpg";
  return pattern;
}

}  // namespace

bool AskAndSelect(wxWindow& parent, BrowserModel& model) {
  wxDialog dialog(&parent, wxID_ANY, Label("Select by pattern"), wxDefaultPosition, wxDefaultSize,
                  wxDEFAULT_DIALOG_STYLE, "SelectBox");
  const int gap = dialog.FromDIP(10);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  sizer->Add(new wxStaticText(&dialog, wxID_ANY,
                              Label("&Names that contain this text or match this pattern (*, ?):")),
             wxSizerFlags().Border(wxALL, gap));
  auto* pattern =
      new wxTextCtrl(&dialog, wxID_ANY, LastPattern(), wxDefaultPosition,
                     dialog.FromDIP(wxSize(320, -1)), 0, wxDefaultValidator, Label("Pattern"));
  sizer->Add(pattern, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, gap));
  // in the order of MatchMode
  const wxString modes[] = {Label("&Replace the selection"), Label("&Add to the selection"),
                            Label("Re&move from the selection")};
  auto* mode = new wxRadioBox(&dialog, wxID_ANY, Label("Selection"), wxDefaultPosition,
                              wxDefaultSize, 3, modes, 1, wxRA_SPECIFY_ROWS);
  sizer->Add(mode, wxSizerFlags().Expand().Border(wxALL, gap));
  auto* ok = new wxButton(&dialog, wxID_OK, Label("S&elect"));
  sizer->Add(BuildAnswerRow(dialog, *ok), wxSizerFlags().Expand().Border(wxALL, gap));
  dialog.SetSizerAndFit(sizer);
  dialog.CentreOnParent();
  pattern->Bind(wxEVT_TEXT, [&](wxCommandEvent&) { ok->Enable(!pattern->IsEmpty()); });
  pattern->SetFocus();
  pattern->SelectAll();
  LogEvent("prompt", "select");
  if (dialog.ShowModal() != wxID_OK) return false;
  LastPattern() = pattern->GetValue();
  model.SelectMatching(Utf8(pattern->GetValue()), static_cast<MatchMode>(mode->GetSelection()));
  return true;
}

}  // namespace fotomill::desktop
