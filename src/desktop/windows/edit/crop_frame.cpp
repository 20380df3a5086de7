#include "desktop/windows/edit/crop_frame.h"

#include <wx/button.h>
#include <wx/menu.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>

#include <algorithm>
#include <cmath>

#include "batch/picture_failure.h"
#include "containers/jpeg_segments.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/crop_properties.h"
#include "desktop/windows/edit/picture_strip.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/exif/exif_edit.h"
#include "metadata/exif/picture_exif.h"
#include "operations/engine.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "processing/faces/face_finder.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/job_options.h"
#include "settings/key_texts.h"
#include "settings/settings.h"
#include "texts/status_text.h"

namespace fotomill::desktop {

namespace {

constexpr int32_t kFaceSide = 1024;  // of the picture in which faces are searched

wxString TitleOf(const std::vector<std::string>& files) {
  if (files.size() == 1) return Label("Crop: %1", Shown(platform::FileNameOf(files.front())));
  return LabelCount("Crop: %1 picture", "Crop: %1 pictures", files.size());
}

std::vector<Step> StraightenBy(double angle) {
  Recipe recipe;
  const std::string text = CropRecipe(angle, {0, 0, 1, 1}, {1, 1});
  if (text.empty() || !ReadRecipe(text, KeyTextInForce, recipe).empty()) return {};
  return recipe.common;
}

}  // namespace

CropFrame::CropFrame(Shell& shell, const std::vector<std::string>& files)
    : wxFrame(&shell.Window(), wxID_ANY, TitleOf(files), wxDefaultPosition, wxDefaultSize,
              wxDEFAULT_FRAME_STYLE, "FotomillProfessionalCrop"),
      shell_(shell),
      files_(files),
      choices_(files.size()) {
  SetSize(shell.Window().GetSize());
  maker_ = std::make_unique<PreviewMaker>([this] { CallAfter([this] { PreviewsCame(); }); });
  auto* panel = new wxPanel(this);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  canvas_ = new CropCanvas(
      panel, area_,
      {.changed = [this] { AreaChanged(); },
       .resized = [this] { RequestPreview(); },
       .levelDrawn = [this](double angle) { SetAngle(choices_[place_].angle + angle); }});
  canvas_->SetFixedSize(settings.CropModeExact != 0);
  rows->Add(canvas_, wxSizerFlags(1).Expand());
  if (files_.size() > 1) {
    strip_ = new PictureStrip(panel, files_, [this](size_t place) { ShowPicture(place); });
    rows->Add(strip_, wxSizerFlags().Expand());
  }
  rows->Add(BuildButtons(panel), wxSizerFlags().Expand().Border(wxALL, FromDIP(8)));
  panel->SetSizer(rows);
  CreateStatusBar();
  if (settings.MaximizeViewWindow != 0) Maximize();
  BuildProperties();
  Bind(wxEVT_CHAR_HOOK, &CropFrame::OnKey, this);
  Bind(wxEVT_CLOSE_WINDOW, &CropFrame::OnClose, this);
  canvas_->Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) { ShowMenu(event.GetPosition()); });
  ShowPicture(0);
  canvas_->SetFocus();
}

CropFrame::~CropFrame() {
  faces_.Stop();
  maker_.reset();  // its threads call back into this window
}

