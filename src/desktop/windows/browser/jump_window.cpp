#include "desktop/windows/browser/jump_window.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/dialog.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>
#include <wx/weakref.h>

#include <algorithm>

#include "core/choice_lists.h"
#include "desktop/models/browser/jump_search.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/browser_page.h"
#include "desktop/windows/browser/thumbnail_canvas.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// The views of the list, by their numbers in the choice control; details are shown as a list.
constexpr struct {
  int32_t mode;
  const char* name;
} kViews[] = {
    {choice::kViewList, TrLater("Names")},
    {choice::kViewSmall, TrLater("Small thumbnails")},
    {choice::kViewNormal, TrLater("Normal thumbnails")},
    {choice::kViewLarge, TrLater("Large thumbnails")},
};

class JumpWindow : public wxDialog {
 public:
  JumpWindow(wxWindow& parent, BrowserPage& browser, ThumbnailService& thumbnails);
  ~JumpWindow() override;

 private:
  void BuildField();
  void BuildCanvas();
  void BuildOptions();
  void Step(int lines);
  void Search();
  void Follow();
  void Jump();

  const wxWeakRef<BrowserPage> browser_;  // null once its folder is gone
  ThumbnailService& thumbnails_;
  BrowserModel model_;  // the matching files
  wxSearchCtrl* text_ = nullptr;
  ThumbnailCanvas* canvas_ = nullptr;
  wxCheckBox* atStart_ = nullptr;
  wxCheckBox* phrase_ = nullptr;
  wxCheckBox* follow_ = nullptr;
  wxChoice* view_ = nullptr;
  wxStaticText* count_ = nullptr;
  wxButton* jump_ = nullptr;
};

JumpWindow::JumpWindow(wxWindow& parent, BrowserPage& browser, ThumbnailService& thumbnails)
    : wxDialog(&parent, wxID_ANY, Label("Jump to File"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "JumpBox"),
      browser_(&browser),
      thumbnails_(thumbnails) {
  const int gap = FromDIP(10);
  FolderView view = browser.Model().View();
  view.modes.view = settings.JumpWindowViewMode;
  if (view.modes.view == choice::kViewDetails) view.modes.view = choice::kViewList;
  model_.SetFolder(browser.Model().Folder());
  model_.SetView(view);
  SetSizer(new wxBoxSizer(wxVERTICAL));
  BuildField();
  BuildCanvas();
  BuildOptions();
  count_ = new wxStaticText(this, wxID_ANY, "");
  GetSizer()->Add(count_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  jump_ = new wxButton(this, wxID_OK, Label("&Jump"));
  GetSizer()->Add(BuildAnswerRow(*this, *jump_), wxSizerFlags().Expand().Border(wxALL, gap));
  jump_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Jump(); });
  GetSizer()->SetSizeHints(this);
  CentreOnParent();
  thumbnails_.SetListener([this](const std::vector<ThumbnailLoader::Result>& results) {
    canvas_->ThumbnailsCame(results);
  });
  text_->SetFocus();
  text_->SelectAll();
  Search();
}

JumpWindow::~JumpWindow() {
  settings.JumpWindowSearchTerm.AssignCut(Utf8(text_->GetValue()));
  settings.JumpWindowSearchStart = atStart_->GetValue() ? 1 : 0;
  settings.JumpWindowSearchPhrase = phrase_->GetValue() ? 1 : 0;
  settings.JumpWindowUseScroll = follow_->GetValue() ? 1 : 0;
  settings.JumpWindowViewMode = kViews[view_->GetSelection()].mode;
  (void)SaveConfiguration();
  if (browser_) browser_->Activated();  // thumbnails are for the browser again
}

void JumpWindow::BuildField() {
  text_ = new wxSearchCtrl(this, wxID_ANY, Shown(settings.JumpWindowSearchTerm.view()),
                           wxDefaultPosition, wxDefaultSize, wxTE_PROCESS_ENTER);
  text_->SetName(Label("Name"));
  text_->SetDescriptiveText(Label("Part of the name"));
  text_->ShowCancelButton(true);
  text_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { Search(); });
  text_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { Jump(); });
  text_->Bind(wxEVT_SEARCH, [this](wxCommandEvent&) { Jump(); });
  text_->Bind(wxEVT_SEARCH_CANCEL, [this](wxCommandEvent&) { text_->Clear(); });
  text_->Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    const int key = event.GetKeyCode();
    if (key != WXK_DOWN && key != WXK_UP) return event.Skip();
    Step(key == WXK_DOWN ? 1 : -1);
  });
  GetSizer()->Add(text_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10)));
}

