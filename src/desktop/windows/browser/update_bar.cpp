#include "desktop/windows/browser/update_bar.h"

#include <wx/button.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <algorithm>
#include <iterator>

#include "catalog/thumbnails/thumbnail_update.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "texts/grouped_count.h"

namespace fotomill::desktop {

namespace {

struct Answer {
  int32_t value;  // of kThumbnailUpdateChoices, whose text is the tip
  const char* label;
};
constexpr Answer kAnswers[] = {
    {kUpdateCreate, TrLater("&Keep")},
    {kUpdateNotHere, TrLater("N&ot here")},
    {kUpdateNever, TrLater("Ne&ver")},
};

wxString TextOfChoice(int32_t value) {
  const ThumbnailUpdateChoice* const choice =
      std::ranges::find(kThumbnailUpdateChoices, value, &ThumbnailUpdateChoice::value);
  return wxControl::RemoveMnemonics(Label(choice->text));
}

}  // namespace

UpdateBar::UpdateBar(wxWindow* parent, std::function<void(int32_t choice)> answered)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "UpdateThumbnailsBox"),
      answered_(std::move(answered)) {
  SetBackgroundColour(BarColor());
  Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    SetBackgroundColour(BarColor());
    event.Skip();
  });
  const int gap = FromDIP(4);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  text_ =
      new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxST_ELLIPSIZE_END);
  row->Add(text_, wxSizerFlags(1).CenterVertical().Border(wxLEFT, FromDIP(8)));
  for (const Answer& answer : kAnswers) {
    auto* button = new wxButton(this, wxID_ANY, Label(answer.label));
    button->SetToolTip(TextOfChoice(answer.value));
    button->Bind(wxEVT_BUTTON,
                 [this, value = answer.value](wxCommandEvent&) { answered_(value); });
    row->Add(button, wxSizerFlags().CenterVertical().Border(wxLEFT, gap));
    answers_.push_back(button);
  }
  auto* close = new wxButton(this, wxID_CLOSE, wxString::FromUTF8("\xC3\x97"), wxDefaultPosition,
                             FromDIP(wxSize(32, -1)), wxBORDER_NONE);
  close->SetName(Label("Close"));  // the symbol would be read as "times"
  close->SetToolTip(Label("Close"));
  close->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { answered_(0); });
  row->Add(close, wxSizerFlags().CenterVertical().Border(wxLEFT, gap));
  auto* margins = new wxBoxSizer(wxVERTICAL);
  margins->Add(row, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizer(margins);
}

void UpdateBar::Ask(int32_t count, int32_t selected) {
  text_->SetLabel(Shown(TrGroupedCount("Keep the thumbnail of %1 picture in a file beside it?",
                                       "Keep the thumbnails of %1 pictures in files beside them?",
                                       static_cast<uint64_t>(count))));
  text_->SetToolTip(Shown(ThumbnailUpdateQuestion(count)));
  for (size_t i = 0; i < answers_.size(); ++i) {
    answers_[i]->Show();
    if (kAnswers[i].value == selected) answers_[i]->SetDefault();
  }
  GetParent()->Layout();
}

void UpdateBar::Report(const wxString& text) {
  text_->SetLabel(text);
  text_->UnsetToolTip();
  for (wxButton* const button : answers_) button->Hide();
  GetParent()->Layout();
}

}  // namespace fotomill::desktop
