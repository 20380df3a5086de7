#include "desktop/windows/batch/overwrite_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kPaneSide = 240;

}  // namespace

OverwriteDialog::OverwriteDialog(wxWindow* parent, const OverwriteQuestion& question,
                                 OverwritePreviewMaker makePreview)
    : wxDialog(parent, wxID_ANY, Label(kOverwriteTitle.data()), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "OverwriteBox"),
      question_(question),
      makePreview_(std::move(makePreview)) {
  const int gap = FromDIP(8);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  const auto below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap);
  sizer->Add(new wxStaticText(this, wxID_ANY, Label(kOverwriteText.data())), below);
  sizer->Add(new wxStaticText(this, wxID_ANY, Shown(question.path), wxDefaultPosition,
                              wxDefaultSize, wxST_ELLIPSIZE_MIDDLE),
             below);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("&File name:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  name_ = new wxTextCtrl(this, wxID_ANY, Shown(question.name), wxDefaultPosition, wxDefaultSize, 0,
                         wxDefaultValidator, Label("File name"));
  row->Add(name_, wxSizerFlags(1));
  row->Add(new wxStaticText(this, wxID_ANY, Shown(platform::SplitPath(question.path).extension)),
           wxSizerFlags().CenterVertical().Border(wxLEFT, gap / 2));
  sizer->Add(row, below);
  if (!question.problem.empty()) {
    auto* problem = new wxStaticText(this, wxID_ANY, Shown(question.problem));
    problem->SetForegroundColour(FaultColor());
    sizer->Add(problem, below);
  }
  panesPlace_ = sizer->GetItemCount();
  const auto check = [&](std::string_view label, bool value) {
    auto* box = new wxCheckBox(this, wxID_ANY, Shown(Tr(label)));
    box->SetValue(value);
    sizer->Add(box, wxSizerFlags().Border(wxLEFT | wxRIGHT | wxTOP, gap));
    return box;
  };
  keepBoth_ = check(kKeepBothText, question.checks.keepBoth);
  applyToRest_ = check(kApplyToRestText, question.checks.applyToRest);
  recycle_ = check(kRecycleText, question.checks.recycle);
  previews_ = check(kPreviewsText, question.checks.previews);
  notify_ = check(kNotifyText, question.checks.notify);
  auto* note = new wxStaticText(this, wxID_ANY, Label(kNotifyNote.data()));
  note->SetFont(FontOf(*note, TextSize::Small));
  sizer->Add(note, wxSizerFlags().Border(wxLEFT | wxRIGHT, gap * 3));

  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  auto* help = new wxButton(this, wxID_HELP);
  auto* skipAll = new wxButton(this, wxID_ANY, Label("Skip a&ll"));
  skipAll->SetToolTip(Label("Skips this file and all others of this batch whose output exists"));
  auto* ok = new wxButton(this, wxID_OK);
  buttons->Add(help);
  buttons->AddStretchSpacer();
  buttons->Add(skipAll, wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(new wxButton(this, wxID_CANCEL), wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(ok);
  sizer->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  ok->SetDefault();
  SetSizer(sizer);
  if (question.checks.previews) {
    preview_ = makePreview_();
    AddPanes();
  }
  Fit();
  SetMinSize(GetSize());
  CentreOnParent();
  name_->SetFocus();
  name_->SelectAll();
  help->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ShowHelp(*this, kOverwriteHelpPage); });
  skipAll->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    skipRest_ = true;
    EndModal(wxID_CANCEL);
  });
  previews_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { ShowPreviews(); });
}

// Creates the previews in the background when first enabled.
void OverwriteDialog::ShowPreviews() {
  if (panes_ == nullptr && previews_->GetValue())
    return work_.Start(
        *this, [this](const StopToken&) { preview_ = makePreview_(); },
        [this](Status) {
          AddPanes();
          ShowPreviews();
        });
  if (panes_ == nullptr) return work_.Stop();
  GetSizer()->Show(panes_, previews_->GetValue());
  SetMinSize(wxDefaultSize);
  Fit();
  LogEvent("overwrite", previews_->GetValue() ? "previews" : "no-previews");
}

void OverwriteDialog::AddPanes() {
  panes_ = MakePanes(preview_);
  GetSizer()->Insert(panesPlace_, panes_, wxSizerFlags(1).Expand().Border(wxALL, FromDIP(8)));
}

wxSizer* OverwriteDialog::MakePanes(const OverwritePreview& preview) {
  auto* panes = new wxBoxSizer(wxHORIZONTAL);
  const auto pane = [&](const wxString& title, const RgbImage& image, const std::string& text) {
    auto* column = new wxBoxSizer(wxVERTICAL);
    auto* head = new wxStaticText(this, wxID_ANY, title);
    head->SetFont(head->GetFont().Bold());
    column->Add(head, wxSizerFlags().CenterHorizontal());
    const wxSize side = FromDIP(wxSize(kPaneSide, kPaneSide * 5 / 6));
    if (image.Empty()) {
      column->Add(side.x, side.y);
    } else {
      auto* picture =
          new wxStaticBitmap(this, wxID_ANY, BitmapOf(image), wxDefaultPosition, side, 0, title);
      column->Add(picture, wxSizerFlags(1).Expand().Border(wxTOP | wxBOTTOM, FromDIP(4)));
    }
    for (size_t from = 0; from < text.size();) {
      const size_t end = std::min(text.find('\n', from), text.size());
      column->Add(new wxStaticText(this, wxID_ANY, Shown(text.substr(from, end - from))),
                  wxSizerFlags().CenterHorizontal());
      from = end + 1;
    }
    panes->Add(column, wxSizerFlags(1).Expand().Border(wxALL, FromDIP(4)));
  };
  pane(Label("Existing file"), preview.existing, preview.existingText);
  pane(Label("New, from %1", Shown(platform::FileNameOf(question_.source))), preview.incoming,
       preview.incomingText);
  return panes;
}

OverwriteAnswer OverwriteDialog::Answer() const {
  OverwriteAnswer answer;
  answer.ok = GetReturnCode() == wxID_OK;
  answer.skipRest = skipRest_;
  answer.name = Utf8(name_->GetValue());
  answer.checks = {notify_->GetValue(), keepBoth_->GetValue(), applyToRest_->GetValue(),
                   recycle_->GetValue(), previews_->GetValue()};
  return answer;
}

}  // namespace fotomill::desktop
