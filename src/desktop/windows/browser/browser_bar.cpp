#include "desktop/windows/browser/browser_bar.h"

#include <wx/bmpbuttn.h>
#include <wx/button.h>
#include <wx/menu.h>
#include <wx/sizer.h>
#include <wx/slider.h>
#include <wx/srchctrl.h>

#include <algorithm>
#include <span>
#include <utility>

#include "core/choice_lists.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/thumbnail_side.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/path_bar.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// With an arrow, as it opens a menu.
wxString MenuLabel(const std::string& text) {
  return wxControl::EscapeMnemonics(Shown(text + "  \xE2\x96\xBE"));
}
wxString TagFilterLabel(TagFilter filter) { return MenuLabel(TagFilterName(filter)); }

// The orders in which files can be listed, with their names in English.
std::span<const ChoiceEntry> Orders() {
  return {kSortModeChoices, static_cast<size_t>(choice::kSortDimensions) + 1};
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
  BuildOrder();
  BuildSlider();
  const auto flags = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(4));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(path_, wxSizerFlags(1).CenterVertical());
  row->Add(tagFilter_, flags);
  row->Add(filter_, flags);
  row->Add(order_, wxSizerFlags().CenterVertical());
  row->Add(direction_, wxSizerFlags().CenterVertical().Border(wxLEFT | wxRIGHT, FromDIP(6)));
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
  filter_ = new wxSearchCtrl(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(150, -1)),
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

void BrowserBar::BuildOrder() {
  // wide enough for every label
  order_ = new wxButton(this, wxID_ANY, "");
  int width = 0;
  for (const ChoiceEntry& order : Orders()) {
    order_->SetLabel(MenuLabel(Tr(order.text)));
    width = std::max(width, order_->GetBestSize().x);
  }
  order_->SetMinSize(wxSize(width, -1));
  order_->SetToolTip(Label("Order of the files"));
  order_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ChooseOrder(); });
  direction_ = new wxBitmapButton(this, wxID_ANY, Symbol("ascending"), wxDefaultPosition,
                                  wxDefaultSize, wxBORDER_NONE, wxDefaultValidator,
                                  Label("Reverse order"));
  direction_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    events_.sort(model_.Modes().sort, !model_.Descending());
  });
  direction_->Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    ShowDirection();
    event.Skip();
  });
  ShowDirection();
  const auto leave = [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    events_.left();
  };
  order_->Bind(wxEVT_CHAR_HOOK, leave);
  direction_->Bind(wxEVT_CHAR_HOOK, leave);
}

void BrowserBar::ChooseOrder() {
  constexpr int kFirstId = 1;
  wxMenu menu;
  int id = kFirstId;
  for (const ChoiceEntry& order : Orders()) {
    wxMenuItem* const item = menu.AppendRadioItem(id++, Label(order.text));
    if (order.value == model_.Modes().sort) item->Check();
  }
  LogEvent("order-menu", std::to_string(menu.GetMenuItemCount()));
  const int chosen =
      order_->GetPopupMenuSelectionFromUser(menu, 0, order_->GetSize().y) - kFirstId;
  if (chosen >= 0) events_.sort(Orders()[static_cast<size_t>(chosen)].value, model_.Descending());
  events_.left();
}

void BrowserBar::ShowDirection() {
  direction_->SetBitmap(Symbol(descending_ ? "descending" : "ascending"));
  direction_->SetToolTip(descending_ ? Label("Descending order; click for ascending")
                                     : Label("Ascending order; click for descending"));
}

void BrowserBar::BuildSlider() {
  slider_ =
      new wxSlider(this, wxID_ANY, 0, 0, kSliderEnd, wxDefaultPosition, FromDIP(wxSize(100, -1)),
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

void BrowserBar::ShowView() {
  for (const ChoiceEntry& order : Orders()) {
    if (order.value == model_.Modes().sort) order_->SetLabel(MenuLabel(Tr(order.text)));
  }
  const bool before = std::exchange(descending_, model_.Descending());
  if (before != descending_) ShowDirection();
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
