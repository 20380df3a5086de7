#include "desktop/windows/similar/problem_box.h"

#include <wx/button.h>
#include <wx/dialog.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/info/text_actions.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

void ShowProblemBox(wxWindow& parent, const std::vector<std::string>& problems) {
  wxDialog box(&parent, wxID_ANY, Label("Not compared"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "SimilarProblemBox");
  wxString text;
  for (const std::string& problem : problems) text += Shown(problem) + "\n";
  auto* lines =
      new wxTextCtrl(&box, wxID_ANY, text, wxDefaultPosition, box.FromDIP(wxSize(640, 260)),
                     wxTE_MULTILINE | wxTE_READONLY | wxTE_DONTWRAP);
  lines->SetName(Label("Not compared"));
  auto* copy = new wxButton(&box, wxID_COPY);
  copy->Bind(wxEVT_BUTTON, [&text](wxCommandEvent&) { CopyText(text); });
  auto* close = new wxButton(&box, wxID_CANCEL, Label("Close"));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(copy);
  row->AddStretchSpacer();
  row->Add(close);
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(lines, wxSizerFlags(1).Expand().Border(wxLEFT | wxTOP | wxRIGHT, box.FromDIP(10)));
  column->Add(row, wxSizerFlags().Expand().Border(wxALL, box.FromDIP(10)));
  box.SetSizerAndFit(column);
  close->SetDefault();
  LogEvent("prompt", "similar-problems");
  box.ShowModal();
}

}  // namespace fotomill::desktop