wxSizer* CropFrame::BuildButtons(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto add = [&](const wxString& label, void (CropFrame::*run)(), const char* tip) {
    auto* button = new wxButton(parent, wxID_ANY, label);
    button->SetToolTip(Label(tip));
    button->Bind(wxEVT_BUTTON, [this, run](wxCommandEvent&) { (this->*run)(); });
    row->Add(button, wxSizerFlags().Border(wxRIGHT, FromDIP(8)));
    return button;
  };
  if (files_.size() > 1) {
    back_ = add(Label("&Back"), &CropFrame::GoBack,
                TrLater("Goes back to the previous picture (Backspace)."));
    skip_ =
        add(Label("S&kip"), &CropFrame::Skip, TrLater("Leaves this picture as it is (Insert)."));
    take_ = add(Label("&Take"), &CropFrame::Take,
                TrLater("Takes this rectangle and goes on to the next picture (Enter)."));
  }
  add(Label("&Properties"), &CropFrame::ToggleProperties,
      TrLater("Shows or hides ratio, numbers and angle (F9)."));
  row->AddStretchSpacer();
  auto* close = new wxButton(parent, wxID_CLOSE);
  close->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Close(); });
  row->Add(close, wxSizerFlags().Border(wxRIGHT, FromDIP(8)));
  change_ = add("", &CropFrame::ChangeFiles, TrLater("Crops the files themselves; can be undone."));
  copies_ =
      add("", &CropFrame::SaveCopies, TrLater("Writes cropped copies to a folder of your choice."));
  return row;
}

void CropFrame::BuildProperties() {
  properties_ = new CropProperties(
      this, {.ratio =
                 [this](const CropRatio& ratio) {
                   if (area_.Ratio() == ratio) return;
                   area_.SetRatio(ratio);
                   AreaChanged();
                 },
             .area =
                 [this](const Rectangle& area) {
                   area_.SetArea(area);
                   AreaChanged();
                 },
             .exact =
                 [this](bool exact) {
                   settings.CropModeExact = exact ? 1 : 0;
                   (void)SaveConfiguration();
                   canvas_->SetFixedSize(exact);
                   canvas_->Refresh();
                 },
             .lines = [this](CropLines lines) { canvas_->SetLines(lines); },
             .angle = [this](double angle) { SetAngle(angle); },
             .drawLevel = [this] { DrawLevel(); },
             .faces = [this] { CropToFaces(); },
             .lossless =
                 [this](bool on) {
                   lossless_ = on;
                   UpdateControls();
                 },
             .key =
                 [this](wxKeyEvent& event) {
                   if (event.GetKeyCode() == WXK_ESCAPE || event.GetKeyCode() == WXK_F9) {
                     ToggleProperties();
                   } else {
                     event.Skip();
                   }
                 }});
  canvas_->Bind(wxEVT_PAINT, &CropFrame::ShowProperties, this);
}

// At the first paint, as window managers keep them above this window only if they appear after it.
void CropFrame::ShowProperties(wxPaintEvent& event) {
  canvas_->Unbind(wxEVT_PAINT, &CropFrame::ShowProperties, this);
  CallAfter([this] { properties_->ShowWithoutActivating(); });
  event.Skip();
}

// --- pictures ---

void CropFrame::ShowPicture(size_t place) {
  faces_.Stop();
  place_ = place;
  known_ = false;
  canvas_->StartAfresh();
  UpdateControls();
  maker_->SetPicture(files_[place]);
  platform::FileView file;
  JpegFacts facts;
  JpegHead head;
  if (file.Open(files_[place]) && ParseJpegHead(file.Bytes(), head) == Status::Ok &&
      ReadJpegGrid(file.Bytes(), facts.grid) == Status::Ok) {
    facts.orientation = static_cast<Orientation>(ExifOrientation(head.Exif()));
    choices_[place].jpeg = facts;
  }
  RequestPreview();
}

void CropFrame::RequestPreview() {
  if (canvas_ == nullptr || choices_.empty()) return;
  const wxSize pane = canvas_->PaneSize();
  maker_->Request({.steps = ++stepsNumber_,
                   .list = StraightenBy(choices_[place_].angle),
                   .place = {},
                   .width = pane.x,
                   .height = pane.y});
}

void CropFrame::PreviewsCame() {
  for (const PreviewPointer& preview : maker_->Fetch()) {
    if (preview->status != Status::Ok) {
      known_ = false;
      canvas_->ShowProblem(Shown(preview->problem));
      LogEvent("crop-problem", preview->problem);
      UpdateControls();
      continue;
    }
    // The size of a straightened picture is known exactly only later.
    const bool exact = preview->exact || choices_[place_].angle == 0;
    if (exact) PictureKnown(preview->whole);
    if (exact || canvas_->HasPicture()) canvas_->Take(preview);
  }
}

