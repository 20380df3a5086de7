#include "desktop/windows/pages/option_panel.h"

#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/gbsizer.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

OptionPanel::OptionPanel(wxWindow* parent, PageOrder& order, std::function<void()> changed)
    : wxScrolledWindow(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxVSCROLL | wxTAB_TRAVERSAL, "PageOptions"),
      order_(order),
      changed_(std::move(changed)) {
  SetScrollRate(0, FromDIP(10));
  auto* column = new wxBoxSizer(wxVERTICAL);
  grid_ = new wxGridBagSizer(FromDIP(6), FromDIP(8));
  column->Add(grid_, wxSizerFlags().Expand().Border(wxRIGHT, FromDIP(4)));
  problem_ = new wxStaticText(this, wxID_ANY, "");
  problem_->SetForegroundColour(FaultColor());
  column->Add(problem_, wxSizerFlags().Expand().Border(wxTOP, FromDIP(8)));
  SetSizer(column);
}

void OptionPanel::ShowKind() {
  shows_.clear();
  grid_->Clear(true);
  row_ = 0;
  AddHeading(Label(order_.Kind().label));
  for (const PageOption& option : order_.Kind().options) AddRow(option);
  if (order_.Kind().onPaper) {
    AddHeading(Label("Page"));
    for (const PageOption& option : SharedPageOptions()) AddRow(option);
  }
  if (!grid_->IsColGrowable(1)) grid_->AddGrowableCol(1);
  ShowValues();
  Layout();
  FitInside();
}

void OptionPanel::ShowValues() {
  showing_ = true;
  for (const auto& show : shows_) show();
  showing_ = false;
}

void OptionPanel::ShowProblem(const wxString& problem) {
  if (problem_->GetLabel() == problem) return;
  problem_->SetLabel(problem);
  problem_->Wrap(GetClientSize().x);
  Layout();
  FitInside();
  if (!problem.empty()) LogEvent("pages-problem", Utf8(problem));
}

void OptionPanel::AddHeading(const wxString& text) {
  const int above = row_ == 0 ? 0 : FromDIP(10);
  auto* heading = new wxStaticText(this, wxID_ANY, text);
  heading->SetFont(heading->GetFont().Bold());
  grid_->Add(heading, wxGBPosition(row_++, 0), wxGBSpan(1, 2), wxTOP, above);
}

void OptionPanel::AddRow(const PageOption& option) {
  if (option.kind == PageOptionKind::Flag) return AddFlag(option);
  const wxString name = Label(option.label);
  grid_->Add(new wxStaticText(this, wxID_ANY, name + ":"), wxGBPosition(row_, 0), wxGBSpan(1, 1),
             wxALIGN_CENTER_VERTICAL);
  std::function<void()> show;
  wxWindow* const control = NewControl(option, show);
  control->SetName(name);
  grid_->Add(control, wxGBPosition(row_++, 1), wxGBSpan(1, 1), wxEXPAND);
  shows_.push_back(std::move(show));
}

void OptionPanel::AddFlag(const PageOption& option) {
  auto* box =
      new wxCheckBox(this, wxID_ANY, Label(option.label != nullptr ? option.label : option.help));
  box->Bind(wxEVT_CHECKBOX, [this, box, &option](wxCommandEvent&) {
    Change(option, box->GetValue() ? "yes" : "");
  });
  grid_->Add(box, wxGBPosition(row_++, 0), wxGBSpan(1, 2));
  shows_.push_back([this, box, &option] { box->SetValue(!order_.ValueOf(option).empty()); });
}

wxWindow* OptionPanel::NewControl(const PageOption& option, std::function<void()>& show) {
  switch (option.kind) {
    case PageOptionKind::Number: return NewNumber(option, show);
    case PageOptionKind::Choice: return NewChoice(option, show);
    default: return NewText(option, show);
  }
}

wxWindow* OptionPanel::NewNumber(const PageOption& option, std::function<void()>& show) {
  auto* field = new wxSpinCtrl(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                               wxSP_ARROW_KEYS, option.least, option.most);
  field->SetMinSize(wxSize(TextWidth(*this, FromDIP(110)), -1));
  field->Bind(wxEVT_SPINCTRL, [this, field, &option](wxSpinEvent&) {
    Change(option, std::to_string(field->GetValue()));
  });
  show = [this, field, &option] { field->SetValue(Shown(order_.ValueOf(option))); };
  return field;
}

wxWindow* OptionPanel::NewChoice(const PageOption& option, std::function<void()>& show) {
  auto* list = new wxChoice(this, wxID_ANY);
  for (const char* const label : option.choiceLabels) list->Append(Label(label));
  list->Bind(wxEVT_CHOICE, [this, list, &option](wxCommandEvent&) {
    Change(option, option.choices.begin()[list->GetSelection()]);
  });
  show = [this, list, &option] {
    const auto* const place = std::ranges::find(option.choices, order_.ValueOf(option));
    list->SetSelection(
        place == option.choices.end() ? 0 : static_cast<int>(place - option.choices.begin()));
  };
  return list;
}

wxWindow* OptionPanel::NewText(const PageOption& option, std::function<void()>& show) {
  wxTextEntry* entry = nullptr;
  wxWindow* field = nullptr;
  if (option.examples != nullptr) {
    wxArrayString examples;
    for (const std::string& example : option.examples()) examples.Add(Shown(example));
    auto* box = new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, examples);
    box->Bind(wxEVT_COMBOBOX,
              [this, box, &option](wxCommandEvent&) { Change(option, Utf8(box->GetValue())); });
    entry = box;
    field = box;
  } else {
    auto* text = new wxTextCtrl(this, wxID_ANY);
    entry = text;
    field = text;
  }
  field->SetMinSize(wxSize(TextWidth(*this, FromDIP(110)), -1));
  if (*option.hint != '\0') entry->SetHint(option.hint);
  field->Bind(wxEVT_TEXT,
              [this, entry, &option](wxCommandEvent&) { Change(option, Utf8(entry->GetValue())); });
  show = [this, entry, &option] {
    const wxString text = Shown(order_.ValueOf(option));
    if (entry->GetValue() != text) entry->ChangeValue(text);
  };
  return field;
}

void OptionPanel::Change(const PageOption& option, const std::string& value) {
  if (!showing_ && order_.Set(option, value)) changed_();
}

}  // namespace fotomill::desktop
