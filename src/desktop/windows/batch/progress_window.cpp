#include "desktop/windows/batch/progress_window.h"

#include <wx/button.h>
#include <wx/clipbrd.h>
#include <wx/dcclient.h>
#include <wx/listbox.h>
#include <wx/panel.h>
#include <wx/settings.h>
#include <wx/stattext.h>
#include <wx/vlbox.h>

#include <algorithm>
#include <cmath>

#include "batch/new_job.h"
#include "core/choice_lists.h"
#include "core/text.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr double kTimeLeftAfter = 3;  // seconds
constexpr int kThumbnailSide = 48;
constexpr int kNewsMs = 40;  // what comes is gathered for so long

wxString TimeLeft(double seconds) {
  const long whole = std::lround(std::ceil(seconds));
  if (whole < 60) return ", " + Label("%1 s left", whole);
  return ", " + Label("%1 min left", (whole + 59) / 60);
}

}  // namespace

// Rows drawn here, with the thumbnail of each file.
class ProgressWindow::DrawnList : public wxVListBox {
 public:
  DrawnList(ProgressWindow& box, long style) : box_(box) {
    Create(box.panel_, kProgressListId, wxDefaultPosition, wxDefaultSize, style | wxBORDER_THEME,
           Label("Files"));
    SetItemCount(box.rows_.size());
  }

  void OnDrawItem(wxDC& dc, const wxRect& rect, size_t n) const override {
    const Row& row = box_.rows_[n];
    const int side = IsAboutFile(row) ? FromDIP(kThumbnailSide) : 0;
    int left = rect.x + FromDIP(6);
    if (box_.settings_.thumbnails && (side > 0 || box_.settings_.showMissingThumbnails)) {
      const ThumbnailPointer thumbnail = side > 0 ? box_.thumbnails_.FindAny(row.source) : nullptr;
      if (thumbnail != nullptr && thumbnail->status == Status::Ok)
        DrawThumbnail(dc, *thumbnail, wxRect(left, rect.y, side, rect.height));
      if (HasPicture(row) || box_.settings_.showMissingThumbnails)
        left += FromDIP(kThumbnailSide) + FromDIP(8);
    }
    const bool failed = row.line.item.status != Status::Ok && !row.line.item.skipped;
    wxColour text = wxSystemSettings::GetColour(IsSelected(n) ? wxSYS_COLOUR_HIGHLIGHTTEXT
                                                              : wxSYS_COLOUR_LISTBOXTEXT);
    if (failed && !IsSelected(n)) text = ToWx(CurrentPalette().fault);
    dc.SetTextForeground(text);
    dc.SetFont(GetFont());
    const wxRect place(left, rect.y, rect.GetRight() - left - FromDIP(4), rect.height);
    const auto cut = [&](const wxString& line) {
      return wxControl::Ellipsize(line, dc, wxELLIPSIZE_MIDDLE, place.width,
                                  wxELLIPSIZE_FLAGS_NONE);
    };
    // Tall rows have the name above and what became of the file below.
    const bool two = IsAboutFile(row) && rect.height >= 2 * GetCharHeight() + FromDIP(4) &&
                     row.line.text.starts_with(row.source);
    wxString label = cut(Shown(row.line.text));
    if (two) {
      std::string outcome = row.line.text.substr(row.source.size());
      outcome.erase(0, std::min(outcome.find_first_not_of(": "), outcome.size()));
      label = cut(Shown(platform::FileNameOf(row.source))) + "\n" + cut(Shown(outcome));
    }
    dc.DrawLabel(label, place, wxALIGN_CENTER_VERTICAL | wxALIGN_LEFT);
  }

  wxCoord OnMeasureItem(size_t n) const override {
    const int fixed = LayOutProgressBox(1, 1, box_.settings_).rowHeight;
    if (fixed > 0) return TextWidth(*this, fixed);
    const bool tall = box_.settings_.thumbnails && HasPicture(box_.rows_[n]);
    return tall ? FromDIP(kThumbnailSide + 6) : GetCharHeight() + FromDIP(8);
  }

 private:
  static bool IsAboutFile(const Row& row) { return row.line.item.file >= 0 && !row.source.empty(); }
  bool HasPicture(const Row& row) const {
    const ThumbnailPointer thumbnail =
        IsAboutFile(row) ? box_.thumbnails_.FindAny(row.source) : nullptr;
    return thumbnail != nullptr && thumbnail->status == Status::Ok;
  }
  void DrawThumbnail(wxDC& dc, const Thumbnail& thumbnail, const wxRect& place) const {
    const wxBitmap bitmap = BitmapOf(thumbnail.pixels, GetContentScaleFactor());
    const wxSize size = bitmap.GetSize();
    const double shrink =
        std::min(1.0, static_cast<double>(place.width) / std::max({size.x, size.y, 1}));
    const wxPoint corner(place.x + static_cast<int>((place.width - size.x * shrink) / 2),
                         place.y + static_cast<int>((place.height - size.y * shrink) / 2));
    dc.SetUserScale(shrink, shrink);
    dc.DrawBitmap(bitmap, static_cast<int>(corner.x / shrink), static_cast<int>(corner.y / shrink));
    dc.SetUserScale(1, 1);
  }

  ProgressWindow& box_;
};

