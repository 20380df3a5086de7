#include "desktop/windows/widgets/button_row.h"

#include <wx/button.h>

#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

wxSizer* BuildAnswerRow(wxWindow& dialog, wxButton& answer) {
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(&dialog, wxID_CANCEL),
               wxSizerFlags().Border(wxRIGHT, dialog.FromDIP(10)));
  buttons->Add(&answer);
  answer.SetDefault();
  return buttons;
}

wxSizer* BuildButtonRow(wxFrame& frame, wxWindow& panel, std::span<const RowButton> rows) {
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  for (const RowButton& row : rows) {
    const bool closes = row.id == wxID_CLOSE;
    if (closes) buttons->AddStretchSpacer();
    auto* button = new wxButton(&panel, row.id, Label(row.label));
    const bool last = &row == &rows.back();
    buttons->Add(button, wxSizerFlags().Border(wxRIGHT, last ? 0 : frame.FromDIP(6)));
    const auto run = [button, action = row.run](wxCommandEvent&) {
      if (button->IsEnabled()) action();
    };
    frame.Bind(wxEVT_BUTTON, run, row.id);
    frame.Bind(wxEVT_MENU, run, row.id);
  }
  return buttons;
}

}  // namespace fotomill::desktop
