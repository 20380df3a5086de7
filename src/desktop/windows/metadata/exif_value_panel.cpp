#include "desktop/windows/metadata/exif_value_panel.h"

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>

#include "core/text.h"
#include "desktop/windows/metadata/day_dialog.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/edit/exif_input.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kWidth = 300;  // of the panel, device-independent

}  // namespace

ExifValuePanel::ExifValuePanel(wxWindow* parent, Events events)
    : wxPanel(parent), events_(std::move(events)) {
  const int gap = FromDIP(6);
  auto* column = new wxBoxSizer(wxVERTICAL);
  SetSizer(column);
  name_ = new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                           wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_END);
  name_->SetFont(name_->GetFont().Bold());
  column->Add(name_, wxSizerFlags().Expand().Border(wxBOTTOM, gap));
  BuildValue();
  BuildFlash();
  note_ = new wxStaticText(this, wxID_ANY, "");
  column->Add(note_, wxSizerFlags().Expand().Border(wxBOTTOM, gap));
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  remove_ = new wxButton(this, wxID_ANY, Label("Re&move"));
  remove_->SetToolTip(Label("Removes this tag from the files."));
  revert_ = new wxButton(this, wxID_ANY, Label("&Revert"));
  revert_->SetToolTip(Label("Keeps the value in the files."));
  remove_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.removed(); });
  revert_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.reverted(); });
  buttons->Add(remove_, wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(revert_);
  column->Add(buttons);
  SetMinSize(wxSize(TextWidth(*this, kWidth), -1));
  ShowNothing();
}

void ExifValuePanel::BuildValue() {
  const int gap = FromDIP(6);
  const auto addLabel = [&] {
    auto* label = new wxStaticText(this, wxID_ANY, Label("&Value:"));
    GetSizer()->Add(label, wxSizerFlags().Border(wxBOTTOM, gap / 2));
    return label;
  };
  textLabel_ = addLabel();
  textRow_ = new wxBoxSizer(wxHORIZONTAL);
  text_ = new wxTextCtrl(this, wxID_ANY);
  text_->SetName(Label("Value"));
  calendar_ = new wxButton(this, wxID_ANY, Label("&Calendar..."));
  textRow_->Add(text_, wxSizerFlags(1).CenterVertical());
  textRow_->Add(calendar_, wxSizerFlags().Border(wxLEFT, gap));
  GetSizer()->Add(textRow_, wxSizerFlags().Expand().Border(wxBOTTOM, gap));
  wordsLabel_ = addLabel();
  words_ = new wxChoice(this, wxID_ANY);
  words_->SetName(Label("Value"));
  GetSizer()->Add(words_, wxSizerFlags().Expand().Border(wxBOTTOM, gap));
  text_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { events_.entered(Utf8(text_->GetValue())); });
  calendar_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { PickDate(); });
  words_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) {
    events_.entered(std::string(ExifInputWords(tag_)[static_cast<size_t>(words_->GetSelection())]));
  });
}

void ExifValuePanel::BuildFlash() {
  auto* grid = new wxFlexGridSizer(2, FromDIP(4), FromDIP(6));
  grid->AddGrowableCol(1);
  for (const FlashPart& part : FlashParts()) {
    grid->Add(new wxStaticText(this, wxID_ANY, Label(part.name) + ":"),
              wxSizerFlags().CenterVertical());
    auto* choice = new wxChoice(this, wxID_ANY);
    choice->SetName(Label(part.name));
    const std::string words = Tr(part.words);
    for (int value = 0; value <= part.mask; ++value) choice->Append(Shown(ListItem(words, value)));
    choice->SetMinSize(FromDIP(wxSize(120, -1)));
    choice->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { EnterFlash(); });
    grid->Add(choice, wxSizerFlags().Expand());
    flash_.push_back(choice);
  }
  flashRows_ = grid;
  GetSizer()->Add(grid, wxSizerFlags().Expand().Border(wxBOTTOM, FromDIP(6)));
}

