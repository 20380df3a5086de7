#include "desktop/windows/metadata/place_dialog.h"

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/dialog.h>
#include <wx/filepicker.h>
#include <wx/hyperlink.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <memory>

#include "desktop/models/metadata/exif_editor.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/gps.h"
#include "platform/file_view.h"
#include "settings/exif_settings.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// The default location, then the places of the list.
std::vector<ListedPlace> OfferedPlaces() {
  std::string list;
  std::vector<ListedPlace> places;
  if (ReadLocations(list).empty()) places = ListedPlaces(list);
  GpsLocation home;
  if (GpsLocationFromSettings(home)) {
    const GpsPlace place{.latitude = GpsDegrees(home.latitude),
                         .longitude = GpsDegrees(home.longitude)};
    places.insert(places.begin(), {Tr("Default location"), place});
  }
  return places;
}

class PlaceDialog : public wxDialog {
 public:
  PlaceDialog(wxWindow* parent, ExifEditor& editor);
  void Apply();

 private:
  wxRadioButton* AddWay(const wxString& label, wxWindow* control, bool first = false);
  void BuildWays();
  void ReadTrack();
  void UpdateControls();
  std::optional<GpsPlace> ChosenPlace() const;
  std::optional<int64_t> Offset() const;  // from a valid field
  bool OffsetIsValid() const;
  wxString TrackText() const;

  ExifEditor& editor_;
  const std::vector<ListedPlace> places_ = OfferedPlaces();
  std::shared_ptr<const GpsTrack> track_;
  wxString trackProblem_;
  wxFlexGridSizer* grid_ = nullptr;
  wxRadioButton* listed_ = nullptr;
  wxRadioButton* typed_ = nullptr;
  wxRadioButton* tracked_ = nullptr;
  wxRadioButton* removed_ = nullptr;
  wxChoice* list_ = nullptr;
  wxTextCtrl* field_ = nullptr;
  wxFilePickerCtrl* file_ = nullptr;
  wxTextCtrl* offset_ = nullptr;
  wxStaticText* note_ = nullptr;
  wxHyperlinkCtrl* map_ = nullptr;
  wxButton* ok_ = nullptr;
  LooseWork work_;
};

PlaceDialog::PlaceDialog(wxWindow* parent, ExifEditor& editor)
    : wxDialog(parent, wxID_ANY, Label("Place"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "PlaceBox"),
      editor_(editor) {
  const int gap = FromDIP(10);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  grid_ = new wxFlexGridSizer(2, FromDIP(8), gap);
  grid_->AddGrowableCol(1);
  BuildWays();
  sizer->Add(grid_, wxSizerFlags().Expand().Border(wxALL, gap));
  note_ =
      new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxST_NO_AUTORESIZE);
  map_ = new wxHyperlinkCtrl(this, wxID_ANY, Label("Show on OpenStreetMap"), "https://");
  sizer->Add(note_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, gap));
  sizer->Add(map_, wxSizerFlags().Border(wxLEFT | wxRIGHT | wxTOP, gap).ReserveSpaceEvenIfHidden());
  ok_ = new wxButton(this, wxID_OK, Label("&Set place"));
  sizer->Add(BuildAnswerRow(*this, *ok_), wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizerAndFit(sizer);
  CentreOnParent();
  bool mixed = false;
  if (const auto place = editor.Place(mixed)) {
    field_->ChangeValue(wxString::FromUTF8(GpsDegreesText(place->latitude) + "," +
                                           GpsDegreesText(place->longitude)));
  }
  (places_.empty() ? typed_ : listed_)->SetValue(true);
  UpdateControls();
  // A list takes the focus only when it is visible.
  CallAfter([this] { (places_.empty() ? static_cast<wxWindow*>(field_) : list_)->SetFocus(); });
}

wxRadioButton* PlaceDialog::AddWay(const wxString& label, wxWindow* control, bool first) {
  auto* way = new wxRadioButton(this, wxID_ANY, label, wxDefaultPosition, wxDefaultSize,
                                first ? wxRB_GROUP : 0);
  way->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  grid_->Add(way, wxSizerFlags().CenterVertical());
  if (control != nullptr) {
    control->MoveAfterInTabOrder(way);
    grid_->Add(control, wxSizerFlags().Expand());
  } else {
    grid_->AddSpacer(0);
  }
  return way;
}

