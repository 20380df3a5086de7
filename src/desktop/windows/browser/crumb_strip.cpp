#include "desktop/windows/browser/crumb_strip.h"

#include <wx/bmpbuttn.h>
#include <wx/control.h>
#include <wx/dcmemory.h>

#include <algorithm>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/windows/browser/folder_menu.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

constexpr int kWidestName = 220;  // device-independent pixels

wxString CutName(const wxString& name, const wxWindow& window) {
  wxMemoryDC dc;
  dc.SetFont(window.GetFont());
  return wxControl::Ellipsize(name, dc, wxELLIPSIZE_MIDDLE, window.FromDIP(kWidestName),
                              wxELLIPSIZE_FLAGS_NONE);
}

}  // namespace

CrumbStrip::CrumbStrip(wxWindow* parent, Events events)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "Folders on the way"),
      events_(std::move(events)) {
  more_ =
      new wxButton(this, wxID_ANY, wxString::FromUTF8("\u2026"), wxDefaultPosition, wxDefaultSize,
                   wxBU_EXACTFIT | wxBORDER_NONE, wxDefaultValidator, Label("Parent folders"));
  more_->SetToolTip(Label("Parent folders"));
  more_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { OfferHidden(); });
  SetMinSize(wxSize(FromDIP(60), more_->GetBestSize().y));
  Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    LayOut();
    event.Skip();
  });
  Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent&) { events_.edit(); });
}

void CrumbStrip::ShowFolder(const std::string& folder) {
  listing_.Stop();
  for (const Place& place : places_) {
    place.button->Destroy();
    place.below->Destroy();
  }
  places_.clear();
  for (Crumb& crumb : CrumbsOf(folder)) places_.push_back({std::move(crumb)});
  Build();
  LayOut();
}

void CrumbStrip::Build() {
  for (size_t i = 0; i < places_.size(); ++i) {
    Place& place = places_[i];
    const wxString name = Shown(place.crumb.label);
    place.button = new wxButton(this, wxID_ANY, wxControl::EscapeMnemonics(CutName(name, *this)),
                                wxDefaultPosition, wxDefaultSize, wxBU_EXACTFIT | wxBORDER_NONE,
                                wxDefaultValidator, name);
    if (i + 1 == places_.size()) place.button->SetFont(place.button->GetFont().Bold());
    place.button->SetToolTip(Shown(place.crumb.folder));
    place.button->Bind(wxEVT_BUTTON,
                       [this, folder = place.crumb.folder](wxCommandEvent&) { OpenLater(folder); });
    const wxString tip = Label("Folders in %1", name);
    place.below =
        new wxBitmapButton(this, wxID_ANY, Symbol("below", 10), wxDefaultPosition, wxDefaultSize,
                           wxBU_EXACTFIT | wxBORDER_NONE, wxDefaultValidator, tip);
    place.below->SetToolTip(tip);
    place.below->Bind(wxEVT_BUTTON, [this, i](wxCommandEvent&) { ListBelow(i); });
  }
}

void CrumbStrip::LayOut() {
  std::vector<int> widths;
  for (const Place& place : places_)
    widths.push_back(place.button->GetBestSize().x + place.below->GetBestSize().x);
  const int height = GetClientSize().y;
  const wxSize more = more_->GetBestSize();
  firstShown_ = FirstCrumbShown(widths, GetClientSize().x, more.x);
  more_->Show(firstShown_ > 0);
  more_->SetSize(0, 0, more.x, height);
  int x = firstShown_ > 0 ? more.x : 0;
  for (size_t i = 0; i < places_.size(); ++i) {
    const Place& place = places_[i];
    place.button->Show(i >= firstShown_);
    place.below->Show(i >= firstShown_);
    if (i < firstShown_) continue;
    const int below = place.below->GetBestSize().x;
    // The last name may be wider than the strip.
    const int width = std::min(widths[i] - below, std::max(GetClientSize().x - x - below, 1));
    place.button->SetSize(x, 0, width, height);
    place.below->SetSize(x + width, 0, below, height);
    x += width + below;
  }
}

void CrumbStrip::ListBelow(size_t place) {
  listing_.Start([this, place, folder = places_[place].crumb.folder](
                     const StopToken&, const LooseWork::Report& report) {
    report([this, place, names = SubfolderNames(folder)] { OfferBelow(place, names); });
  });
}

void CrumbStrip::OfferBelow(size_t place, const std::vector<std::string>& names) {
  std::vector<Crumb> below;
  for (const std::string& name : names)
    below.push_back({name, platform::JoinFolder(places_[place].crumb.folder, name)});
  const std::string current =
      place + 1 < places_.size() ? places_[place + 1].crumb.folder : std::string();
  const auto chosen = ChooseFolderFromMenu(*places_[place].below, below, current);
  if (chosen) OpenLater(below[*chosen].folder);
}

void CrumbStrip::OfferHidden() {
  std::vector<Crumb> hidden;
  for (size_t i = firstShown_; i > 0; --i) hidden.push_back(places_[i - 1].crumb);
  const auto chosen = ChooseFolderFromMenu(*more_, hidden, {});
  if (chosen) OpenLater(hidden[*chosen].folder);
}

// Opening a folder deletes the buttons, so wait until their event handler has returned.
void CrumbStrip::OpenLater(const std::string& folder) {
  CallAfter([this, folder] { events_.open(folder); });
}

}  // namespace fotomill::desktop
