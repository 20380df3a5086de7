#include "desktop/windows/browser/path_bar.h"

#include <wx/bmpbuttn.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>

#include <algorithm>
#include <vector>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/browser/folder_trail.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/crumb_strip.h"
#include "desktop/windows/browser/folder_menu.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

// "~" at the start means the home folder.
std::string FolderTyped(std::string typed) {
  if (typed.starts_with('~'))
    typed.replace(0, 1, platform::SpecialFolderPath(platform::SpecialFolder::Home));
  return platform::AbsolutePath(typed);
}

}  // namespace

PathBar::PathBar(wxWindow* parent, const FolderTrail& trail, Events events)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "Path"),
      trail_(trail),
      events_(std::move(events)) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const int gap = FromDIP(4);
  const auto button = [&](const char* symbol, const wxString& tip, auto run) {
    auto* made = new wxBitmapButton(this, wxID_ANY, Symbol(symbol), wxDefaultPosition,
                                    wxDefaultSize, wxBORDER_NONE, wxDefaultValidator, tip);
    made->SetToolTip(tip);
    made->Bind(wxEVT_BUTTON, [run](wxCommandEvent&) { run(); });
    made->Bind(wxEVT_SYS_COLOUR_CHANGED, [made, symbol](wxSysColourChangedEvent& event) {
      made->SetBitmap(Symbol(symbol));
      event.Skip();
    });
    row->Add(made, wxSizerFlags().CenterVertical().Border(wxLEFT, gap));
    return made;
  };
  back_ = button("back", Label("Back"), [this] { events_.step(-1); });
  forward_ = button("forward", Label("Forward"), [this] { events_.step(1); });
  button("up", Label("Parent folder"), [this] { events_.up(); });
  back_->Bind(wxEVT_CONTEXT_MENU, [this](wxContextMenuEvent&) { OfferSteps(*back_, -1); });
  forward_->Bind(wxEVT_CONTEXT_MENU, [this](wxContextMenuEvent&) { OfferSteps(*forward_, 1); });
  crumbs_ = new CrumbStrip(this, {events_.open, [this] { Edit(); }});
  row->Add(crumbs_, wxSizerFlags(1).Expand().Border(wxALL, gap));
  BuildEdit();
  row->Add(edit_, wxSizerFlags(1).CenterVertical().Border(wxALL, gap));
  SetSizer(row);
}

void PathBar::BuildEdit() {
  edit_ = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxTE_PROCESS_ENTER,
                         wxDefaultValidator, Label("Folder"));
  edit_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { ReadNames(); });
  edit_->Hide();
  edit_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { OpenTyped(); });
  edit_->Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() == WXK_DOWN) return ShowCompletion(1);
    if (event.GetKeyCode() == WXK_UP) return ShowCompletion(-1);
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    ShowEdit(false);
    events_.left();
  });
  edit_->Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) {
    CallAfter([this] {
      if (!edit_->HasFocus()) ShowEdit(false);
    });
    event.Skip();
  });
}

void PathBar::ShowFolder(const std::string& folder) {
  folder_ = folder;
  // A disabled button would lose the focus.
  if ((back_->HasFocus() && !trail_.CanStep(-1)) || (forward_->HasFocus() && !trail_.CanStep(1)))
    events_.left();
  back_->Enable(trail_.CanStep(-1));
  forward_->Enable(trail_.CanStep(1));
  crumbs_->ShowFolder(folder);
  ShowEdit(false);
}

void PathBar::Edit() {
  edit_->ChangeValue(Shown(folder_));
  ShowEdit(true);
  edit_->SetFocus();
  edit_->SelectAll();
  namesOf_.clear();
  typedLength_ = edit_->GetValue().length();
  ReadNames();
}

// Reads the folders for completion in the background, since the file system may hang.
void PathBar::ReadNames() {
  const std::string above(platform::SplitPath(Utf8(edit_->GetValue())).folder);
  if (above.empty() || above == namesOf_) return CallAfter([this] { CompleteTyped(); });
  namesOf_ = above;
  names_.clear();
  reading_.Start([this, above](const StopToken&, const LooseWork::Report& report) {
    report([this, names = SubfolderNames(FolderTyped(above))] {
      names_ = names;
      LogEvent("completions", std::to_string(names.size()));
      CompleteTyped();
    });
  });
}

// The field's text without the completion.
wxString PathBar::Typed() const {
  long from = 0, to = 0;
  edit_->GetSelection(&from, &to);
  const bool completed = from != to && to == edit_->GetLastPosition();
  return completed ? edit_->GetValue().Left(static_cast<size_t>(from)) : edit_->GetValue();
}

// Completes the text if it was extended at its end.
void PathBar::CompleteTyped() {
  const wxString typed = Typed();
  const bool longer =
      typed.length() > typedLength_ && edit_->GetInsertionPoint() == edit_->GetLastPosition();
  typedLength_ = typed.length();
  if (longer && typed == edit_->GetValue()) ShowCompletion(0);
}

// Appends a completion, selected, so that further typing replaces it. `step` goes to the next one.
void PathBar::ShowCompletion(int step) {
  const wxString typed = Typed();
  const std::vector<std::string> paths = Completions(Utf8(typed), names_);
  if (paths.empty()) return;
  const int count = static_cast<int>(paths.size());
  const auto shown = std::ranges::find(paths, Utf8(edit_->GetValue()));
  const int place =
      shown == paths.end() ? 0 : (static_cast<int>(shown - paths.begin()) + step + count) % count;
  edit_->ChangeValue(wxString::FromUTF8(paths[static_cast<size_t>(place)]));
  edit_->SetSelection(static_cast<long>(typed.length()), -1);
}

void PathBar::ShowEdit(bool show) {
  if (edit_->IsShown() == show) return;
  crumbs_->Show(!show);
  edit_->Show(show);
  Layout();
}

// Completes the name of a folder first. Whether the folder exists is found out by listing it.
void PathBar::OpenTyped() {
  if (edit_->IsEmpty()) return;
  ShowCompletion(0);
  ShowEdit(false);
  events_.open(FolderTyped(Utf8(edit_->GetValue())));
}

// Nearest first.
void PathBar::OfferSteps(wxWindow& button, int direction) {
  std::vector<Crumb> folders;
  for (int steps = direction; trail_.CanStep(steps); steps += direction) {
    folders.push_back({trail_.FolderAt(steps), trail_.FolderAt(steps)});
  }
  const auto chosen = ChooseFolderFromMenu(button, folders, {});
  if (chosen) events_.step(direction * (static_cast<int>(*chosen) + 1));
}

// Latest first, with the current one checked.
void PathBar::OfferTrail() {
  int last = 0;
  while (trail_.CanStep(last + 1)) ++last;
  std::vector<Crumb> folders;
  for (int steps = last; trail_.CanStep(steps); --steps)
    folders.push_back({trail_.FolderAt(steps), trail_.FolderAt(steps)});
  const auto chosen = ChooseFolderFromMenu(*back_, folders, folder_);
  if (chosen && last != static_cast<int>(*chosen)) events_.step(last - static_cast<int>(*chosen));
}

}  // namespace fotomill::desktop