// Shows the rectangle of the picture, or suggests one.
void CropFrame::PictureKnown(Size size) {
  known_ = true;
  Choice& choice = choices_[place_];
  const bool same = choice.size.width == size.width && choice.size.height == size.height;
  const Size shown = area_.Picture();
  if (choice.seen && same && shown.width == size.width && shown.height == size.height &&
      area_.Area() == choice.area)
    return;
  const Rectangle last = area_.Area();
  const bool free = area_.Ratio().Free();
  area_.SetPicture(size);
  if (choice.seen) {
    area_.SetArea(same ? choice.area : SamePart(choice.area, choice.size, size));
  } else if (free && place_ > 0 && choices_[place_ - 1].seen) {
    area_.SetArea(SamePart(last, shown, size));
  }
  LogEvent("crop-picture", std::to_string(place_ + 1) + "/" + std::to_string(files_.size()) + " " +
                               std::to_string(size.width) + "x" + std::to_string(size.height));
  AreaChanged();
}

void CropFrame::AreaChanged() {
  if (!known_) return;
  Choice& choice = choices_[place_];
  choice.seen = true;
  choice.area = area_.Area();
  choice.size = area_.Picture();
  // A single picture needs no taking.
  if (files_.size() == 1) choice.taken = true;
  canvas_->Refresh();
  const Rectangle& area = choice.area;
  LogEvent("crop-area", std::to_string(area.width) + "x" + std::to_string(area.height) + "+" +
                            std::to_string(area.x) + "+" + std::to_string(area.y));
  UpdateControls();
}

void CropFrame::SetAngle(double angle) {
  Choice& choice = choices_[place_];
  angle = std::clamp(std::round(angle * 100) / 100, -45.0, 45.0);
  if (choice.angle == angle) return;
  choice.angle = angle;
  LogEvent("crop-angle", std::to_string(angle));
  RequestPreview();
  UpdateControls();
}

// --- commands ---

void CropFrame::Take() {
  if (!known_) return wxBell();
  choices_[place_].taken = true;
  if (strip_ != nullptr) strip_->Mark(place_, true);
  UpdateControls();
  if (place_ + 1 < files_.size()) return strip_->Choose(place_ + 1);
  change_->SetFocus();
}

void CropFrame::Skip() {
  choices_[place_].taken = false;
  if (strip_ == nullptr) return;
  strip_->Mark(place_, false);
  UpdateControls();
  if (place_ + 1 < files_.size()) strip_->Choose(place_ + 1);
}

void CropFrame::GoBack() {
  if (place_ == 0 || strip_ == nullptr) return wxBell();
  strip_->Choose(place_ - 1);
}

void CropFrame::UseWhole() {
  if (!known_) return wxBell();
  area_.SetArea(area_.Suggested());
  AreaChanged();
}

void CropFrame::DrawLevel() { canvas_->DrawLevel(true); }

void CropFrame::ToggleProperties() {
  properties_->Show(!properties_->IsShown());
  if (properties_->IsShown()) return properties_->Raise();
  properties_->KeepPlace();
  canvas_->SetFocus();
}

