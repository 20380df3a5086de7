#include "desktop/windows/browser/browser_bar.h"

#include <wx/button.h>
#include <wx/menu.h>
#include <wx/sizer.h>
#include <wx/slider.h>
#include <wx/srchctrl.h>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/thumbnail_side.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/path_bar.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// With an arrow, as it opens a menu.
wxString TagFilterLabel(TagFilter filter) {
  return wxControl::EscapeMnemonics(Shown(TagFilterName(filter) + "  \xE2\x96\xBE"));
}

}  // namespace

BrowserBar::BrowserBar(wxWindow* parent, BrowserModel& model, const FolderTrail& trail,
                       Events events)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "BrowserBar"),
      model_(model),
      events_(std::move(events)) {
  path_ = new PathBar(this, trail, {events_.step, events_.up, events_.open, [this] { Leave(); }});
  BuildTagFilter();
  BuildFilter();
  BuildSlider();
  const auto flags = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(4));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(path_, wxSizerFlags(1).CenterVertical());
  row->Add(tagFilter_, flags);
  row->Add(filter_, flags);
  row->Add(slider_, flags);
  SetSizer(row);
}

void BrowserBar::BuildTagFilter() {
  tagFilter_ = new wxButton(this, wxID_ANY, TagFilterLabel(TagFilter::All));
  tagFilter_->SetToolTip(Label("Shows only files with this rating or color label"));
  tagFilter_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ChooseTagFilter(); });
  tagFilter_->Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    events_.left();
  });
}

void BrowserBar::BuildFilter() {
  filter_ = new wxSearchCtrl(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(200, -1)),
                             wxTE_PROCESS_ENTER, wxDefaultValidator, Label("Filter"));
  filter_->SetDescriptiveText(Label("Filter"));
  filter_->ShowCancelButton(true);
  filter_->SetToolTip(
      Label("Shows only files whose names contain this text or match this pattern (*, ?)"));
  filter_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) {
    model_.SetFilter(Utf8(filter_->GetValue()));
    events_.filtered();
  });
  filter_->Bind(wxEVT_SEARCHCTRL_CANCEL_BTN, [this](wxCommandEvent&) { filter_->Clear(); });
  filter_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { events_.left(); });
  filter_->Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    Leave();
  });
}

void BrowserBar::BuildSlider() {
  slider_ =
      new wxSlider(this, wxID_ANY, 0, 0, kSliderEnd, wxDefaultPosition, FromDIP(wxSize(110, -1)),
                   wxSL_HORIZONTAL, wxDefaultValidator, Label("Thumbnail size"));
  slider_->SetToolTip(Label("Thumbnail size (Ctrl+wheel)"));
  slider_->Bind(wxEVT_SLIDER, [this](wxCommandEvent&) {
    events_.resize(SideAtSlider(slider_->GetValue()));
  });
}

void BrowserBar::ShowFolder(const std::string& folder) {
  filter_->ChangeValue("");
  path_->ShowFolder(folder);
}

void BrowserBar::ShowSide() {
  slider_->SetValue(SliderAtSide(SideInView(model_.Modes().view, settings.ThumbnailSide)));
}

void BrowserBar::EditPath() { path_->Edit(); }
void BrowserBar::OfferTrail() { path_->OfferTrail(); }
void BrowserBar::EditFilter() { filter_->SetFocus(); }

void BrowserBar::ChooseTagFilter() {
  constexpr int kFirstId = 1;
  wxMenu menu;
  for (int i = 0; i <= static_cast<int>(TagFilter::LastLabel); ++i) {
    const auto filter = static_cast<TagFilter>(i);
    if (filter == TagFilter::OneStar || filter == TagFilter::Unrated ||
        filter == TagFilter::FirstLabel)
      menu.AppendSeparator();
    menu.AppendCheckItem(kFirstId + i, Shown(TagFilterName(filter)))
        ->Check(filter == model_.TagsShown());
  }
  LogEvent("tag-menu", std::to_string(menu.GetMenuItemCount()));
  const int chosen =
      tagFilter_->GetPopupMenuSelectionFromUser(menu, 0, tagFilter_->GetSize().y) - kFirstId;
  if (chosen >= 0 && chosen <= static_cast<int>(TagFilter::LastLabel)) {
    model_.SetTagFilter(static_cast<TagFilter>(chosen));
    tagFilter_->SetLabel(TagFilterLabel(model_.TagsShown()));
    Layout();
    events_.filtered();
    LogEvent("tag-filter",
             std::to_string(chosen) + " lines=" + std::to_string(model_.LineCount()));
  }
  events_.left();
}

// With Escape.
void BrowserBar::Leave() {
  if (!filter_->IsEmpty()) filter_->Clear();
  events_.left();
}

}  // namespace fotomill::desktop
