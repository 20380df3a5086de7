#include "desktop/windows/metadata/place_dialog.h"

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/dialog.h>
#include <wx/filepicker.h>
#include <wx/hyperlink.h>
#include <wx/msgdlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/textdlg.h>

#include <memory>

#include "desktop/models/metadata/exif_editor.h"
#include "desktop/models/metadata/place_list.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/gps.h"
#include "platform/file_view.h"
#include "settings/exif_settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

class PlaceDialog : public wxDialog {
 public:
  PlaceDialog(wxWindow* parent, ExifEditor& editor);
  void Apply();

 private:
  wxRadioButton* AddWay(const wxString& label, wxSizer* controls, bool first = false);
  void BuildWays();
  wxButton* AddButton(wxSizer& row, const wxString& label, void (PlaceDialog::*run)());
  void ShowList(const std::string& chosen);
  const OfferedPlace* Listed() const;  // the place chosen in the list
  void Done(const std::string& problem, const std::string& chosen);
  void AddToList();
  void Rename();
  void Remove();
  void ReadTrack();
  void UpdateControls();
  std::optional<GpsPlace> ChosenPlace() const;
  std::optional<int64_t> Offset() const;  // from a valid field
  bool OffsetIsValid() const;
  wxString TrackText() const;

  ExifEditor& editor_;
  std::vector<OfferedPlace> places_ = OfferedPlaces();
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
  wxButton* rename_ = nullptr;
  wxButton* remove_ = nullptr;
  wxButton* add_ = nullptr;
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
  ShowList({});
  // A list takes the focus only when it is visible.
  CallAfter([this] { (places_.empty() ? static_cast<wxWindow*>(field_) : list_)->SetFocus(); });
}

wxRadioButton* PlaceDialog::AddWay(const wxString& label, wxSizer* controls, bool first) {
  auto* way = new wxRadioButton(this, wxID_ANY, label, wxDefaultPosition, wxDefaultSize,
                                first ? wxRB_GROUP : 0);
  way->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  grid_->Add(way, wxSizerFlags().CenterVertical());
  if (controls == nullptr) {
    grid_->AddSpacer(0);
    return way;
  }
  wxWindow* before = way;
  for (wxSizerItem* item : controls->GetChildren()) {
    item->GetWindow()->MoveAfterInTabOrder(before);
    before = item->GetWindow();
  }
  grid_->Add(controls, wxSizerFlags().Expand());
  return way;
}

wxButton* PlaceDialog::AddButton(wxSizer& row, const wxString& label, void (PlaceDialog::*run)()) {
  auto* button = new wxButton(this, wxID_ANY, label);
  button->Bind(wxEVT_BUTTON, [this, run](wxCommandEvent&) { (this->*run)(); });
  row.Add(button, wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(6)));
  return button;
}

void PlaceDialog::BuildWays() {
  const auto update = [this](wxCommandEvent&) { UpdateControls(); };
  list_ = new wxChoice(this, wxID_ANY);
  list_->SetName(Label("Places"));
  list_->Bind(wxEVT_CHOICE, update);
  const wxSizerFlags whole = wxSizerFlags(1).CenterVertical();
  auto* list = new wxBoxSizer(wxHORIZONTAL);
  list->Add(list_, whole);
  rename_ = AddButton(*list, Label("Rena&me..."), &PlaceDialog::Rename);
  remove_ = AddButton(*list, Label("&Delete"), &PlaceDialog::Remove);
  remove_->SetToolTip(Label("Deletes this place from the list."));
  listed_ = AddWay(Label("&From the list"), list, true);
  listed_->SetToolTip(Shown(LocationsPath()));
  field_ = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, wxSize(TextWidth(*this, 330), -1));
  field_->SetName(Label("Latitude, longitude"));
  field_->SetHint("45.33,-79.22");
  field_->Bind(wxEVT_TEXT, update);
  auto* typed = new wxBoxSizer(wxHORIZONTAL);
  typed->Add(field_, whole);
  add_ = AddButton(*typed, Label("Add &to list..."), &PlaceDialog::AddToList);
  typed_ = AddWay(Label("&Latitude, longitude"), typed);
  file_ = new wxFilePickerCtrl(
      this, wxID_ANY, "", Label("GPX track"), Label("GPX tracks (*.gpx)|*.gpx;*.GPX|All files|*"),
      wxDefaultPosition, wxDefaultSize, wxFLP_OPEN | wxFLP_USE_TEXTCTRL | wxFLP_SMALL);
  file_->Bind(wxEVT_FILEPICKER_CHANGED, [this](wxFileDirPickerEvent&) { ReadTrack(); });
  auto* track = new wxBoxSizer(wxHORIZONTAL);
  track->Add(file_, whole);
  tracked_ = AddWay(Label("From a &GPX track"), track);
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

// --- the list of places ---

void PlaceDialog::ShowList(const std::string& chosen) {
  places_ = OfferedPlaces();
  list_->Clear();
  int selected = 0;
  for (const OfferedPlace& place : places_) {
    const int line = list_->Append(Shown(place.name));
    if (place.listed && place.name == chosen) selected = line;
  }
  if (!places_.empty()) list_->SetSelection(selected);
  listed_->Enable(!places_.empty());
  if (places_.empty()) typed_->SetValue(true);
  UpdateControls();
}

const OfferedPlace* PlaceDialog::Listed() const {
  const int line = list_->GetSelection();
  return line == wxNOT_FOUND ? nullptr : &places_[static_cast<size_t>(line)];
}

void PlaceDialog::Done(const std::string& problem, const std::string& chosen) {
  LogEvent("places", problem.empty() ? chosen : problem);
  if (!problem.empty()) wxMessageBox(Shown(problem), Label("Place"), wxOK | wxICON_WARNING, this);
  ShowList(chosen);
}

void PlaceDialog::AddToList() {
  const auto place = ParseGpsPlace(Utf8(field_->GetValue()));
  if (!place) return;
  LogEvent("prompt", "place-name");
  const wxString name =
      wxGetTextFromUser(Label("Name of the place:"), Label("Add to list"), "", this);
  if (name.empty()) return;
  const std::string problem = AddPlace(Utf8(name), *place);
  if (problem.empty()) listed_->SetValue(true);
  Done(problem, Utf8(name));
}

void PlaceDialog::Rename() {
  const OfferedPlace* const place = Listed();
  if (place == nullptr) return;
  const std::string old = place->name;
  LogEvent("prompt", "place-name");
  const wxString name = wxGetTextFromUser(Label("New name:"), Label("Rename"), Shown(old), this);
  if (name.empty()) return;
  const std::string problem = RenamePlace(old, Utf8(name));
  Done(problem, problem.empty() ? Utf8(name) : old);
}

void PlaceDialog::Remove() {
  const OfferedPlace* const place = Listed();
  if (place == nullptr) return;
  wxMessageDialog dialog(this, Label("Delete \"%1\" from the list of places?", place->name),
                         Label("Delete place"), wxOK | wxCANCEL | wxICON_QUESTION);
  dialog.SetOKLabel(Label("&Delete"));
  LogEvent("prompt", "place-delete");
  if (dialog.ShowModal() != wxID_OK) return;
  Done(RemovePlace(place->name), {});
  list_->SetFocus();  // the button may be disabled now
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
  if (listed_->GetValue() && Listed() != nullptr) return Listed()->place;
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
  const bool own = listed_->GetValue() && Listed() != nullptr && Listed()->listed;
  rename_->Enable(own);
  remove_->Enable(own);
  add_->Enable(typed_->GetValue() && place.has_value());
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