void PlaceDialog::BuildWays() {
  const auto update = [this](wxCommandEvent&) { UpdateControls(); };
  list_ = new wxChoice(this, wxID_ANY);
  list_->SetName(Label("Places"));
  for (const ListedPlace& place : places_) list_->Append(Shown(place.name));
  list_->SetSelection(0);
  list_->Bind(wxEVT_CHOICE, update);
  listed_ = AddWay(Label("&From the list"), list_, true);
  listed_->Enable(!places_.empty());
  listed_->SetToolTip(Shown(LocationsPath()));
  field_ = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, wxSize(TextWidth(*this, 330), -1));
  field_->SetName(Label("Latitude, longitude"));
  field_->SetHint("45.33,-79.22");
  field_->Bind(wxEVT_TEXT, update);
  typed_ = AddWay(Label("&Latitude, longitude"), field_);
  file_ = new wxFilePickerCtrl(
      this, wxID_ANY, "", Label("GPX track"), Label("GPX tracks (*.gpx)|*.gpx;*.GPX|All files|*"),
      wxDefaultPosition, wxDefaultSize, wxFLP_OPEN | wxFLP_USE_TEXTCTRL | wxFLP_SMALL);
  file_->Bind(wxEVT_FILEPICKER_CHANGED, [this](wxFileDirPickerEvent&) { ReadTrack(); });
  tracked_ = AddWay(Label("From a &GPX track"), file_);
  file_->GetTextCtrl()->SetName(Label("GPX track"));
  // before its field, which its mnemonic focuses
  grid_->Add(new wxStaticText(this, wxID_ANY, Label("&Added to the camera's time:")),
             wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(24)));
  offset_ = new wxTextCtrl(this, wxID_ANY);
  offset_->SetName(Label("Added to the camera's time"));
  offset_->SetHint(Label("EXIF offset, else +0:00"));
  offset_->SetToolTip(Label(
      "The difference from the camera's time to UTC: -2:00 if its clock is two hours ahead."));
  offset_->Bind(wxEVT_TEXT, update);
  grid_->Add(offset_, wxSizerFlags().Expand());
  removed_ = AddWay(Label("&Remove the place"), nullptr);
}

// A track may be long, so it is read in the background.
void PlaceDialog::ReadTrack() {
  track_.reset();
  const std::string path = Utf8(file_->GetPath());
  trackProblem_ = path.empty() ? wxString() : Label("Reading...");
  work_.Start([this, path](const StopToken&, const LooseWork::Report& report) {
    auto track = std::make_shared<GpsTrack>();
    platform::FileView file;
    const bool read = file.Open(path) && track->Parse(file.Bytes()) == Status::Ok;
    report([this, path, read, track] {
      trackProblem_ = read           ? wxString()
                      : path.empty() ? wxString()
                                     : Label("\"%1\" is not a GPX track.", Shown(path));
      if (read && track->Empty())
        trackProblem_ = Label("\"%1\" has no points with a time.", Shown(path));
      if (read && !track->Empty()) track_ = track;
      UpdateControls();
    });
  });
  UpdateControls();
}

std::optional<GpsPlace> PlaceDialog::ChosenPlace() const {
  if (listed_->GetValue() && list_->GetSelection() != wxNOT_FOUND)
    return places_[static_cast<size_t>(list_->GetSelection())].place;
  if (typed_->GetValue()) return ParseGpsPlace(Utf8(field_->GetValue()));
  return {};
}

std::optional<int64_t> PlaceDialog::Offset() const {
  return ParseTimeShift(Utf8(offset_->GetValue()));
}

bool PlaceDialog::OffsetIsValid() const { return offset_->IsEmpty() || Offset(); }

wxString PlaceDialog::TrackText() const {
  if (!trackProblem_.empty()) return trackProblem_;
  if (!OffsetIsValid())
    return Label("\"%1\" is not an offset such as +1:30:00.", offset_->GetValue());
  if (track_ == nullptr) return Label("Choose a recorded track.");
  const size_t files = editor_.Changeable().size();
  return LabelCount("%2 of %1 file was taken on this track.",
                    "%2 of %1 files were taken on this track.", files,
                    editor_.OnTrack(*track_, Offset()));
}

void PlaceDialog::UpdateControls() {
  const auto place = ChosenPlace();
  wxString note;
  if (place) note = wxString::FromUTF8(GpsPlaceText(place->latitude, place->longitude));
  if (typed_->GetValue() && !place)
    note = Label("Latitude and longitude in decimal degrees, north and east positive.");
  if (tracked_->GetValue()) note = TrackText();
  if (removed_->GetValue()) note = Label("All GPS values are removed.");
  note_->SetLabelText(note);
  map_->Show(place.has_value());
  if (place) map_->SetURL(Shown(MapLink(*place)));
  list_->Enable(listed_->GetValue());
  field_->Enable(typed_->GetValue());
  file_->Enable(tracked_->GetValue());
  offset_->Enable(tracked_->GetValue());
  const bool followed = tracked_->GetValue() && track_ != nullptr && OffsetIsValid();
  ok_->Enable(place.has_value() || followed || removed_->GetValue());
  Layout();
  LogEvent("place", Utf8(note));
}

void PlaceDialog::Apply() {
  if (const auto place = ChosenPlace()) return editor_.Set(PlaceEntries(*place));
  if (removed_->GetValue()) return editor_.RemovePlace();
  editor_.Follow(track_, Offset());
}

}  // namespace

bool AskForPlace(wxWindow& parent, ExifEditor& editor) {
  PlaceDialog dialog(&parent, editor);
  LogEvent("prompt", "place");
  if (dialog.ShowModal() != wxID_OK) return false;
  dialog.Apply();
  return true;
}

}  // namespace fotomill::desktop