// A plain list of texts.
class ProgressWindow::PlainList : public wxListBox {
 public:
  PlainList(ProgressWindow& box, long style)
      : wxListBox(box.panel_, kProgressListId, wxDefaultPosition, wxDefaultSize, 0, nullptr, style,
                  wxDefaultValidator, Label("Files")) {
    for (const Row& row : box.rows_) Append(Shown(row.line.text));
  }
};

ProgressWindow::ProgressWindow(wxWindow* frame, ThumbnailService& thumbnails, Events events)
    : wxFrame(frame, wxID_ANY, kProgressTitle, wxDefaultPosition, wxDefaultSize,
              wxCAPTION | wxRESIZE_BORDER | wxFRAME_FLOAT_ON_PARENT | wxFRAME_NO_TASKBAR,
              kProgressBoxClass),
      events_(std::move(events)),
      thumbnails_(thumbnails),
      settings_(ProgressSettingsFromSettings()),
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
    SetStatus(Tr("Stopping after the current files..."));
    events_.abort();
  });
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) { ShowNews(); });
  close_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.closed(*this); });
  copy_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { CopyList(); });
  select_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { events_.selectFailed(FailedFiles()); });
  panel_->Bind(wxEVT_SIZE, [this](wxSizeEvent& event) { LayOut(), event.Skip(); });
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    if (done_) events_.closed(*this);
  });
  Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
    if (event.CanVeto()) event.Veto();
    if (done_) events_.closed(*this);
  });
  const wxSize client = InUnits(frame->GetClientSize());
  const Rectangle place = ProgressBoxPlace(client.x, client.y, settings_);
  const wxRect pixels = InPixels(place);
  SetSize(pixels.GetSize());
  SetPosition(frame->ClientToScreen(pixels.GetPosition()));
  if (settings.ProgressRaiseAppWindow == 0) SetExtraStyle(GetExtraStyle() | wxWS_EX_BLOCK_EVENTS);
}

wxWindow* ProgressWindow::MakeList(bool scrollBar) {
  drawn_ = nullptr;
  plain_ = nullptr;
  const bool drawn = LayOutProgressBox(1, 1, settings_).kind != ProgressListKind::Plain;
  if (drawn) return drawn_ = new DrawnList(*this, scrollBar ? wxALWAYS_SHOW_SB : 0);
  return plain_ = new PlainList(*this, scrollBar ? wxLB_ALWAYS_SB : 0);
}

// The box's geometry is in pixels of a screen of the usual resolution, with texts of the usual
// size.
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
  // The bar takes the gap between list and status line.
  const int32_t under = layout.list.y + layout.list.height;
  put(bar_,
      {layout.list.x, under + 2, layout.list.width, std::max(layout.status.y - under - 4, 2)});
  // The buttons for files that failed take the place of the one that stops, as wide as their texts
  // if there is room.
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
  text_ = status;
  GatherNews();
}

void ProgressWindow::SetProgress(uint32_t done, uint32_t count) {
  fileDone_ = done;
  fileCount_ = count;
  GatherNews();
}

void ProgressWindow::SetWaiting(size_t batches) {
  waiting_ = batches;
  GatherNews();
}

void ProgressWindow::GatherNews() {
  if (!newsTimer_.IsRunning()) newsTimer_.StartOnce(kNewsMs);
}

void ProgressWindow::ShowNews() {
  if (drawn_ != nullptr && drawn_->GetItemCount() != rows_.size()) {
    drawn_->SetItemCount(rows_.size());
    drawn_->ScrollToRow(rows_.size() - 1);
    drawn_->Refresh();
  }
  if (plain_ != nullptr && plain_->GetCount() != rows_.size()) {
    for (size_t row = plain_->GetCount(); row < rows_.size(); ++row)
      plain_->Append(Shown(rows_[row].line.text));
    plain_->EnsureVisible(static_cast<int>(rows_.size()) - 1);
  }
  bar_->SetRange(static_cast<int>(std::max(fileCount_, 1u)));
  bar_->SetValue(static_cast<int>(fileDone_));
  const double passed = platform::MonotonicSeconds() - started_;
  const bool tells =
      passed >= kTimeLeftAfter && fileDone_ > 0 && fileDone_ < fileCount_ && abort_->IsEnabled();
  const wxString left =
      tells ? TimeLeft(passed / fileDone_ * (fileCount_ - fileDone_)) : wxString();
  const wxString waiting =
      waiting_ == 0 || done_
          ? wxString()
          : ", " + LabelCount("%1 batch is waiting", "%1 batches are waiting", waiting_);
  status_->SetLabel(Shown(text_) + left + waiting);
}

// The list is made anew with a scroll bar that always shows, at the same place and with the same
// rows in sight.
void ProgressWindow::StayOpen() {
  done_ = true;
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
  close_->SetFocus();
  LayOut();
}

std::vector<std::string> ProgressWindow::FailedFiles() const {
  std::vector<std::string> files;
  for (const Row& row : rows_) {
    if (row.line.item.status != Status::Ok && !row.line.item.skipped && !row.source.empty())
      files.push_back(row.source);
  }
  return files;
}

void ProgressWindow::CopyList() {
  wxString text;
  for (const Row& row : rows_) text += Shown(row.line.text) + "\n";
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(new wxTextDataObject(text))) wxBell();
}

}  // namespace fotomill::desktop