void CropFrame::CropToFaces() {
  struct Found {
    std::vector<Rectangle> faces;
    Size size{0, 0};
    Status status = Status::Ok;
  };
  const auto found = std::make_shared<Found>();
  SetStatusText(Label("Searching for faces..."));
  const auto work = [found, path = files_[place_], steps = StraightenBy(choices_[place_].angle),
                     read = ReadOptionsFromSettings(),
                     options = FaceOptionsFromSettings()](const StopToken& stop) {
    const auto search = [&]() -> Status {
      PicturePointer picture;
      RETURN_IF_BAD(LoadPicture({.fileName = path, .stop = stop, .options = read}, picture));
      RETURN_IF_BAD(TurnUpright(*picture));
      RETURN_IF_BAD(ApplySteps(*picture, steps, {}));
      const Size whole{picture->image.Width(), picture->image.Height()};
      if (std::max(whole.width, whole.height) > kFaceSide)
        RETURN_IF_BAD(ScalePicture(*picture, FitSize(whole.width, whole.height, kFaceSide),
                                   ScaleFilter::Bilinear));
      found->size = {picture->image.Width(), picture->image.Height()};
      return FindFaces(picture->image, options, found->faces, [&stop] { return !stop.Asked(); });
    };
    found->status = search();
  };
  faces_.Start(*this, work, [this, found](Status status) {
    FacesFound(status == Status::Ok ? found->status : status, found->faces, found->size);
  });
}

void CropFrame::FacesFound(Status status, const std::vector<Rectangle>& faces, Size size) {
  LogEvent("crop-faces", std::to_string(StatusNumber(status)) + " " + std::to_string(faces.size()));
  UpdateControls();
  if (status != Status::Ok) {
    wxMessageBox(Shown(StatusText(status) + " " + WorkHint(status)), Label("Crop to the faces"),
                 wxOK | wxICON_WARNING, this);
    return;
  }
  if (faces.empty()) return SetStatusText(Label("No faces were found."));
  area_.SetArea(SamePart(AroundFaces(faces, size.width, size.height), size, area_.Picture()));
  AreaChanged();
}

// --- applying ---

FileRecipes CropFrame::Recipes() const {
  FileRecipes recipes;
  for (size_t i = 0; i < files_.size(); ++i) {
    const Choice& choice = choices_[i];
    if (!choice.taken) continue;
    Rectangle area = choice.area;
    if (lossless_ && choice.jpeg && choice.angle == 0)
      area = LosslessArea(area, choice.jpeg->grid, choice.jpeg->orientation);
    std::string recipe = CropRecipe(choice.angle, area, choice.size);
    if (!recipe.empty()) recipes[files_[i]] = std::move(recipe);
  }
  return recipes;
}

void CropFrame::SaveCopies() {
  const FileRecipes recipes = Recipes();
  if (recipes.empty()) return wxBell();
  if (SaveCopiesOf(shell_, *this, recipes)) Applied();
}

void CropFrame::ChangeFiles() {
  const FileRecipes recipes = Recipes();
  if (recipes.empty()) return wxBell();
  if (ChangeFilesBy(shell_, recipes)) Applied();
}

// The batch runs without this window.
void CropFrame::Applied() {
  for (Choice& choice : choices_) choice.taken = false;
  Close();
}

// --- controls ---

std::string CropFrame::LosslessText() {
  const Choice& choice = choices_[place_];
  if (!choice.jpeg || !choice.seen) return {};
  if (choice.angle != 0) return Tr("Straightening encodes the picture again.");
  const Rectangle area = LosslessArea(choice.area, choice.jpeg->grid, choice.jpeg->orientation);
  const int32_t left = area.x - choice.area.x, top = area.y - choice.area.y;
  const int32_t right = area.x + area.width - choice.area.x - choice.area.width;
  const int32_t bottom = area.y + area.height - choice.area.y - choice.area.height;
  if (left == 0 && top == 0 && right == 0 && bottom == 0) return Tr("This rectangle is lossless.");
  // Of two opposite edges, only one moves.
  return Tr("Lossless: the edges move by %1 and %2 pixels.", left + right, top + bottom);
}

