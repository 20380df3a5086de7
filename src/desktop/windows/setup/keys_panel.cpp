#include "desktop/windows/setup/keys_panel.h"

#include <wx/accel.h>
#include <wx/button.h>
#include <wx/listctrl.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <algorithm>
#include <iterator>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

// Whether it is a modifier or a lock, or a key that accelerators have no name for, such as letters
// outside ASCII and media keys.
bool CannotBeNamed(int key) {
  constexpr int kWithoutMeaning[] = {WXK_NONE, WXK_SHIFT,   WXK_CONTROL,      WXK_ALT,
                                     WXK_CAPITAL, WXK_NUMLOCK, WXK_SCROLL, WXK_WINDOWS_LEFT,
                                     WXK_WINDOWS_RIGHT};
  return std::ranges::find(kWithoutMeaning, key) != std::end(kWithoutMeaning) ||
         (key > WXK_DELETE && key < WXK_START) || key > WXK_WINDOWS_MENU;
}

// A pressed key in the notation of the commands; empty if it cannot be one.
std::string KeyText(const wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (CannotBeNamed(key)) return {};
  int flags = 0;
  if (event.ControlDown()) flags |= wxACCEL_CTRL;
  if (event.AltDown()) flags |= wxACCEL_ALT;
  if (event.ShiftDown()) flags |= wxACCEL_SHIFT;
  std::string text = Utf8(wxAcceleratorEntry(flags, key).ToRawString());
  for (size_t at = text.find('-'); at != std::string::npos && at + 1 < text.size();
       at = text.find('-', at + 1))
    text[at] = '+';
  return text;
}

}  // namespace

KeysPanel::KeysPanel(wxWindow* parent, std::vector<KeyedCommand> commands)
    : wxPanel(parent), commands_(std::move(commands)), keys_(UserKeys()) {
  const int gap = FromDIP(6);
  list_ = new wxListView(this, wxID_ANY, wxDefaultPosition, FromDIP(wxSize(520, 440)),
                         wxLC_REPORT | wxLC_SINGLE_SEL);
  list_->SetName(Label("Commands"));
  list_->AppendColumn(Label("Command"), wxLIST_FORMAT_LEFT, TextWidth(*this, 330));
  list_->AppendColumn(Label("Key"), wxLIST_FORMAT_LEFT, TextWidth(*this, 160));
  for (size_t i = 0; i < commands_.size(); ++i)
    list_->InsertItem(static_cast<long>(i), Shown(commands_[i].label));
  field_ = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(160, -1)),
                          wxTE_PROCESS_ENTER | wxTE_PROCESS_TAB);
  field_->SetName(Label("New key"));
  field_->SetHint(Label("Press a key"));
  assign_ = new wxButton(this, wxID_ANY, Label("A&ssign"));
  auto* remove = new wxButton(this, wxID_ANY, Label("Re&move"));
  auto* builtIn = new wxButton(this, wxID_ANY, Label("De&fault"));
  note_ = new wxStaticText(this, wxID_ANY, " ");
  note_->SetForegroundColour(FaultColor());
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("&New key:")), wxSizerFlags().CenterVertical());
  row->Add(field_, wxSizerFlags(1).CenterVertical().Border(wxLEFT | wxRIGHT, gap));
  for (wxButton* button : {assign_, remove, builtIn})
    row->Add(button, wxSizerFlags().CenterVertical().Border(wxLEFT, gap));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(list_, wxSizerFlags(1).Expand());
  column->Add(row, wxSizerFlags().Expand().Border(wxTOP, gap));
  column->Add(note_, wxSizerFlags().Expand().Border(wxTOP, gap));
  SetSizer(column);
  list_->Bind(wxEVT_LIST_ITEM_SELECTED, [this](wxListEvent&) { ShowCommand(); });
  field_->Bind(wxEVT_KEY_DOWN, &KeysPanel::Pressed, this);
  field_->Bind(wxEVT_CHAR, [](wxKeyEvent&) {});  // nothing is typed
  assign_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    list_->SetFocus();  // the button is about to be disabled: the keyboard would have no window
    Assign(false);
  });
  remove->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    pressed_.clear();
    Assign(false);
  });
  builtIn->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Assign(true); });
  ShowKeys();
  list_->Select(0);
}

const KeyedCommand& KeysPanel::Command() const {
  return commands_[static_cast<size_t>(std::max(list_->GetFirstSelected(), 0L))];
}

void KeysPanel::ShowKeys() {
  for (size_t i = 0; i < commands_.size(); ++i) {
    const auto line = static_cast<long>(i);
    const wxString key = Shown(keys_.KeyOf(commands_[i]));
    if (list_->GetItemText(line, 1) != key) list_->SetItem(line, 1, key);
    wxFont font = list_->GetFont();
    if (!keys_.IsBuiltIn(commands_[i])) font.MakeBold();
    list_->SetItemFont(line, font);
  }
  ShowCommand();
}

void KeysPanel::ShowCommand() { ShowPressed(keys_.KeyOf(Command())); }

// Tab and Escape keep their meaning in the dialog.
void KeysPanel::Pressed(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if ((key == WXK_TAB || key == WXK_ESCAPE) && !event.ControlDown() && !event.AltDown()) {
    if (key == WXK_ESCAPE) return event.Skip();
    Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                               : wxNavigationKeyEvent::IsForward);
    return;
  }
  if (const std::string text = KeyText(event); !text.empty()) ShowPressed(text);
}

void KeysPanel::ShowPressed(const std::string& key) {
  pressed_ = key;
  field_->ChangeValue(Shown(key));
  const KeyedCommand* const other = keys_.Conflict(commands_, Command(), key);
  const bool allowed = key.empty() || MayBeKey(key);
  note_->SetLabel(!allowed ? Label("Use this key with Ctrl or Alt.")
                  : other != nullptr
                      ? Label("%1 is the key of \"%2\", which would lose it.", Shown(key),
                              Shown(other->label))
                      : wxString(" "));
  assign_->Enable(allowed && key != keys_.KeyOf(Command()));
  LogEvent("setup-key", key + (other != nullptr ? " conflict=" + other->name : std::string()));
}

void KeysPanel::Assign(bool builtIn) {
  const KeyedCommand& command = Command();
  keys_.Assign(commands_, command, builtIn ? command.builtIn : pressed_);
  ShowKeys();
}

bool KeysPanel::Store() {
  if (keys_ == UserKeys()) return false;
  UserKeys() = keys_;
  if (!keys_.Save())
    wxMessageBox(Label("The keys could not be saved; they apply until the program exits."),
                 Label("Setup"), wxOK | wxICON_WARNING, this);
  return true;
}

void KeysPanel::Reset() {
  keys_ = KeyMap();
  ShowKeys();
}

}  // namespace fotomill::desktop
