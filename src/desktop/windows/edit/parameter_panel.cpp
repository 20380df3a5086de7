#include "desktop/windows/edit/parameter_panel.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/filedlg.h>
#include <wx/sizer.h>
#include <wx/slider.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>
#include <cstdio>

#include "desktop/models/edit/choice_text.h"
#include "desktop/models/edit/slider_scale.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/setup/color_button.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

std::string HexColor(int32_t color, uint8_t alpha) {
  char text[12];
  std::snprintf(text, sizeof text, "#%02x%02x%02x", color & 255, color >> 8 & 255,
                color >> 16 & 255);
  std::string hex = text;
  if (alpha < 255) {
    std::snprintf(text, sizeof text, "%02x", alpha);
    hex += text;
  }
  return hex;
}

wxString NameOf(const Parameter& parameter) { return Label(parameter.label); }

// The width of the longest number that a field can be asked to show; beyond that it scrolls.
int WidestNumber(const wxWindow& field, const Parameter& parameter) {
  constexpr double kMost = 10000;
  int width = field.GetTextExtent("0000").x;
  for (const double number : {std::max(parameter.least, -kMost), std::min(parameter.most, kMost)}) {
    const int digits = DigitsOf(parameter);
    width = std::max(width, field.GetTextExtent(wxString::FromDouble(number, digits)).x);
  }
  return width;
}

}  // namespace

ParameterPanel::ParameterPanel(wxWindow* parent, Events events)
    : wxScrolledWindow(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxVSCROLL | wxTAB_TRAVERSAL, "EditParameters"),
      events_(std::move(events)) {
  SetScrollRate(0, FromDIP(10));
  auto* column = new wxBoxSizer(wxVERTICAL);
  grid_ = new wxFlexGridSizer(2, FromDIP(wxSize(8, 6)));
  grid_->AddGrowableCol(1);
  column->Add(grid_, wxSizerFlags().Expand().Border(wxRIGHT, FromDIP(4)));
  problem_ = new wxStaticText(this, wxID_ANY, "");
  problem_->SetForegroundColour(FaultColor());
  column->Add(problem_, wxSizerFlags().Expand().Border(wxTOP, FromDIP(6)));
  SetSizer(column);
}

bool ParameterPanel::ShowStep(const Step* step) {
  const bool replaced = operation_ != (step == nullptr ? nullptr : step->operation);
  showing_ = true;
  if (step == nullptr) {
    rows_.clear();
    grid_->Clear(true);
    operation_ = nullptr;
  } else if (step->operation != operation_) {
    Build(*step->operation);
  }
  if (step != nullptr) {
    for (size_t i = 0; i < rows_.size(); ++i) rows_[i].show(step->arguments.At(i));
  }
  problem_->SetLabel("");
  showing_ = false;
  FitInside();
  return replaced;
}

void ParameterPanel::Build(const Operation& operation) {
  operation_ = &operation;
  rows_.clear();
  grid_->Clear(true);
  for (const Parameter& parameter : operation.parameters) AddRow(parameter);
  Layout();
}

void ParameterPanel::AddRow(const Parameter& parameter) {
  auto* name = new wxStaticText(this, wxID_ANY, NameOf(parameter) + ":");
  name->SetToolTip(Label(parameter.help) + "\n" + Label("A double click restores the default."));
  name->Bind(wxEVT_LEFT_DCLICK, [this, &parameter](wxMouseEvent&) { Change(parameter, {}, true); });
  grid_->Add(name, wxSizerFlags().CenterVertical());
  Row row{&parameter, {}};
  grid_->Add(NewControl(parameter, row), wxSizerFlags(1).Expand());
  rows_.push_back(std::move(row));
}

wxSizer* ParameterPanel::NewControl(const Parameter& parameter, Row& row) {
  if (IsNumber(parameter)) return NewNumber(parameter, row);
  switch (parameter.kind) {
    case ParameterKind::kChoice: return NewChoice(parameter, row);
    case ParameterKind::kFlag: return NewFlag(parameter, row);
    case ParameterKind::kColor: return NewColor(parameter, row);
    default: return NewField(parameter, row);
  }
}

wxSizer* ParameterPanel::NewNumber(const Parameter& parameter, Row& row) {
  auto* line = new wxBoxSizer(wxHORIZONTAL);
  wxSlider* slider = nullptr;
  if (HasSlider(parameter)) {
    slider = new wxSlider(this, wxID_ANY, 0, 0, kSliderEnd);
    slider->SetName(NameOf(parameter));
    slider->SetToolTip(Label(parameter.help));
    line->Add(slider, wxSizerFlags(1).CenterVertical());
  }
  auto* field =
      new wxSpinCtrlDouble(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxSP_ARROW_KEYS);
  field->SetRange(parameter.least, parameter.most);
  field->SetDigits(static_cast<unsigned>(DigitsOf(parameter)));
  field->SetIncrement(StepOf(parameter));
  field->SetInitialSize(field->GetSizeFromTextSize(WidestNumber(*field, parameter)));
  field->SetName(NameOf(parameter));
  field->SetToolTip(Label(parameter.help));
  line->Add(field, wxSizerFlags(slider == nullptr ? 1 : 0).CenterVertical());
  const std::string_view unit = parameter.unit;
  if (!unit.empty() && unit != "levels" && unit != "degrees")
    line->Add(new wxStaticText(this, wxID_ANY, wxString::FromUTF8(parameter.unit)),
              wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(4)));
  field->Bind(wxEVT_SPINCTRLDOUBLE, [this, field, &parameter](wxSpinDoubleEvent&) {
    Change(parameter, NumberText(parameter, field->GetValue()), false);
  });
  field->Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) {
    if (!showing_) End();
    event.Skip();
  });
  if (slider != nullptr) {
    slider->Bind(wxEVT_SLIDER, [this, slider, &parameter](wxCommandEvent&) {
      Change(parameter, NumberText(parameter, SliderValue(parameter, slider->GetValue())), false);
    });
    slider->Bind(wxEVT_SCROLL_THUMBRELEASE, [this](wxScrollEvent& event) {
      End();
      event.Skip();
    });
    slider->Bind(wxEVT_LEFT_DCLICK,
                 [this, &parameter](wxMouseEvent&) { Change(parameter, {}, true); });
  }
  row.show = [slider, field, &parameter](const Value& value) {
    const double number = value.given ? value.number : 0;
    if (slider != nullptr) slider->SetValue(SliderPosition(parameter, number));
    if (field->GetValue() != number) field->SetValue(number);
  };
  return line;
}