void CropFrame::UpdateControls() {
  if (properties_ == nullptr) return;  // not built yet
  const Choice& choice = choices_[place_];
  properties_->ShowArea(area_, choice.angle);
  properties_->ShowLossless(choice.jpeg.has_value() && choice.angle == 0, Shown(LosslessText()));
  const size_t count = Recipes().size();
  const wxString change = LabelCount("C&rop %1 file", "C&rop %1 files", count);
  const wxString copies = LabelCount("&Save %1 copy...", "&Save %1 copies...", count);
  if (change_->GetLabel() != change) {
    change_->SetLabel(change);
    copies_->SetLabel(copies);
    change_->GetParent()->Layout();
  }
  change_->Enable(count > 0);
  copies_->Enable(count > 0);
  if (back_ != nullptr) back_->Enable(place_ > 0);
  if (take_ != nullptr) take_->Enable(known_);
  std::string line(platform::FileNameOf(files_[place_]));
  if (files_.size() > 1) line = Tr("%1 of %2", place_ + 1, files_.size()) + ", " + line;
  if (choice.seen)
    line += ", " + Tr("%1 x %2 pixels of %3 x %4", choice.area.width, choice.area.height,
                      choice.size.width, choice.size.height);
  SetStatusText(Shown(line));
  ReportToScreenReader(*canvas_, Label("Crop rectangle"), Shown(line));
}

void CropFrame::OnKey(wxKeyEvent& event) {
  const wxWindow* const focus = FindFocus();
  const int key = event.GetKeyCode();
  if (key == WXK_ESCAPE) return (void)Close();
  if (key == WXK_F9) return ToggleProperties();
  const bool inPicture = focus == canvas_ || (strip_ != nullptr && focus == strip_);
  if (key == WXK_TAB && focus == canvas_)
    return (void)canvas_->Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                                     : wxNavigationKeyEvent::IsForward);
  if (!inPicture || event.HasAnyModifiers()) return event.Skip();
  switch (key) {
    case WXK_RETURN:
    case WXK_NUMPAD_ENTER: return Take();
    case WXK_BACK: return GoBack();
    case WXK_INSERT: return Skip();
    case 'H': return DrawLevel();
    case 'F': return CropToFaces();
    case 'A': return UseWhole();
    default: event.Skip();
  }
}

void CropFrame::ShowMenu(const wxPoint& place) {
  if (settings.RightClickMenuInCrop == 0) return;
  struct Entry {
    const char* text;
    const char* key;
    void (CropFrame::*run)();
  };
  constexpr Entry kEntries[] = {
      {TrLater("&Take"), "Enter", &CropFrame::Take},
      {TrLater("&Back"), "Backspace", &CropFrame::GoBack},
      {TrLater("S&kip"), "Insert", &CropFrame::Skip},
      {TrLater("&Whole picture"), "A", &CropFrame::UseWhole},
      {TrLater("Crop to the &faces"), "F", &CropFrame::CropToFaces},
      {TrLater("&Draw horizon"), "H", &CropFrame::DrawLevel},
      {TrLater("&Properties"), "F9", &CropFrame::ToggleProperties},
  };
  wxMenu menu;
  for (const Entry& entry : kEntries) {
    const int id = menu.Append(wxID_ANY, Label(entry.text) + "    " + entry.key)->GetId();
    menu.Bind(
        wxEVT_MENU, [this, run = entry.run](wxCommandEvent&) { (this->*run)(); }, id);
  }
  canvas_->PopupMenu(&menu, place);
}

void CropFrame::OnClose(wxCloseEvent& event) {
  const bool taken =
      files_.size() > 1 && std::ranges::any_of(choices_, [](const Choice& c) { return c.taken; });
  if (taken && event.CanVeto()) {
    wxMessageDialog dialog(this, Label("Close without cropping the pictures?"), Label("Crop"),
                           wxOK | wxCANCEL | wxCANCEL_DEFAULT | wxICON_QUESTION);
    dialog.SetOKCancelLabels(Label("&Discard"), Label("&Keep editing"));
    LogEvent("prompt", "discard-crops");
    if (dialog.ShowModal() != wxID_OK) return event.Veto();
  }
  if (properties_->IsShown()) properties_->KeepPlace();
  (void)SaveConfiguration();
  LogEvent("crop", "closed");
  event.Skip();
}

void CropSelection(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) (new CropFrame(shell, files))->Show();
}

}  // namespace fotomill::desktop
