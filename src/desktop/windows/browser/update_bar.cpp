#include "desktop/windows/browser/update_bar.h"

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <iterator>

#include "catalog/thumbnails/thumbnail_update.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

UpdateBar::UpdateBar(wxWindow* parent, std::function<void(int32_t choice)> answered)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "UpdateThumbnailsBox"),
      answered_(std::move(answered)) {
  SetBackgroundColour(BarColor());
  Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    SetBackgroundColour(BarColor());
    event.Skip();
  });
  const int gap = FromDIP(6);
  text_ =
      new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxST_ELLIPSIZE_END);
  choices_ = new wxChoice(this, wxID_ANY);
  choices_->SetName(kThumbnailUpdateRequest);
  choices_->SetToolTip(kThumbnailUpdateRequest);
  for (const ThumbnailUpdateChoice& choice : kThumbnailUpdateChoices) {
    choices_->Append(wxControl::RemoveMnemonics(Label(choice.text)));
  }
  auto* ok = new wxButton(this, wxID_OK);
  ok_ = ok;
  auto* close = new wxButton(this, wxID_CLOSE, wxString::FromUTF8("\xC3\x97"), wxDefaultPosition,
                             FromDIP(wxSize(32, -1)), wxBORDER_NONE);
  close->SetName(Label("Close"));  // the symbol would be read as "times"
  close->SetToolTip(Label("Close"));
  auto* question = new wxBoxSizer(wxHORIZONTAL);
  question->Add(text_, wxSizerFlags(1).CenterVertical());
  question->Add(close, wxSizerFlags().CenterVertical());
  auto* answer = new wxBoxSizer(wxHORIZONTAL);
  answer->Add(choices_, wxSizerFlags(1));
  answer->Add(ok_, wxSizerFlags().Border(wxLEFT, gap));
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  sizer->Add(question, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  sizer->Add(answer, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizer(sizer);
  ok->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    answered_(kThumbnailUpdateChoices[static_cast<size_t>(choices_->GetSelection())].value);
  });
  close->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { answered_(0); });
}

void UpdateBar::Ask(int32_t count, int32_t selected) {
  const wxString question = Shown(ThumbnailUpdateQuestion(count));
  text_->SetLabel(question);
  text_->SetToolTip(question);
  for (size_t i = 0; i < std::size(kThumbnailUpdateChoices); ++i) {
    if (kThumbnailUpdateChoices[i].value == selected) choices_->SetSelection(static_cast<int>(i));
  }
  choices_->Show();
  ok_->Show();
  GetParent()->Layout();
}

void UpdateBar::Report(const wxString& text) {
  text_->SetLabel(text);
  choices_->Hide();
  ok_->Hide();
  GetParent()->Layout();
}

}  // namespace fotomill::desktop
