#include "desktop/windows/edit/crop_properties.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/display.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>

#include <algorithm>
#include <cmath>

#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kRatios[] = {"1:1",  "3:2",  "2:3", "4:3", "3:4",
                                   "16:9", "9:16", "5:4", "4:5", "1.414:1"};
constexpr int kMostPixels = 1'000'000;

}  // namespace

CropProperties::CropProperties(wxWindow* parent, Events events)
    : wxFrame(parent, wxID_ANY, Label("Crop properties"), wxDefaultPosition, wxDefaultSize,
              wxCAPTION | wxRESIZE_BORDER | wxCLOSE_BOX | wxFRAME_TOOL_WINDOW |
                  wxFRAME_FLOAT_ON_PARENT | wxFRAME_NO_TASKBAR,
              "CropPropertiesBox"),
      events_(std::move(events)) {
  auto* panel = new wxPanel(this);
  const int gap = FromDIP(8);
  const auto below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(NewRatioRow(panel), below);
  rows->Add(NewNumbers(panel), below);
  exact_ = new wxCheckBox(panel, wxID_ANY, Label("&Keep this size, only move it"));
  exact_->SetValue(settings.CropModeExact != 0);
  exact_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { events_.exact(exact_->GetValue()); });
  rows->Add(exact_, below);
  rows->Add(NewAngleRow(panel), below);
  auto* lines = new wxBoxSizer(wxHORIZONTAL);
  lines->Add(new wxStaticText(panel, wxID_ANY, Label("&Lines:")),
             wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  lines_ = new wxChoice(panel, wxID_ANY);
  lines_->SetName(Label("Lines"));
  for (const char* text : {TrLater("None"), TrLater("Rule of thirds"), TrLater("Golden section")})
    lines_->Append(Label(text));
  lines_->SetSelection(static_cast<int>(CropLines::Thirds));
  lines_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) {
    events_.lines(static_cast<CropLines>(lines_->GetSelection()));
  });
  lines->Add(lines_, wxSizerFlags(1));
  rows->Add(lines, below);
  faces_ = new wxButton(panel, wxID_ANY, Label("Crop to the &faces"));
  faces_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.faces(); });
  rows->Add(faces_, below);
  lossless_ = new wxCheckBox(panel, wxID_ANY, Label("L&ossless (JPEG)"));
  lossless_->SetToolTip(
      Label("Moves the edges between the blocks of the file, so that nothing is encoded again."));
  lossless_->Bind(wxEVT_CHECKBOX,
                  [this](wxCommandEvent&) { events_.lossless(lossless_->GetValue()); });
  rows->Add(lossless_, below);
  moves_ = new wxStaticText(panel, wxID_ANY, "");
  moves_->SetMinSize({-1, 2 * GetCharHeight()});  // no text moves other controls
  rows->Add(moves_, wxSizerFlags().Expand().Border(wxALL, gap));
  panel->SetSizer(rows);
  auto* all = new wxBoxSizer(wxVERTICAL);
  all->Add(panel, wxSizerFlags(1).Expand());
  SetSizerAndFit(all);
  PlaceBeside(*parent);
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) { events_.key(event); });
  // It belongs to its window.
  Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent&) {
    KeepPlace();
    Hide();
  });
}

wxSizer* CropProperties::NewRatioRow(wxWindow* panel) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(panel, wxID_ANY, Label("&Ratio:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8)));
  ratio_ = new wxComboBox(panel, wxID_ANY);
  ratio_->SetName(Label("Ratio"));
  ratio_->SetToolTip(Label("Choose a ratio, or enter your own, such as 7:5."));
  ratio_->Append(Label("Any"));
  for (const char* ratio : kRatios) ratio_->Append(ratio);
  ratio_->SetSelection(0);
  ratio_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { RatioEntered(); });
  row->Add(ratio_, wxSizerFlags(1));
  return row;
}

void CropProperties::RatioEntered() {
  CropRatio ratio;
  const std::string text = Utf8(ratio_->GetValue());
  const bool valid =
      ReadCropRatio(text, ratio) || ratio_->GetValue() == Label("Any") || text.empty();
  ratio_->SetForegroundColour(valid ? wxColour() : FaultColor());
  if (valid) events_.ratio(ratio);
}

