#include "desktop/windows/batch/progress_window.h"

#include <wx/button.h>
#include <wx/clipbrd.h>
#include <wx/listbox.h>
#include <wx/panel.h>
#include <wx/stattext.h>

#include <algorithm>
#include <utility>

#include "batch/new_job.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/batch/notification.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kNewsMs = 40;  // updates are collected for this long

}  // namespace

// A plain list of texts.
class ProgressWindow::PlainList : public wxListBox {
 public:
  PlainList(ProgressWindow& box, long style)
      : wxListBox(box.panel_, kProgressListId, wxDefaultPosition, wxDefaultSize, 0, nullptr,
                  style | wxLB_HSCROLL, wxDefaultValidator, Label("Files")) {
    for (const ProgressRow& row : box.rows_) Append(Shown(row.line.text));
  }
};

ProgressWindow::ProgressWindow(wxWindow* frame, ThumbnailService& thumbnails, Events events)
    : wxFrame(frame, wxID_ANY, kProgressTitle, wxDefaultPosition, wxDefaultSize,
              wxCAPTION | wxRESIZE_BORDER | wxFRAME_FLOAT_ON_PARENT | wxFRAME_NO_TASKBAR,
              kProgressBoxClass),
      events_(std::move(events)),
      settings_(ProgressSettingsFromSettings()),
      thumbnails_(thumbnails, settings_.showMissingThumbnails,
                  [this] {
                    if (drawn_ != nullptr) drawn_->ShowNewThumbnails();
                  }),
      started_(platform::MonotonicSeconds()),
      newsTimer_(this) {
  panel_ = new wxPanel(this);
  list_ = MakeList(false);
  status_ = new wxStaticText(panel_, kProgressStatusId, "", wxDefaultPosition, wxDefaultSize,
                             wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_END);
  bar_ = new wxGauge(panel_, wxID_ANY, 1, wxDefaultPosition, wxDefaultSize,
                     wxGA_HORIZONTAL | wxGA_SMOOTH, wxDefaultValidator,
                     Label("Progress of the batch"));
  abort_ = new wxButton(panel_, kProgressAbortId, Label("&Abort"));
  close_ = new wxButton(panel_, kProgressCloseId, Label("&Close"));
  close_->Disable();
  copy_ = new wxButton(panel_, wxID_ANY, Label("C&opy list"));
  select_ = new wxButton(panel_, wxID_ANY, Label("&Select failed"));
  copy_->Hide();
  select_->Hide();
  abort_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    abort_->Disable();
    facts_.stopping = true;
    GatherNews();
    events_.abort();
  });
  Bind(wxEVT_ACTIVATE, [this](wxActivateEvent& event) {
    event.Skip();
    if (event.GetActive() && std::exchange(focusesClose_, false)) close_->SetFocus();
  });
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) { ShowNews(); });
  close_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.closed(*this); });
  copy_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { CopyList(); });
  select_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.selectFailed(FailedFiles()); });
  panel_->Bind(wxEVT_SIZE, [this](wxSizeEvent& event) { LayOut(), event.Skip(); });
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    if (facts_.ended) events_.closed(*this);
  });
  Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
    if (event.CanVeto()) event.Veto();
    if (facts_.ended) events_.closed(*this);
  });
  const wxSize client = InUnits(frame->GetClientSize());
  const Rectangle place = ProgressBoxPlace(client.x, client.y, settings_);
  const wxRect pixels = InPixels(place);
  SetSize(pixels.GetSize());
  SetPosition(frame->ClientToScreen(pixels.GetPosition()));
}

wxWindow* ProgressWindow::MakeList(bool scrollBar) {
  drawn_ = nullptr;
  plain_ = nullptr;
  const bool drawn = LayOutProgressBox(1, 1, settings_).kind != ProgressListKind::Plain;
  if (drawn)
    return drawn_ = new ProgressList(panel_, rows_, thumbnails_, settings_,
                                     scrollBar ? wxALWAYS_SHOW_SB : 0);
  return plain_ = new PlainList(*this, scrollBar ? wxLB_ALWAYS_SB : 0);
}

// The box's geometry is in pixels at standard resolution and text size.
wxSize ProgressWindow::InUnits(const wxSize& pixels) const {
  return ToDIP(pixels) / TextScale(*this);
}

wxRect ProgressWindow::InPixels(const Rectangle& units) const {
  const auto pixels = [this](int32_t length) { return TextWidth(*this, length); };
  return {pixels(units.x), pixels(units.y), pixels(units.width), pixels(units.height)};
}

