#include "desktop/windows/dialogs/command_finder.h"

#include <wx/control.h>
#include <wx/dialog.h>
#include <wx/listbox.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>
#include <wx/tokenzr.h>

#include <vector>

#include "desktop/models/edit/quick_actions.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/quick_menu.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

wxString LineOf(const Command& command) {
  wxString line = wxControl::RemoveMnemonics(Label(command.menu)) + ": " +
                  wxControl::RemoveMnemonics(Label(command.text));
  if (const std::string key = KeyOf(command); !key.empty()) line += "    " + Shown(key);
  return line;
}

bool HoldsEveryWord(const wxString& text, const wxString& words) {
  wxStringTokenizer tokens(words.Lower(), " ");
  while (tokens.HasMoreTokens()) {
    if (!text.Lower().Contains(tokens.GetNextToken())) return false;
  }
  return true;
}

class FinderBox : public wxDialog {
 public:
  explicit FinderBox(wxWindow* parent)
      : wxDialog(parent, wxID_ANY, Label("Find command"), wxDefaultPosition, wxDefaultSize,
                 wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "FindCommandBox") {
    words_ = new wxTextCtrl(this, wxID_ANY, wxEmptyString, wxDefaultPosition,
                            FromDIP(wxSize(420, -1)), wxTE_PROCESS_ENTER);
    words_->SetHint(Label("Words of the command name"));
    words_->SetName(Label("Words of the command name"));
    list_ = new wxListBox(this, wxID_ANY, wxDefaultPosition, FromDIP(wxSize(420, 300)));
    list_->SetName(Label("Commands"));
    auto* column = new wxBoxSizer(wxVERTICAL);
    column->Add(words_, wxSizerFlags().Expand().Border(wxLEFT | wxTOP | wxRIGHT, FromDIP(10)));
    column->Add(list_, wxSizerFlags(1).Expand().Border(wxALL, FromDIP(10)));
    SetSizerAndFit(column);
    words_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { Fill(); });
    words_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { EndModal(wxID_OK); });
    list_->Bind(wxEVT_LISTBOX_DCLICK, [this](wxCommandEvent&) { EndModal(wxID_OK); });
    Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) { OnKey(event); });
    Fill();
    CentreOnParent();
    words_->SetFocus();
  }

  // The ID of the chosen command, wxID_NONE if nothing was found.
  int Chosen() const {
    const int line = list_->GetSelection();
    return line == wxNOT_FOUND ? wxID_NONE : found_[static_cast<size_t>(line)];
  }

 private:
  void Fill() {
    found_.clear();
    wxArrayString lines;
    const auto offer = [&](int id, const wxString& line, const wxString& help) {
      if (!HoldsEveryWord(line + " " + help, words_->GetValue())) return;
      found_.push_back(id);
      lines.Add(line);
    };
    for (const Command& command : Commands()) {
      if (command.text != nullptr) offer(CommandId(command), LineOf(command), Label(command.help));
    }
    int id = kFirstQuickId;
    for (const QuickAction& action : QuickActions()) {
      const wxString line = wxControl::RemoveMnemonics(Label("&Quick actions")) + ": " +
                            wxControl::RemoveMnemonics(Shown(action.text));
      offer(id, line + wxString::Format("    Ctrl+Alt+%d", id - kFirstQuickId + 1), "");
      ++id;
    }
    list_->Set(lines);
    if (!found_.empty()) list_->SetSelection(0);
    LogEvent("finder", "found=" + std::to_string(found_.size()));
  }

  // Arrow keys move the selection while the text field keeps the focus.
  void OnKey(wxKeyEvent& event) {
    const int step = event.GetKeyCode() == WXK_DOWN ? 1 : event.GetKeyCode() == WXK_UP ? -1 : 0;
    const bool enter = event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER;
    if (enter) return EndModal(wxID_OK);
    if (event.GetKeyCode() == WXK_ESCAPE) return EndModal(wxID_CANCEL);
    const int line = list_->GetSelection() + step;
    if (step == 0 || list_->HasFocus()) return event.Skip();
    if (line >= 0 && line < static_cast<int>(found_.size())) list_->SetSelection(line);
  }

  wxTextCtrl* words_ = nullptr;
  wxListBox* list_ = nullptr;
  std::vector<int> found_;  // IDs
};

}  // namespace

void FindCommand(Shell& shell) {
  FinderBox box(&shell.Window());
  if (box.ShowModal() != wxID_OK || box.Chosen() == wxID_NONE) return;
  // After the dialog is closed, so that the command applies to the frame.
  shell.Window().CallAfter([&shell, id = box.Chosen()] { shell.Window().ProcessCommand(id); });
}

}  // namespace fotomill::desktop