wxSizer* CropProperties::NewNumbers(wxWindow* panel) {
  constexpr const char* kNames[] = {TrLater("&Left:"), TrLater("&Top:"), TrLater("&Width:"),
                                    TrLater("&Height:")};
  auto* grid = new wxFlexGridSizer(4, FromDIP(wxSize(8, 6)));
  for (int i = 0; i < 4; ++i) {
    grid->Add(new wxStaticText(panel, wxID_ANY, Label(kNames[i])), wxSizerFlags().CenterVertical());
    numbers_[i] = new wxSpinCtrl(panel, wxID_ANY, "", wxDefaultPosition,
                                 wxSize(TextWidth(*this, FromDIP(150)), -1), wxSP_ARROW_KEYS,
                                 i < 2 ? 0 : 1, kMostPixels);
    numbers_[i]->SetName(wxControl::RemoveMnemonics(Label(kNames[i])).BeforeLast(':'));
    numbers_[i]->Bind(wxEVT_SPINCTRL, [this](wxSpinEvent&) { NumbersEntered(); });
    grid->Add(numbers_[i]);
  }
  return grid;
}

void CropProperties::NumbersEntered() {
  events_.area({numbers_[0]->GetValue(), numbers_[1]->GetValue(), numbers_[2]->GetValue(),
                numbers_[3]->GetValue()});
}

wxSizer* CropProperties::NewAngleRow(wxWindow* panel) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(panel, wxID_ANY, Label("&Angle:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8)));
  angle_ = new wxSpinCtrlDouble(panel, wxID_ANY, "0", wxDefaultPosition,
                                wxSize(TextWidth(*this, FromDIP(150)), -1), wxSP_ARROW_KEYS, -45,
                                45, 0, 0.1);
  angle_->SetDigits(2);
  angle_->SetName(Label("Angle"));
  angle_->Bind(wxEVT_SPINCTRLDOUBLE,
               [this](wxSpinDoubleEvent&) { events_.angle(angle_->GetValue()); });
  row->Add(angle_);
  level_ = new wxButton(panel, wxID_ANY, Label("&Draw horizon"));
  level_->SetToolTip(Label("Drag a line along the horizon, or along an upright edge."));
  level_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.drawLevel(); });
  row->Add(level_, wxSizerFlags(1).Border(wxLEFT, FromDIP(8)));
  return row;
}

// At the remembered place, if it is on a screen, else at the right edge of the window.
void CropProperties::PlaceBeside(wxWindow& parent) {
  const wxRect kept(settings.CropPropertiesLeft, settings.CropPropertiesTop,
                    settings.CropPropertiesWidth, settings.CropPropertiesDepth);
  const wxSize least = GetSize();
  SetMinSize(least);
  const bool known = kept.width > 0 && kept.height > 0 &&
                     wxDisplay::GetFromPoint(kept.GetPosition()) != wxNOT_FOUND;
  if (known) {
    SetSize(wxRect(kept.x, kept.y, std::max(kept.width, least.x), std::max(kept.height, least.y)));
  } else {
    const wxRect window = parent.GetScreenRect();
    SetPosition({window.GetRight() - least.x - FromDIP(24), window.y + FromDIP(80)});
  }
}

void CropProperties::KeepPlace() {
  const wxRect place = GetRect();
  settings.CropPropertiesLeft = place.x;
  settings.CropPropertiesTop = place.y;
  settings.CropPropertiesWidth = place.width;
  settings.CropPropertiesDepth = place.height;
}

void CropProperties::ShowArea(const CropArea& area, double angle) {
  const Rectangle& rectangle = area.Area();
  const int values[] = {rectangle.x, rectangle.y, rectangle.width, rectangle.height};
  for (int i = 0; i < 4; ++i) {
    if (numbers_[i]->GetValue() != values[i]) numbers_[i]->SetValue(values[i]);
  }
  if (std::abs(angle_->GetValue() - angle) > 0.004) angle_->SetValue(angle);
}

void CropProperties::ShowLossless(bool possible, const wxString& text) {
  lossless_->Enable(possible);
  if (moves_->GetLabel() != text) moves_->SetLabel(text);
}

}  // namespace fotomill::desktop
