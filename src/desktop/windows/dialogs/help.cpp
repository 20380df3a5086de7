#include "desktop/windows/dialogs/help.h"

#include <wx/dialog.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>

#include "desktop/models/setup/setup_help.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostOfAnEntry = 800;  // bytes; longer entries get a larger window

}  // namespace

void ShowHelp(wxWindow& window, std::string_view topic) {
  const HelpText help = HelpOn(topic);
  wxDialog dialog(wxGetTopLevelParent(&window), wxID_ANY, Label("Help: %1", Shown(help.title)),
                  wxDefaultPosition, wxDefaultSize, wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER,
                  "HelpBox");
  auto* column = new wxBoxSizer(wxVERTICAL);
  const bool whole = help.text.size() > kMostOfAnEntry;
  auto* text =
      new wxTextCtrl(&dialog, wxID_ANY, wxString::FromUTF8(help.text.data(), help.text.size()),
                     wxDefaultPosition, dialog.FromDIP(wxSize(560, whole ? 460 : 150)),
                     wxTE_MULTILINE | wxTE_READONLY | wxTE_BESTWRAP);
  text->SetName(Label("Help"));
  column->Add(text, wxSizerFlags(1).Expand().Border(wxALL, dialog.FromDIP(10)));
  column->Add(dialog.CreateSeparatedButtonSizer(wxCLOSE),
              wxSizerFlags().Expand().Border(wxALL, dialog.FromDIP(8)));
  dialog.SetSizerAndFit(column);
  dialog.SetEscapeId(wxID_CLOSE);
  dialog.Bind(
      wxEVT_BUTTON, [&dialog](wxCommandEvent&) { dialog.EndModal(wxID_CLOSE); }, wxID_CLOSE);
  text->SetFocus();
  LogEvent("help", help.title);
  dialog.CentreOnParent();
  dialog.ShowModal();
  LogEvent("help", "closed");
}

}  // namespace fotomill::desktop
