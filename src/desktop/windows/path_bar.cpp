#include "desktop/windows/path_bar.h"

#include <wx/bmpbuttn.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>
#include <wx/utils.h>

#include "desktop/windows/bitmaps.h"
#include "desktop/windows/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"

namespace fotomill::desktop {

PathBar::PathBar(wxWindow* parent, Events events)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE, "Path"),
      events_(std::move(events)) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const int gap = FromDIP(4);
  const auto button = [&](const char* symbol, const char* tip, auto run) {
    auto* made = new wxBitmapButton(this, wxID_ANY, Symbol(symbol), wxDefaultPosition, wxDefaultSize, wxBORDER_NONE,
                                    wxDefaultValidator, tip);
    made->SetToolTip(tip);
    made->Bind(wxEVT_BUTTON, [run](wxCommandEvent&) { run(); });
    row->Add(made, wxSizerFlags().CenterVertical().Border(wxLEFT, gap));
  };
  button("back", "Back", [this] { events_.step(-1); });
  button("forward", "Forward", [this] { events_.step(1); });
  button("up", "Parent folder", [this] { events_.up(); });
  path_ = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxTE_PROCESS_ENTER, wxDefaultValidator, "Folder");
  path_->AutoCompleteDirectories();
  path_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { TakeTyped(); });
  path_->Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    ShowFolder(folder_);
    events_.left();
  });
  row->Add(path_, wxSizerFlags(1).CenterVertical().Border(wxALL, gap));
  SetSizer(row);
}

void PathBar::ShowFolder(const std::string& folder) {
  folder_ = folder;
  path_->ChangeValue(Shown(folder));
}

void PathBar::Edit() {
  path_->SetFocus();
  path_->SelectAll();
}

void PathBar::TakeTyped() {
  std::string folder = Utf8(path_->GetValue());
  if (folder.starts_with('~')) folder.replace(0, 1, Utf8(wxGetHomeDir()));
  folder = platform::AbsolutePath(folder);
  if (!platform::IsFolder(folder)) return wxBell();
  events_.open(folder);
}

}  // namespace fotomill::desktop
