#include "desktop/windows/dialogs/module_options_box.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>

#include "desktop/windows/widgets/wx_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

ModuleOptionsBox::ModuleOptionsBox(wxWindow* parent, const ModuleFacts& facts,
                                   const ModuleOptionValues& values)
    : wxDialog(parent, wxID_ANY, Label("Options of %1", Shown(facts.textA)), wxDefaultPosition,
               wxDefaultSize, wxDEFAULT_DIALOG_STYLE, "ModuleOptionsBox") {
  const int gap = FromDIP(10);
  auto* rows = new wxFlexGridSizer(2, wxSize(gap, gap));
  for (size_t i = 0; i < facts.options.size(); ++i) AddOption(*rows, facts.options[i], values[i]);
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  auto* standard = new wxButton(this, wxID_DEFAULT, Label("&Defaults"));
  buttons->Add(standard);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL), wxSizerFlags().Border(wxLEFT, gap));
  auto* accept = new wxButton(this, wxID_OK);
  buttons->Add(accept, wxSizerFlags().Border(wxLEFT, gap));
  accept->SetDefault();
  standard->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    for (size_t i = 0; i < setters_.size(); ++i) setters_[i](standards_[i]);
  });
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(rows, wxSizerFlags(1).Expand().Border(wxALL, gap));
  column->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizerAndFit(column);
  CentreOnParent();
}

void ModuleOptionsBox::AddOption(wxSizer& rows, const ModuleOption& option, int32_t value) {
  const wxString label = Shown(option.label);
  standards_.push_back(option.standard);
  if (option.kind == FMW_OPTION_SWITCH) {
    auto* box = new wxCheckBox(this, wxID_ANY, label);
    box->SetValue(value != 0);
    rows.AddStretchSpacer();
    rows.Add(box);
    readers_.push_back([box] { return box->GetValue() ? 1 : 0; });
    setters_.push_back([box](int32_t number) { box->SetValue(number != 0); });
    return;
  }
  rows.Add(new wxStaticText(this, wxID_ANY, label + ":"), wxSizerFlags().CenterVertical());
  if (option.kind == FMW_OPTION_CHOICE) {
    auto* list = new wxChoice(this, wxID_ANY);
    for (const std::string& choice : option.choices) list->Append(Shown(choice));
    list->SetSelection(value);
    list->SetName(label);
    rows.Add(list);
    readers_.push_back([list] { return list->GetSelection(); });
    setters_.push_back([list](int32_t number) { list->SetSelection(number); });
    return;
  }
  auto* number = new wxSpinCtrl(this, wxID_ANY, wxEmptyString, wxDefaultPosition, wxDefaultSize,
                                wxSP_ARROW_KEYS, option.least, option.most, value);
  number->SetName(label);
  rows.Add(number);
  readers_.push_back([number] { return number->GetValue(); });
  setters_.push_back([number](int32_t to) { number->SetValue(to); });
}

std::vector<int32_t> ModuleOptionsBox::Values() const {
  std::vector<int32_t> values;
  for (const auto& read : readers_) values.push_back(read());
  return values;
}

}  // namespace fotomill::desktop
