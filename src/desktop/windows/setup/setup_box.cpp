#include "desktop/windows/setup/setup_box.h"

#include <wx/app.h>
#include <wx/button.h>
#include <wx/filedlg.h>
#include <wx/listbox.h>
#include <wx/msgdlg.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/utils.h>

#include <algorithm>

#include "core/data_folder.h"
#include "desktop/models/setup/configuration_transfer.h"
#include "desktop/models/setup/setup_help.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/setup/format_list.h"
#include "desktop/windows/setup/keys_panel.h"
#include "desktop/windows/setup/language_panel.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "settings/configuration.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kSetupTitle = TrLater("Setup");
constexpr const char* kTransferFiles = TrLater("Settings (*.ini)|*.ini|All files|*");

// Settings never change during a batch. False, after showing a message, if one is running.
bool MayChangeSettings(wxWindow& window) {
  auto* const shell = dynamic_cast<Shell*>(wxTheApp->GetTopWindow());
  if (shell == nullptr || !shell->Batches().Running()) return true;
  wxMessageBox(
      Label("A batch is running with the current settings. Change them when it has finished."),
      Label(kSetupTitle), wxOK | wxICON_INFORMATION, &window);
  return false;
}

// Saves the values of the controls. False, after showing a message, if one of them is invalid.
bool ReadSettings(wxWindow& window, const BoundControls& controls,
                  const std::function<void(uint32_t)>& show, bool& changed) {
  const RegistryDestinations destinations;
  if (!MayChangeSettings(window)) return false;
  if (const auto fault = ReadSetupDialog(controls, destinations)) {
    show(fault->control);
    wxMessageBox(Shown(fault->message), Label(kSetupTitle), wxOK | wxICON_WARNING, &window);
    if (wxWindow* control = controls.Find(fault->control)) control->SetFocus();
    return false;
  }
  const SaveResult saved = SaveConfiguration();
  changed = saved != SaveResult::Unchanged;
  if (const std::string message = Tr(SaveMessage(saved)); !message.empty()) {
    wxMessageBox(Shown(message) + " " + Label("The settings apply until the program exits."),
                 Label(kSetupTitle), wxOK | wxICON_WARNING, &window);
  }
  return true;
}

}  // namespace

SetupBox::SetupBox(wxWindow* parent, std::vector<KeyedCommand> commands,
                   std::function<void()> applied, SetupPage first)
    : wxDialog(parent, wxID_ANY, Label(kSetupTitle), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "SetupBox"),
      applied_(std::move(applied)),
      controls_(*this),
      page_(first) {
  const int gap = FromDIP(10);
  search_ =
      new wxSearchCtrl(this, wxID_ANY, wxEmptyString, wxDefaultPosition, FromDIP(wxSize(230, -1)));
  search_->SetDescriptiveText(Label("Search settings"));
  search_->ShowCancelButton(true);
  search_->SetName(Label("Search settings"));
  list_ = new wxListBox(this, wxID_ANY, wxDefaultPosition, wxDefaultSize, 0, nullptr, wxLB_SINGLE);
  list_->SetName(Label("Pages"));
  title_ = new wxStaticText(this, wxID_ANY, Label(TitleOf(first)));
  title_->SetFont(title_->GetFont().Bold().Scaled(1.3f));
  auto* left = new wxBoxSizer(wxVERTICAL);
  left->Add(search_, wxSizerFlags().Expand());
  left->Add(list_, wxSizerFlags(1).Expand().Border(wxTOP, gap));
  auto* right = new wxBoxSizer(wxVERTICAL);
  right->Add(title_, wxSizerFlags().Border(wxLEFT, FromDIP(8)));
  BuildPages(*right, std::move(commands));
  auto* middle = new wxBoxSizer(wxHORIZONTAL);
  middle->Add(left, wxSizerFlags().Expand().Border(wxALL, gap));
  middle->Add(right, wxSizerFlags(1).Expand().Border(wxTOP | wxRIGHT | wxBOTTOM, gap));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(middle, wxSizerFlags(1).Expand());
  column->Add(BuildButtons(), wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, gap));
  SetSizer(column);
  SetMinSize(FromDIP(wxSize(760, 420)));

  FillSetupDialog(controls_, destinations_);
  // Wide enough for the longest choice on any page, in any language: all are shown still.
  const int pages =
      ClientToWindowSize(column->CalcMin()).x + wxSystemSettings::GetMetric(wxSYS_VSCROLL_X, this);
  SetSize(std::max(TextWidth(*this, 980), pages), TextWidth(*this, 680));
  TakeSetupChanged();
  ControlChanged();
  ShowPages();
  ShowPage(first);
  search_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { ShowPages(); });
  search_->Bind(wxEVT_SEARCH, [this](wxCommandEvent&) { ChooseLine(true); });
  search_->Bind(wxEVT_SEARCH_CANCEL, [this](wxCommandEvent&) { search_->Clear(); });
  list_->Bind(wxEVT_LISTBOX, [this](wxCommandEvent&) { ChooseLine(false); });
  list_->Bind(wxEVT_SET_FOCUS, [](wxFocusEvent& event) {
    LogEvent("setup", "list has the keyboard");
    event.Skip();
  });
  list_->Bind(wxEVT_LISTBOX_DCLICK, [this](wxCommandEvent&) { ChooseLine(true); });
  BindSettingsHelp(*this);
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != 'F' || event.GetModifiers() != wxMOD_CONTROL) return event.Skip();
    search_->SetFocus();
    LogEvent("setup", "search");
  });
  CentreOnParent();
  list_->SetFocus();
}