void ExifValuePanel::ShowNothing() {
  ShowRow({}, 0);
  name_->SetLabel("");
  SetNote(Label("Choose a value in the list."));
}

void ExifValuePanel::ShowRow(const ExifEditRow& row, size_t files) {
  tag_ = row.tag;
  control_ = row.name.empty() ? ExifControl::None : ControlOf(row.tag);
  name_->SetLabel(Shown(row.name));
  const auto show = [this](wxSizer* sizer, bool shown) { GetSizer()->Show(sizer, shown, true); };
  const bool words = control_ == ExifControl::Words;
  const bool text = control_ == ExifControl::Text || control_ == ExifControl::Date;
  show(textRow_, text);
  textLabel_->Show(text);
  calendar_->Show(control_ == ExifControl::Date);
  words_->Show(words);
  wordsLabel_->Show(words);
  show(flashRows_, control_ == ExifControl::Flash);
  const bool differs = !row.mixed && row.files > 0 && row.files < files && !row.changed;
  text_->SetHint(row.mixed ? Label("(different values)")
                 : differs ? Label("(only in some files)")
                           : wxString());
  ShowControl(row);
  UpdateControls(row, {});
}

void ExifValuePanel::UpdateControls(const ExifEditRow& row, const std::string& problem) {
  remove_->Enable(row.removable && !row.removed);
  revert_->Enable(row.changed || !problem.empty());
  note_->SetForegroundColour(problem.empty() ? wxNullColour : FaultColor());
  if (!problem.empty()) return SetNote(Shown(problem));
  if (control_ != ExifControl::None) return SetNote(Shown(ExifInputHint(tag_)));
  SetNote(Label("This value describes the structure of the file and cannot be changed."));
}

void ExifValuePanel::ShowControl(const ExifEditRow& row) {
  const wxString text = wxString::FromUTF8(row.text);
  if (text_->GetValue() != text) text_->ChangeValue(text);
  if (control_ == ExifControl::Words) {
    wxArrayString items;
    for (const std::string_view word : ExifInputWords(row.tag)) items.Add(Shown(word));
    if (words_->GetStrings() != items) words_->Set(items);
    words_->SetStringSelection(text);
    if (words_->GetStringSelection() != text) words_->SetSelection(wxNOT_FOUND);
  }
  if (control_ != ExifControl::Flash) return;
  const uint32_t bits = FlashNumber(row.text);
  for (size_t i = 0; i < flash_.size(); ++i) {
    const FlashPart& part = FlashParts()[i];
    flash_[i]->SetSelection(row.text.empty() ? wxNOT_FOUND
                                             : static_cast<int>(bits >> part.shift) & part.mask);
  }
}

void ExifValuePanel::SetNote(const wxString& text) {
  note_->SetLabelText(text);
  note_->Wrap(std::max(GetClientSize().x, TextWidth(*this, kWidth)));
  GetParent()->Layout();
  Layout();
}

void ExifValuePanel::FocusValue() {
  wxWindow* const controls[] = {text_, words_, flash_.front()};
  for (wxWindow* control : controls) {
    if (control->IsShown()) return control->SetFocus();
  }
}

void ExifValuePanel::PickDate() {
  const auto time = ParseExifTime(Utf8(text_->GetValue()));
  std::string text = time ? ExifTimeText(*time) : std::string();
  std::string day = text.substr(0, 10);
  std::ranges::replace(day, ':', '-');
  const auto chosen = AskForDay(*this, day);
  if (!chosen) return;
  text = *chosen + (time ? text.substr(10) : " 00:00:00");
  std::ranges::replace(text.begin(), text.begin() + 10, '-', ':');
  text_->SetValue(wxString::FromUTF8(text));
}

void ExifValuePanel::EnterFlash() {
  uint32_t bits = 0;
  for (size_t i = 0; i < flash_.size(); ++i) {
    const int value = std::max(flash_[i]->GetSelection(), 0);
    bits |= static_cast<uint32_t>(value) << FlashParts()[i].shift;
  }
  events_.entered(std::to_string(bits));
}

}  // namespace fotomill::desktop
