#include "desktop/windows/batch/name_dialog.h"

#include <wx/button.h>
#include <wx/filedlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "desktop/models/batch/name_field.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

NameDialog::NameDialog(wxWindow* parent, const NameQuestion& question)
    : wxDialog(parent, wxID_ANY,
               question.title.empty() ? Label("Destination name") : Shown(Tr(question.title)),
               wxDefaultPosition, wxDefaultSize, wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER,
               "DestinationNameBox"),
      question_(question),
      folder_(platform::FolderOf(question.path)) {
  const int gap = FromDIP(8);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  const auto below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap);
  sizer->Add(new wxStaticText(this, wxID_ANY,
                              Label("Write %1 to:", Shown(platform::FileNameOf(question.source)))),
             below);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  name_ = new wxTextCtrl(this, wxID_ANY, wxString::FromUTF8(NameInField(question.path, folder_)),
                         wxDefaultPosition, wxSize(TextWidth(*this, 300), -1), 0,
                         wxDefaultValidator, Label("File name"));
  row->Add(name_, wxSizerFlags(1));
  row->Add(new wxStaticText(this, wxID_ANY, Shown("." + question.extension)),
           wxSizerFlags().CenterVertical().Border(wxLEFT, gap / 2));
  auto* browse = new wxButton(this, wxID_ANY, Label("B&rowse..."));
  row->Add(browse, wxSizerFlags().Border(wxLEFT, gap));
  sizer->Add(row, below);
  sizer->Add(new wxStaticText(this, wxID_ANY, Label("Folder: %1", Shown(folder_)),
                              wxDefaultPosition, wxDefaultSize, wxST_ELLIPSIZE_MIDDLE),
             below);
  if (!question.problem.empty()) {
    auto* problem = new wxStaticText(this, wxID_ANY, Shown(question.problem));
    problem->SetForegroundColour(FaultColor());
    sizer->Add(problem, below);
  }
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  auto* abort = new wxButton(this, wxID_ABORT, Label("&Abort batch"));
  auto* skipAll = new wxButton(this, wxID_ANY, Label("Skip a&ll"));
  skipAll->SetToolTip(Label("Skips this file and all others of this batch"));
  auto* ok = new wxButton(this, wxID_OK);
  buttons->Add(abort);
  buttons->AddStretchSpacer();
  buttons->Add(skipAll, wxSizerFlags().Border(wxLEFT | wxRIGHT, gap));
  buttons->Add(new wxButton(this, wxID_CANCEL, Label("&Skip")),
               wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(ok);
  sizer->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  ok->SetDefault();
  SetSizerAndFit(sizer);
  CentreOnParent();
  name_->SetFocus();
  name_->SelectAll();
  browse->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
  abort->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { aborts_ = true, EndModal(wxID_CANCEL); });
  skipAll->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { skipRest_ = true, EndModal(wxID_CANCEL); });
}

void NameDialog::Browse() {
  const wxString dotted = "." + wxString::FromUTF8(question_.extension);
  const std::string base(platform::SplitPath(question_.path).base);
  wxFileDialog dialog(this, GetTitle(), wxString::FromUTF8(folder_),
                      wxString::FromUTF8(base) + dotted, "*" + dotted + "|*" + dotted, wxFD_SAVE);
  if (dialog.ShowModal() != wxID_OK) return;
  const std::string path = PathOfField(Utf8(dialog.GetPath()), question_.extension, question_.path);
  name_->SetValue(wxString::FromUTF8(NameInField(path, folder_)));
}

NameAnswer NameDialog::Answer() const {
  return {.ok = GetReturnCode() == wxID_OK,
          .name = PathOfField(Utf8(name_->GetValue()), question_.extension, question_.path),
          .skipRest = skipRest_};
}

}  // namespace fotomill::desktop