wxSizer* ParameterPanel::NewChoice(const Parameter& parameter, Row& row) {
  auto* line = new wxBoxSizer(wxHORIZONTAL);
  auto* list = new wxChoice(this, wxID_ANY);
  list->SetName(NameOf(parameter));
  list->SetToolTip(Label(parameter.help));
  for (int32_t i = 0; !WordOf(parameter.choices, i).empty(); ++i)
    list->Append(Shown(ChoiceText(WordOf(parameter.choices, i))));
  list->Bind(wxEVT_CHOICE, [this, list, &parameter](wxCommandEvent&) {
    Change(parameter, std::string(WordOf(parameter.choices, list->GetSelection())), true);
  });
  row.show = [list](const Value& value) {
    list->SetSelection(value.given ? value.choice : wxNOT_FOUND);
  };
  line->Add(list, wxSizerFlags(1).CenterVertical());
  return line;
}

wxSizer* ParameterPanel::NewFlag(const Parameter& parameter, Row& row) {
  auto* line = new wxBoxSizer(wxHORIZONTAL);
  auto* box = new wxCheckBox(this, wxID_ANY, "");
  box->SetName(NameOf(parameter));
  box->SetToolTip(Label(parameter.help));
  box->Bind(wxEVT_CHECKBOX, [this, box, &parameter](wxCommandEvent&) {
    Change(parameter, box->GetValue() ? "yes" : "no", true);
  });
  row.show = [box](const Value& value) { box->SetValue(value.given && value.choice != 0); };
  line->Add(box, wxSizerFlags().CenterVertical());
  return line;
}

// The button chooses an opaque color; the field takes names and transparent colors as well.
wxSizer* ParameterPanel::NewColor(const Parameter& parameter, Row& row) {
  wxSizer* const line = NewField(parameter, row);
  auto* button = new ColorButton(this, wxID_ANY, NameOf(parameter));
  button->SetName(NameOf(parameter));
  button->Bind(wxEVT_BUTTON, [this, button, &parameter](wxCommandEvent&) {
    Change(parameter, HexColor(button->Setting(), 255), true);
  });
  row.show = [button, text = row.show](const Value& value) {
    const AlphaColor& color = value.color;
    button->SetSetting(color.red | color.green << 8 | color.blue << 16);
    text(value);
  };
  line->Add(button, wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(4)));
  return line;
}

wxSizer* ParameterPanel::NewField(const Parameter& parameter, Row& row) {
  auto* line = new wxBoxSizer(wxHORIZONTAL);
  auto* field = new wxTextCtrl(this, wxID_ANY);
  field->SetName(NameOf(parameter));
  field->SetToolTip(Label(parameter.help));
  field->Bind(wxEVT_TEXT, [this, field, &parameter](wxCommandEvent&) {
    Change(parameter, Utf8(field->GetValue()), false);
  });
  field->Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) {
    if (!showing_) End();
    event.Skip();
  });
  row.show = [this, field, &parameter](const Value& value) {
    const wxString text = Shown(value.given ? value.text : std::string());
    if (field->GetValue() != text && typed_ != &parameter) field->ChangeValue(text);
  };
  line->Add(field, wxSizerFlags(1).CenterVertical());
  if (parameter.kind != ParameterKind::kFile) return line;
  auto* browse =
      new wxButton(this, wxID_ANY, "...", wxDefaultPosition, wxDefaultSize, wxBU_EXACTFIT);
  browse->SetName(Label("Browse"));
  browse->Bind(wxEVT_BUTTON, [this, field, &parameter](wxCommandEvent&) {
    wxFileDialog dialog(wxGetTopLevelParent(this), NameOf(parameter), "", field->GetValue(), "*",
                        wxFD_OPEN | wxFD_FILE_MUST_EXIST);
    if (dialog.ShowModal() != wxID_OK) return;
    field->ChangeValue(dialog.GetPath());
    Change(parameter, Utf8(dialog.GetPath()), true);
  });
  line->Add(browse, wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(4)));
  return line;
}

void ParameterPanel::Change(const Parameter& parameter, const std::string& text, bool end) {
  if (showing_) return;
  typed_ = end ? nullptr : &parameter;
  const RecordedText wrong = events_.changed(parameter.name, text);
  typed_ = nullptr;
  problem_->SetLabel(wrong.empty() ? wxString()
                                   : Label("%1 %2.", NameOf(parameter), Shown(wrong.shown)));
  problem_->Wrap(GetClientSize().x);
  if (!wrong.empty()) LogEvent("edit-problem", parameter.name);
  FitInside();
  if (end) End();
}

}  // namespace fotomill::desktop
