#include "desktop/windows/setup/settings_panel.h"

#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/dataview.h>
#include <wx/gbsizer.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/statbox.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>

#include "catalog/history/file_history.h"
#include "desktop/models/setup/setup_help.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/setup/color_button.h"
#include "desktop/windows/setup/mask_list.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Device-independent pixels. The labels of all groups have the same width, so that controls are
// aligned.
constexpr int kLeastLabelWidth = 330;
const wxString kMark = wxString::FromUTF8("\xE2\x97\x8F");

enum Column { kMarkColumn, kLabelColumn, kControlColumn, kLimitsColumn };

wxArrayString FunctionNames() {
  wxArrayString names;
  for (int32_t function = 0; function < kFileFunctionCount; ++function)
    names.Add(Shown(Tr(FileFunctionName(function))));
  return names;
}

// The toolkit's field accepts any text and converts it to a number when it loses the focus.
void RefuseLetters(wxKeyEvent& event, bool negative) {
  const int key = event.GetKeyCode();
  const bool control = key < WXK_SPACE || key == WXK_DELETE || key >= WXK_START ||
                       event.ControlDown() || event.AltDown();
  if (control || (key >= '0' && key <= '9') || (negative && key == '-')) return event.Skip();
  wxBell();
}

wxWindow* MakeSpin(wxWindow* box, const KeyRow& row, wxWindowID id) {
  // The binding expects the range in this control.
  auto* range = new wxStaticText(box, id + static_cast<int>(kSpinRangeControl),
                                 Shown(SpinRangeText(SpinRangeOf(row))));
  range->Hide();
  const SpinRange limits = SpinRangeOf(row);
  auto* spin = new wxSpinCtrl(box, id, wxEmptyString, wxDefaultPosition, wxDefaultSize,
                              wxSP_ARROW_KEYS, limits.minimum, limits.maximum);
  const auto refuse = [negative = limits.minimum < 0](wxKeyEvent& event) {
    RefuseLetters(event, negative);
  };
  spin->Bind(wxEVT_CHAR, refuse);
  return spin;
}

wxWindow* MakeControl(wxWindow* box, const SetupItem& item) {
  const KeyRow& row = KeyOf(item.key);
  const auto id = static_cast<wxWindowID>(row.control);
  const wxString label = Label(item.label);
  if ((row.type & KEY_FLAG) != 0) return new wxCheckBox(box, id, label);
  if (IsFunctionMask(item.key)) return new MaskList(box, id, FunctionNames());
  if ((row.type & KEY_CHOICE) != 0) return new wxChoice(box, id);
  if ((row.type & KEY_COLOR) != 0) return new ColorButton(box, id, label);
  if ((row.type & KEY_SPIN) != 0) return MakeSpin(box, row, id);
  return new wxTextCtrl(box, id);
}

bool IsWide(const KeyRow& row) { return (row.type & (KEY_TEXT | KEY_CHOICE)) == KEY_TEXT; }

}  // namespace

SettingsPanel::SettingsPanel(wxWindow* parent, std::vector<SetupItem> items,
                             std::function<void()> changed,
                             const std::function<wxWindow*(wxWindow*)>& above)
    : wxScrolledWindow(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxVSCROLL | wxTAB_TRAVERSAL),
      items_(std::move(items)) {
  const int gap = FromDIP(8);
  labelWidth_ = FromDIP(kLeastLabelWidth);
  for (const SetupItem& item : items_) {
    const bool beside = (KeyOf(item.key).type & KEY_FLAG) == 0;
    if (beside)
      labelWidth_ = std::max(labelWidth_, GetTextExtent(Label(item.label)).x + FromDIP(4));
  }
  auto* column = new wxBoxSizer(wxVERTICAL);
  if (above) {
    wxWindow* const window = above(this);
    const bool list = dynamic_cast<wxDataViewCtrl*>(window) != nullptr;  // gets the remaining space
    column->Add(window, wxSizerFlags(list ? 1 : 0).Expand().Border(wxALL, gap));
  }
  const char* group = nullptr;
  wxStaticBoxSizer* box = nullptr;
  wxGridBagSizer* grid = nullptr;
  for (const SetupItem& item : items_) {
    if (group == nullptr || std::string_view(group) != item.group) {
      group = item.group;
      box = new wxStaticBoxSizer(wxVERTICAL, this, Label(group));
      grid = new wxGridBagSizer(FromDIP(6), FromDIP(6));
      grid->SetEmptyCellSize(wxSize(0, 0));
      box->Add(grid, wxSizerFlags().Expand().Border(wxALL, FromDIP(6)));
      column->Add(box, wxSizerFlags().Expand().Border(wxALL, gap));
    }
    AddItem(box->GetStaticBox(), grid, item);
  }
  SetSizer(column);
  SetScrollRate(0, FromDIP(12));
  for (const wxEventTypeTag<wxCommandEvent>& type :
       {wxEVT_CHECKBOX, wxEVT_CHOICE, wxEVT_TEXT, wxEVT_BUTTON, wxEVT_CHECKLISTBOX}) {
    Bind(type, [changed](wxCommandEvent& event) {
      NoteControlChanged(static_cast<uint32_t>(event.GetId()));
      changed();
      event.Skip();
    });
  }
  Bind(wxEVT_SPINCTRL, [changed](wxSpinEvent& event) {
    NoteControlChanged(static_cast<uint32_t>(event.GetId()));
    changed();
    event.Skip();
  });
}