// --- pages ---

// One panel below the other, of which one at a time is shown. (A wxSimplebook takes the keyboard
// from the search field when it turns a page.)
void SetupBox::BuildPages(wxSizer& column, std::vector<KeyedCommand> commands) {
  for (size_t page = 0; page < kSetupPageCount; ++page) {
    std::function<wxWindow*(wxWindow*)> above;
    if (static_cast<SetupPage>(page) == SetupPage::Formats) {
      above = [](wxWindow* parent) -> wxWindow* { return new FormatList(parent); };
    }
    if (static_cast<SetupPage>(page) == SetupPage::Browsing) {
      above = [this](wxWindow* parent) -> wxWindow* {
        return language_ = new LanguagePanel(parent);
      };
    }
    if (static_cast<SetupPage>(page) == SetupPage::Keyboard) {
      above = [this, &commands](wxWindow* parent) -> wxWindow* {
        return keys_ = new KeysPanel(parent, std::move(commands));
      };
    }
    auto* panel = new SettingsPanel(
        this, ItemsOf(static_cast<SetupPage>(page)), [this] { ControlChanged(); }, above);
    column.Add(panel, wxSizerFlags(1).Expand());
    panels_.push_back(panel);
  }
}

SettingsPanel& SetupBox::Panel() const { return *panels_[static_cast<size_t>(page_)]; }

void SetupBox::ShowPages() {
  const std::string words = Utf8(search_->GetValue());
  searching_ = words.find_first_not_of(' ') != std::string::npos;
  found_ = FindSettings(words);
  wxArrayString lines;
  if (searching_) {
    for (const SetupItem& item : found_) lines.Add(Label(item.group) + ": " + Label(item.label));
  } else {
    for (size_t page = 0; page < kSetupPageCount; ++page)
      lines.Add(Label(TitleOf(static_cast<SetupPage>(page))));
  }
  list_->Set(lines);
  if (searching_ && !found_.empty()) {
    list_->SetSelection(0);
    ChooseLine(false);
  }
  if (!searching_) list_->SetSelection(static_cast<int>(page_));
}

