#include "desktop/windows/batch/prompt_for_destination.h"

#include <wx/artprov.h>
#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/dialog.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>

#include "desktop/windows/widgets/wx_text.h"
#include "settings/configuration.h"
#include "settings/settings.h"

namespace fotomill::desktop {

bool PromptForDestination(wxWindow& parent, const std::string& question) {
  wxDialog dialog(&parent, wxID_ANY, Label("Destination"), wxDefaultPosition, wxDefaultSize,
                  wxDEFAULT_DIALOG_STYLE, "PromptForDestinationBox");
  const int gap = dialog.FromDIP(12);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticBitmap(&dialog, wxID_ANY,
                              wxArtProvider::GetBitmapBundle(wxART_QUESTION, wxART_MESSAGE_BOX)));
  row->Add(new wxStaticText(&dialog, wxID_ANY, Shown(question)),
           wxSizerFlags(1).CenterVertical().Border(wxLEFT, gap));
  sizer->Add(row, wxSizerFlags().Expand().Border(wxALL, gap));
  auto* again = new wxCheckBox(&dialog, wxID_ANY, Label("&Ask this before every batch"));
  again->SetValue(true);
  again->SetToolTip(Label("Can be re-enabled in Setup."));
  sizer->Add(again, wxSizerFlags().Border(wxLEFT | wxRIGHT, gap));
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  auto* write = new wxButton(&dialog, wxID_OK, Label("&Write"));
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(&dialog, wxID_CANCEL), wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(write);
  sizer->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  write->SetDefault();
  write->SetFocus();
  dialog.SetSizerAndFit(sizer);
  dialog.CentreOnParent();
  if (dialog.ShowModal() != wxID_OK) return false;
  if (!again->GetValue()) {
    SettingValue off;
    if (StoreSetting(KeyOf(KeyNumber::WarnDestinationWrite), off) != SaveResult::Done)
      settings.WarnDestinationWrite = 0;
  }
  return true;
}

}  // namespace fotomill::desktop