void SettingsPanel::AddItem(wxWindow* box, wxSizer* sizer, const SetupItem& item) {
  auto* grid = static_cast<wxGridBagSizer*>(sizer);
  const KeyRow& row = KeyOf(item.key);
  const int line = grid->GetRows();
  auto* mark = new wxStaticText(box, wxID_ANY, kMark);
  mark->SetMinSize(FromDIP(wxSize(12, -1)));
  mark->SetToolTip(Label("Not the default."));
  marks_.push_back(mark);
  const wxString text = Label(item.label);
  const bool flag = (row.type & KEY_FLAG) != 0;
  wxStaticText* label = flag ? nullptr : new wxStaticText(box, wxID_ANY, text);
  wxWindow* control = MakeControl(box, item);
  control->SetName(text);
  control->SetToolTip(wxString::FromUTF8(ControlTip(row)));
  grid->Add(mark, {line, kMarkColumn}, {1, 1},
            wxALIGN_CENTER_VERTICAL | wxRESERVE_SPACE_EVEN_IF_HIDDEN);
  if (flag) {
    grid->Add(control, {line, kLabelColumn}, {1, 2}, wxALIGN_CENTER_VERTICAL);
    return;
  }
  label->SetMinSize(wxSize(labelWidth_, -1));
  const int middle = IsFunctionMask(item.key) ? wxALIGN_TOP : wxALIGN_CENTER_VERTICAL;
  grid->Add(label, {line, kLabelColumn}, {1, 1}, middle);
  control->SetMinSize(FromDIP(wxSize(IsWide(row) ? 240 : -1, IsFunctionMask(item.key) ? 170 : -1)));
  const bool limited = (row.type & KEY_SPIN) != 0;
  grid->Add(control, {line, kControlColumn}, {1, limited ? 1 : 2}, middle);
  if (limited) {
    auto* limits = new wxStaticText(box, wxID_ANY, wxString::FromUTF8(LimitsText(row)));
    limits->SetFont(FontOf(*limits, TextSize::Small));
    grid->Add(limits, {line, kLimitsColumn}, {1, 1}, middle);
  }
}

size_t SettingsPanel::UpdateMarks(const BoundControls& controls) {
  const RegistryDestinations destinations;
  size_t changed = 0;
  for (size_t i = 0; i < items_.size(); ++i) {
    const bool differs = !ShowsDefault(controls, destinations, KeyOf(items_[i].key));
    if (marks_[i]->IsShown() != differs) marks_[i]->Show(differs);
    changed += differs;
  }
  return changed;
}

std::vector<KeyRow> SettingsPanel::Rows() const {
  std::vector<KeyRow> rows;
  for (const SetupItem& item : items_) rows.push_back(KeyOf(item.key));
  return rows;
}

void BindSettingsHelp(wxWindow& window) {
  window.Bind(wxEVT_CHAR_HOOK, [&window](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_F1) return event.Skip();
    std::string_view page = kGeneralHelpPage;
    for (const wxWindow* focus = wxWindow::FindFocus();
         focus != nullptr && page == kGeneralHelpPage; focus = focus->GetParent()) {
      if (focus->GetId() > 0) page = HelpPageFor(static_cast<uint32_t>(focus->GetId()));
    }
    ShowHelp(window, page);
  });
}

}  // namespace fotomill::desktop