void SetupBox::ChooseLine(bool focus) {
  const int line = list_->GetSelection();
  if (line == wxNOT_FOUND) return;
  if (!searching_) return ShowPage(static_cast<SetupPage>(line));
  const SetupItem& item = found_[static_cast<size_t>(line)];
  ShowPage(item.page);
  wxWindow* const control = controls_.Find(KeyOf(item.key).control);
  if (control == nullptr) return;
  SettingsPanel& panel = Panel();
  const wxPoint place =
      panel.CalcUnscrolledPosition(panel.ScreenToClient(control->GetScreenPosition()));
  int unused = 0, step = 1;
  panel.GetScrollPixelsPerUnit(&unused, &step);
  panel.Scroll(-1, std::max(place.y - FromDIP(60), 0) / std::max(step, 1));
  if (focus) control->SetFocus();
}

void SetupBox::ShowPage(SetupPage page) {
  page_ = page;
  for (SettingsPanel* panel : panels_) panel->Show(panel == &Panel());
  Layout();
  title_->SetLabel(Label(TitleOf(page)));
  if (!searching_) list_->SetSelection(static_cast<int>(page));
  LogEvent("setup",
           std::string("page=") + TitleOf(page) + " found=" + std::to_string(found_.size()));
}

void SetupBox::ControlChanged() {
  for (SettingsPanel* panel : panels_) panel->UpdateMarks(controls_);
}

// --- buttons ---

wxSizer* SetupBox::BuildButtons() {
  struct Button {
    const char* label;
    const char* tip;
    void (SetupBox::*run)();
  };
  static constexpr Button kButtons[] = {
      {TrLater("&Reset page"), TrLater("Resets every setting of this page. Nothing is saved before OK or Apply."),
       &SetupBox::ResetPage},
      {TrLater("&Import..."), TrLater("Reads settings from a file."), &SetupBox::Import},
      {TrLater("&Export..."), TrLater("Writes the saved settings to a file."), &SetupBox::Export},
      {TrLater("Open &data folder"), TrLater("Opens the folder of the settings, the file history and the global thumbnail database."),
       &SetupBox::OpenDataFolder},
  };
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  for (const Button& button : kButtons) {
    auto* control = new wxButton(this, wxID_ANY, Label(button.label));
    control->SetToolTip(Label(button.tip));
    control->Bind(wxEVT_BUTTON, [this, run = button.run](wxCommandEvent&) { (this->*run)(); });
    row->Add(control, wxSizerFlags().Border(wxRIGHT, FromDIP(6)));
  }
  row->AddStretchSpacer();
  row->Add(CreateButtonSizer(wxOK | wxCANCEL | wxAPPLY | wxHELP), wxSizerFlags());
  Bind(
      wxEVT_BUTTON,
      [this](wxCommandEvent&) {
        if (Apply()) EndModal(wxID_OK);
      },
      wxID_OK);
  Bind(
      wxEVT_BUTTON, [this](wxCommandEvent&) { (void)Apply(); }, wxID_APPLY);
  Bind(
      wxEVT_BUTTON,
      [this](wxCommandEvent&) {
        ShowHelp(*this, page_ == SetupPage::Formats ? kFormatsTopic : kGeneralHelpPage);
      },
      wxID_HELP);
  return row;
}

bool SetupBox::Apply() {
  bool changed = false;
  const auto show = [this](uint32_t control) {
    const KeyRow* const row = FindKeyOfControl(control);
    for (const SetupItem& item : SetupItems()) {
      if (&KeyOf(item.key) == row) ShowPage(item.page);
    }
  };
  if (!ReadSettings(*this, controls_, show, changed)) return false;
  language_->Store();
  changed = keys_->Store() || changed;
  if (TakeSetupChanged() || changed) applied_();
  LogEvent("setup", changed ? "applied changed=1" : "applied changed=0");
  return true;
}

void SetupBox::ResetPage() {
  if (page_ == SetupPage::Keyboard) keys_->Reset();
  FillSetupDialog(controls_, destinations_, Panel().Rows(), SetupValues::Default);
  for (const SetupItem& item : Panel().Items()) NoteControlChanged(KeyOf(item.key).control);
  ControlChanged();
  LogEvent("setup", "reset");
}

