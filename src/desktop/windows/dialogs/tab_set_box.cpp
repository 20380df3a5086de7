#include "desktop/windows/dialogs/tab_set_box.h"

#include <wx/button.h>
#include <wx/dialog.h>
#include <wx/listbox.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textdlg.h>

#include <vector>

#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/tab_sets.h"
#include "desktop/windows/widgets/wx_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = TrLater("Tab sets");

bool Confirm(wxWindow& parent, const wxString& question, const wxString& verb) {
  wxMessageDialog dialog(&parent, question, Label(kTitle),
                         wxOK | wxCANCEL | wxCANCEL_DEFAULT | wxICON_WARNING);
  dialog.SetOKLabel("&" + verb);
  LogEvent("prompt", "tab-set");
  return dialog.ShowModal() == wxID_OK;
}

// The list of tab sets with buttons to open and delete.
class TabSetBox : public wxDialog {
 public:
  explicit TabSetBox(wxWindow& parent)
      : wxDialog(&parent, wxID_ANY, Label(kTitle), wxDefaultPosition, wxDefaultSize,
                 wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "TabSetBox") {
    const int gap = FromDIP(10);
    auto* sizer = new wxBoxSizer(wxVERTICAL);
    sizer->Add(new wxStaticText(this, wxID_ANY, Label("&Tab sets:")),
               wxSizerFlags().Border(wxLEFT | wxRIGHT | wxTOP, gap));
    list_ = new wxListBox(this, wxID_ANY, wxDefaultPosition, FromDIP(wxSize(320, 200)), 0, nullptr,
                          wxLB_SINGLE, wxDefaultValidator, Label("Tab sets"));
    sizer->Add(list_, wxSizerFlags(1).Expand().Border(wxALL, gap));
    auto* row = new wxBoxSizer(wxHORIZONTAL);
    delete_ = new wxButton(this, wxID_DELETE, Label("&Delete..."));
    open_ = new wxButton(this, wxID_OK, Label("&Open"));
    row->Add(delete_);
    row->AddStretchSpacer();
    row->Add(new wxButton(this, wxID_CANCEL, Label("Close")), wxSizerFlags().Border(wxRIGHT, gap));
    row->Add(open_);
    sizer->Add(row, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, gap));
    SetSizerAndFit(sizer);
    CentreOnParent();
    open_->SetDefault();
    list_->Bind(wxEVT_LISTBOX, [this](wxCommandEvent&) { UpdateControls(); });
    list_->Bind(wxEVT_LISTBOX_DCLICK, [this](wxCommandEvent&) { EndModal(wxID_OK); });
    delete_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { DeleteChosen(); });
    Refill();
    list_->SetFocus();
  }

  std::string Chosen() const {
    const int line = list_->GetSelection();
    return line == wxNOT_FOUND ? std::string() : names_[static_cast<size_t>(line)];
  }

 private:
  void Refill() {
    names_ = TabSetNames();
    list_->Clear();
    for (const std::string& name : names_)
      list_->Append(name == CurrentTabSet() ? Label("%1 (in use)", Shown(name)) : Shown(name));
    if (!names_.empty()) list_->SetSelection(0);
    UpdateControls();
  }
  void UpdateControls() {
    const std::string chosen = Chosen();
    open_->Enable(!chosen.empty());
    delete_->Enable(!chosen.empty() && chosen != CurrentTabSet());
  }
  void DeleteChosen() {
    const std::string chosen = Chosen();
    if (!Confirm(*this,
                 Label("Delete the tab set \"%1\"? The folders are not deleted.", Shown(chosen)),
                 Label("Delete")))
      return;
    if (!DeleteTabSet(chosen))
      wxMessageBox(Label("The tab set could not be deleted."), Label(kTitle), wxOK | wxICON_WARNING,
                   this);
    Refill();
  }

  wxListBox* list_ = nullptr;
  wxButton* open_ = nullptr;
  wxButton* delete_ = nullptr;
  std::vector<std::string> names_;
};

}  // namespace

std::optional<std::string> AskForTabSetName(wxWindow& parent) {
  wxTextEntryDialog dialog(&parent, Label("Name of the tab set:"), Label("Save tabs"),
                           Shown(CurrentTabSet()));
  LogEvent("prompt", "tab-set-name");
  while (dialog.ShowModal() == wxID_OK) {
    const std::string name = Utf8(dialog.GetValue());
    if (TabSetFile(name).empty()) {
      wxMessageBox(Label("This name cannot be used."), Label("Save tabs"), wxOK | wxICON_WARNING,
                   &parent);
      continue;
    }
    const bool other = name != CurrentTabSet() && HasTabSet(name);
    if (!other ||
        Confirm(parent, Label("The tab set \"%1\" already exists. Replace it?", Shown(name)),
                Label("Replace")))
      return name;
  }
  return std::nullopt;
}

std::optional<std::string> ChooseTabSet(wxWindow& parent) {
  TabSetBox box(parent);
  LogEvent("prompt", "tab-sets");
  if (box.ShowModal() != wxID_OK || box.Chosen().empty()) return std::nullopt;
  return box.Chosen();
}

}  // namespace fotomill::desktop