void JumpWindow::BuildCanvas() {
  ThumbnailCanvas::Events events;
  events.selectionChanged = [this] { Follow(); };
  events.activated = [this](size_t) { Jump(); };
  events.contextMenu = [](size_t, const wxPoint&) {};
  events.dragBegins = [] {};
  events.resize = [](int) {};
  canvas_ = new ThumbnailCanvas(this, model_, thumbnails_, events);
  canvas_->SetMinSize(wxSize(TextWidth(*this, 560), FromDIP(300)));
  GetSizer()->Add(canvas_, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10)));
}

void JumpWindow::BuildOptions() {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  const auto box = [&](const char* label, bool on) {
    auto* check = new wxCheckBox(this, wxID_ANY, Label(label));
    check->SetValue(on);
    check->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { Search(); });
    row->Add(check, wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(14)));
    return check;
  };
  atStart_ = box(TrLater("Start of &words"), settings.JumpWindowSearchStart != 0);
  phrase_ = box(TrLater("Whole &phrase"), settings.JumpWindowSearchPhrase != 0);
  follow_ = box(TrLater("&Scroll the folder"), settings.JumpWindowUseScroll != 0);
  atStart_->SetToolTip(Label("Finds the text at the start of words, not within them."));
  phrase_->SetToolTip(Label("Finds the text as a whole, not each of its words."));
  follow_->SetToolTip(Label("Shows each match in the folder's own list as well."));
  view_ = new wxChoice(this, wxID_ANY);
  view_->SetName(Label("View"));
  for (const auto& view : kViews) {
    view_->Append(Label(view.name));
    if (view.mode == model_.Modes().view)
      view_->SetSelection(static_cast<int>(view_->GetCount()) - 1);
  }
  view_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) {
    FolderView view = model_.View();
    view.modes.view = kViews[view_->GetSelection()].mode;
    model_.SetView(view);
    canvas_->ModelChanged();
    canvas_->ShowLine(model_.Selected().Focus());
  });
  row->AddStretchSpacer();
  row->Add(view_, wxSizerFlags().CenterVertical());
  GetSizer()->Add(row, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10)));
}

void JumpWindow::Step(int lines) {
  const size_t count = model_.LineCount(), focus = model_.Selected().Focus();
  if (count == 0) return;
  const auto last = static_cast<ptrdiff_t>(count) - 1;
  const ptrdiff_t line = focus == kNoLine ? 0 : static_cast<ptrdiff_t>(focus) + lines;
  model_.Selected().SelectOnly(static_cast<size_t>(std::clamp<ptrdiff_t>(line, 0, last)));
  canvas_->ShowLine(model_.Selected().Focus());
  canvas_->Refresh();
  Follow();
}

void JumpWindow::Search() {
  const JumpRules rules{atStart_->GetValue(), phrase_->GetValue()};
  model_.SetItems(browser_ ? JumpTargets(browser_->Model(), Utf8(text_->GetValue()), rules)
                           : std::vector<FolderItem>());
  if (model_.LineCount() > 0) model_.Selected().SelectOnly(0);
  canvas_->ScrollTo(0);
  canvas_->ModelChanged();
  count_->SetLabel(
      wxString::FromUTF8(TrGroupedCount("%1 match", "%1 matches", model_.LineCount())));
  jump_->Enable(model_.LineCount() > 0);
  Follow();
}

// Shows the match in the browser.
void JumpWindow::Follow() {
  const size_t focus = model_.Selected().Focus();
  LogEvent("jump", std::to_string(model_.LineCount()) + " " +
                       (focus == kNoLine ? std::string("-") : model_.Line(focus).name));
  if (focus != kNoLine && follow_->GetValue() && browser_)
    browser_->ShowInList(model_.Line(focus).name);
}

void JumpWindow::Jump() {
  const size_t focus = model_.Selected().Focus();
  if (focus == kNoLine) return wxBell();
  if (!IsModal()) return;  // Enter is reported twice
  const std::string name = model_.Line(focus).name;
  if (browser_) browser_->FocusName(name);
  EndModal(wxID_OK);
}

}  // namespace

void JumpToFile(wxWindow& parent, BrowserPage& browser, ThumbnailService& thumbnails) {
  JumpWindow window(parent, browser, thumbnails);
  LogEvent("prompt", "jump");
  window.ShowModal();
}

}  // namespace fotomill::desktop