void SetupBox::Import() {
  if (!MayChangeSettings(*this)) return;
  wxFileDialog dialog(this, Label("Import settings"), wxEmptyString, wxEmptyString,
                      Label(kTransferFiles), wxFD_OPEN | wxFD_FILE_MUST_EXIST);
  if (dialog.ShowModal() != wxID_OK) return;
  const Transfer transfer = ImportConfiguration(Utf8(dialog.GetPath()));
  FillSetupDialog(controls_, destinations_);
  ControlChanged();
  if (transfer.ok) applied_();
  Report(transfer.ok, transfer.message);
}

void SetupBox::Export() {
  wxFileDialog dialog(this, Label("Export settings"), wxEmptyString, "Fotomill settings.ini",
                      Label(kTransferFiles), wxFD_SAVE | wxFD_OVERWRITE_PROMPT);
  if (dialog.ShowModal() != wxID_OK) return;
  const Transfer transfer = ExportConfiguration(Utf8(dialog.GetPath()));
  Report(transfer.ok, transfer.message);
}

void SetupBox::OpenDataFolder() {
  const std::string& folder = DataFolder();
  if (folder.empty() || !platform::MakeFolders(folder))
    return Report(false, Tr("There is no data folder, and it could not be created."));
  if (!wxLaunchDefaultApplication(wxString::FromUTF8(folder))) {
    Report(false, Tr("No program was found to open the folder \"%1\".", folder));
  }
}

void SetupBox::Report(bool ok, const std::string& message) {
  wxMessageBox(Shown(message), Label(kSetupTitle),
               wxOK | (ok ? wxICON_INFORMATION : wxICON_WARNING), this);
}

// --- a few settings ---

bool ShowSettingsBox(wxWindow* parent, const wxString& title, const wxString& name,
                     const std::vector<SetupItem>& items) {
  wxDialog dialog(parent, wxID_ANY, title, wxDefaultPosition, wxDefaultSize,
                  wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, name);
  BoundControls controls(dialog);
  const RegistryDestinations destinations;
  SettingsPanel* panel = nullptr;
  panel = new SettingsPanel(&dialog, items, [&] {
    if (panel != nullptr) panel->UpdateMarks(controls);
  });
  FillSetupDialog(controls, destinations);
  panel->UpdateMarks(controls);
  auto* reset = new wxButton(&dialog, wxID_ANY, Label("&Reset"));
  reset->SetToolTip(Label("Resets all of these settings."));
  reset->Bind(wxEVT_BUTTON, [&](wxCommandEvent&) {
    FillSetupDialog(controls, destinations, panel->Rows(), SetupValues::Default);
    panel->UpdateMarks(controls);
  });
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  buttons->Add(reset);
  buttons->AddStretchSpacer();
  buttons->Add(dialog.CreateButtonSizer(wxOK | wxCANCEL));
  auto* column = new wxBoxSizer(wxVERTICAL);
  panel->SetMinSize(panel->GetSizer()->GetMinSize() + dialog.FromDIP(wxSize(20, 4)));
  column->Add(panel, wxSizerFlags(1).Expand());
  column->Add(buttons, wxSizerFlags().Expand().Border(wxALL, dialog.FromDIP(10)));
  dialog.SetSizerAndFit(column);
  dialog.Bind(
      wxEVT_BUTTON,
      [&](wxCommandEvent&) {
        bool changed = false;
        if (ReadSettings(
                dialog, controls, [](uint32_t) {}, changed))
          dialog.EndModal(wxID_OK);
      },
      wxID_OK);
  BindSettingsHelp(dialog);
  dialog.CentreOnParent();
  LogEvent("settings", std::string("box=") + Utf8(name));
  return dialog.ShowModal() == wxID_OK;
}

}  // namespace fotomill::desktop