void ProgressWindow::LayOut() {
  const wxSize client = InUnits(panel_->GetClientSize());
  const ProgressLayout layout = LayOutProgressBox(client.x, client.y, settings_);
  const auto put = [this](wxWindow* window, const Rectangle& place) {
    window->SetSize(InPixels(place));
  };
  put(list_, layout.list);
  put(status_, layout.status);
  put(abort_, layout.abort);
  put(close_, layout.close);
  // The bar is between list and status line.
  const int32_t under = layout.list.y + layout.list.height;
  put(bar_,
      {layout.list.x, under + 2, layout.list.width, std::max(layout.status.y - under - 4, 2)});
  // The buttons for failed files replace the stop button, as wide as their labels if there is room.
  const int gap = 4, room = layout.close.x - layout.list.x - 2 * gap;
  const int copy = InUnits(copy_->GetBestSize()).x, select = InUnits(select_->GetBestSize()).x;
  const int copyWidth = copy + select <= room ? copy : std::max(room * copy / (copy + select), 1);
  const int selectWidth = copy + select <= room ? select : std::max(room - copyWidth, 1);
  put(copy_, {layout.list.x, layout.abort.y, copyWidth, layout.abort.height});
  put(select_, {layout.list.x + copyWidth + gap, layout.close.y, selectWidth, layout.close.height});
}

int ProgressWindow::FirstVisible() const {
  return drawn_ != nullptr ? static_cast<int>(drawn_->GetVisibleRowsBegin()) : plain_->GetTopItem();
}

void ProgressWindow::ShowFrom(int row, int selected) {
  if (drawn_ != nullptr) {
    drawn_->ScrollToRow(static_cast<size_t>(std::max(row, 0)));
    drawn_->SetSelection(selected);
  } else {
    plain_->SetFirstItem(std::max(row, 0));
    plain_->SetSelection(selected);
  }
}

void ProgressWindow::AddLine(const ProgressLine& line, const std::string& source) {
  rows_.push_back({line, source});
  GatherNews();
}

void ProgressWindow::SetStatus(const std::string& status) {
  facts_.status = status;
  GatherNews();
}

void ProgressWindow::SetWork(const ProgressWork& work) {
  facts_.work = work;
  GatherNews();
}

void ProgressWindow::SetWaiting(size_t batches) {
  facts_.waiting = batches;
  GatherNews();
}

void ProgressWindow::GatherNews() {
  if (!newsTimer_.IsRunning()) newsTimer_.StartOnce(kNewsMs);
}

void ProgressWindow::ShowNews() {
  if (drawn_ != nullptr) drawn_->ShowNewRows();
  if (plain_ != nullptr && plain_->GetCount() != rows_.size()) {
    for (size_t row = plain_->GetCount(); row < rows_.size(); ++row)
      plain_->Append(Shown(rows_[row].line.text));
    plain_->EnsureVisible(static_cast<int>(rows_.size()) - 1);
  }
  bar_->SetRange(static_cast<int>(std::max(facts_.work.count, 1u)));
  bar_->SetValue(static_cast<int>(facts_.work.done));
  facts_.seconds = platform::MonotonicSeconds() - started_;
  const std::string line = ProgressStatusLine(facts_);
  if (shownLine_ == line) return;
  shownLine_ = line;
  LogEvent("progress-status", line);
  status_->SetLabel(Shown(line));
}

// Recreates the list with a permanent scroll bar, at the same position and showing the same rows.
void ProgressWindow::StayOpen(const std::string& status) {
  facts_.ended = true;
  facts_.status = status;
  newsTimer_.Stop();
  ShowNews();
  const int first = FirstVisible();
  wxWindow* old = list_;
  const wxRect place = old->GetRect();
  const wxFont font = old->GetFont();
  list_ = MakeList(true);
  old->Destroy();
  list_->SetFont(font);
  list_->SetSize(place);
  ShowFrom(first, static_cast<int>(rows_.size()) - 1);
  abort_->Disable();
  close_->Enable();
  if (!FailedFiles().empty()) {
    abort_->Hide();
    copy_->Show();
    select_->Show();
  }
  bar_->SetValue(bar_->GetRange());
  // otherwise the toolkit would take the focus from another program
  focusesClose_ = !InFront();
  if (!focusesClose_) close_->SetFocus();
  LayOut();
}

std::vector<std::string> ProgressWindow::FailedFiles() const {
  std::vector<std::string> files;
  for (const ProgressRow& row : rows_) {
    if (row.IsFailure() && !row.source.empty()) files.push_back(row.source);
  }
  return files;
}

void ProgressWindow::CopyList() {
  wxString text;
  for (const ProgressRow& row : rows_) text += Shown(row.line.text) + "\n";
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(new wxTextDataObject(text))) wxBell();
}

}  // namespace fotomill::desktop
