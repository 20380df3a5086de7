#include "desktop/windows/browser/thumbnail_canvas.h"

#include <wx/settings.h>

#include <algorithm>
#include <cmath>
#include <unordered_set>

#include "core/choice_lists.h"
#include "desktop/models/browser/thumbnail_side.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/thumbnails/line_request.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kListWidth = 240;       // line width in the list of names
constexpr double kTypingPause = 1.0;  // seconds until typing starts over
constexpr size_t kPrecache = 256;     // thumbnails requested beyond nearby ones
constexpr size_t kScreensKept = 4;    // of thumbnails in memory, however large they are

bool OpensMenu(const wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  return key == WXK_WINDOWS_MENU || key == WXK_MENU || (key == WXK_F10 && event.ShiftDown());
}

}  // namespace

ThumbnailCanvas::ThumbnailCanvas(wxWindow* parent, BrowserModel& model,
                                 ThumbnailService& thumbnails, Events events)
    : model_(model),
      thumbnails_(thumbnails),
      events_(std::move(events)),
      bandTimer_(this),
      tip_(*this),
      editor_(*this) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  Create(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
         wxVSCROLL | wxWANTS_CHARS | wxBORDER_NONE, Label("Thumbnails"));
  SetLabel("Files of the folder");
  Bind(wxEVT_PAINT, &ThumbnailCanvas::OnPaint, this);
  Bind(wxEVT_SIZE, &ThumbnailCanvas::OnSize, this);
  for (const auto& type :
       {wxEVT_SCROLLWIN_TOP, wxEVT_SCROLLWIN_BOTTOM, wxEVT_SCROLLWIN_LINEUP, wxEVT_SCROLLWIN_LINEDOWN, wxEVT_SCROLLWIN_PAGEUP,
        wxEVT_SCROLLWIN_PAGEDOWN, wxEVT_SCROLLWIN_THUMBTRACK, wxEVT_SCROLLWIN_THUMBRELEASE}) {
    Bind(type, &ThumbnailCanvas::OnScroll, this);
  }
  Bind(wxEVT_MOUSEWHEEL, &ThumbnailCanvas::OnWheel, this);
  Bind(wxEVT_LEFT_DOWN, &ThumbnailCanvas::OnMouseDown, this);
  Bind(wxEVT_LEFT_UP, &ThumbnailCanvas::OnMouseUp, this);
  Bind(wxEVT_MOTION, &ThumbnailCanvas::OnMouseMove, this);
  Bind(wxEVT_LEAVE_WINDOW, [this](wxMouseEvent& event) { UpdateTip(kNoLine), event.Skip(); });
  Bind(wxEVT_LEFT_DCLICK, &ThumbnailCanvas::OnDoubleClick, this);
  Bind(wxEVT_RIGHT_DOWN, &ThumbnailCanvas::OnRightDown, this);
  Bind(wxEVT_KEY_DOWN, &ThumbnailCanvas::OnKey, this);
  Bind(wxEVT_CHAR, &ThumbnailCanvas::OnChar, this);
  Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) {
    pressed_.reset();
    banding_ = false;
  });
  Bind(wxEVT_SET_FOCUS, [this](wxFocusEvent& event) { Refresh(), event.Skip(); });
  Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) { Refresh(), event.Skip(); });
  Bind(wxEVT_SYS_COLOUR_CHANGED,
       [this](wxSysColourChangedEvent& event) { Refresh(), event.Skip(); });
  Bind(wxEVT_DPI_CHANGED, [this](wxDPIChangedEvent& event) { ModelChanged(), event.Skip(); });
  // Continues scrolling while the rubber band is beyond the edge.
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
    const wxPoint mouse = ScreenToClient(wxGetMousePosition());
    const int beyond = mouse.y < 0 ? mouse.y : std::max(mouse.y - GetClientSize().y, 0);
    if (banding_ && beyond != 0) ScrollTo(scroll_ + beyond);
  });
  restTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
    resting_ = true;
    WantThumbnails();
  });
  aheadTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { CutNamesAhead(); });
  MeasureCells();
}

bool ThumbnailCanvas::ListsNames() const { return model_.Modes().view == choice::kViewList; }

void ThumbnailCanvas::MeasureCells() {
  SetFont(wxSystemSettings::GetFont(wxSYS_DEFAULT_GUI_FONT));
  const bool large = model_.Modes().view == choice::kViewLarge;
  SetFont(FontOf(*this, large ? TextSize::LargeThumbnailName : TextSize::ThumbnailName));
  textHeight_ = GetCharHeight();
  const int padding = FromDIP(kPadding);
  if (ListsNames()) {
    square_ = 0;
    layout_.SetCells(TextWidth(*this, kListWidth), textHeight_ + padding, FromDIP(2));
  } else {
    square_ = FromDIP(SideInView(model_.Modes().view, settings.ThumbnailSide));
    const int width = std::max(square_ + 4 * padding, TextWidth(*this, 96));
    layout_.SetCells(width, square_ + textHeight_ + 3 * padding, FromDIP(4));
  }
  layout_.SetCount(model_.LineCount());
  std::vector<size_t> firstLines;
  for (const LineGroup& group : model_.Groups()) firstLines.push_back(group.first);
  layout_.SetGroups(std::move(firstLines), textHeight_ + 3 * padding);
  layout_.SetWindow(GetClientSize().x, GetClientSize().y);
}

void ThumbnailCanvas::ModelChanged() {
  restored_.reset();
  MeasureCells();
  scroll_ = std::clamp<int64_t>(scroll_, 0, layout_.LargestScroll());
  KeepEditing();
  UpdateScrollbar();
  WaitForRest();
  WantThumbnails();
  ReportFocus();
  Refresh();
}

// Thumbnails that nobody has asked for wait until nothing has moved for a while.
void ThumbnailCanvas::WaitForRest() {
  const int delay = std::max(settings.BrowserThumbnailPrecacheDelay, 0);
  resting_ = delay == 0;
  if (!resting_) restTimer_.StartOnce(delay);
}

void ThumbnailCanvas::UpdateScrollbar() {
  SetScrollbar(wxVERTICAL, static_cast<int>(scroll_), GetClientSize().y,
               static_cast<int>(layout_.TotalHeight()));
}

ThumbnailRequest ThumbnailCanvas::RequestOf(size_t line) const {
  return RequestForLine(model_, line,
                        static_cast<int32_t>(std::lround(square_ * GetContentScaleFactor())));
}

// Requests stand-ins for visible files, then their thumbnails, then one screen ahead in scroll
// direction, then the rest from there on if precaching is enabled, once the list is at rest.
void ThumbnailCanvas::WantThumbnails() {
  std::vector<ThumbnailRequest> requests;
  const auto want = [&](size_t first, size_t end) {
    for (size_t line = first; line < end; ++line) {
      const FolderItem& item = model_.Line(line);
      if (item.folder || item.modified == 0) continue;  // its time is not read yet
      ThumbnailRequest request = RequestOf(line);
      if (thumbnails_.Find(request) == nullptr) requests.push_back(std::move(request));
    }
  };
  if (square_ > 0 && model_.LineCount() > 0) {
    const int height = GetClientSize().y;
    const CellLayout::Range visible = layout_.Visible(scroll_);
    const size_t ahead = RoomAhead(visible);
    want(visible.first, visible.end);
    const std::vector<ThumbnailRequest> standIns = StandInsFor(visible);
    const int64_t top = direction_ > 0 ? scroll_ + height : std::max<int64_t>(scroll_ - height, 0);
    const CellLayout::Range next = layout_.LinesBetween(top, top + height);
    if (direction_ > 0) want(std::max(next.first, visible.end), next.end);
    if (direction_ < 0) want(next.first, std::min(next.end, visible.first));
    if (settings.BrowserThumbnailPrecacheEnable != 0 && resting_) {
      const size_t end = std::min(model_.LineCount(), visible.end + ahead);
      for (size_t line = visible.end; line < end && requests.size() < kPrecache; ++line)
        want(line, line + 1);
    }
    requests.insert(requests.begin(), standIns.begin(), standIns.end());
    WantFolders(visible, requests);
  }
  thumbnails_.Want(std::move(requests));
}

// Makes room in memory for a few screens of thumbnails. Returns how many fit beyond the visible
// ones; more would replace those just loaded.
size_t ThumbnailCanvas::RoomAhead(const CellLayout::Range& visible) {
  const double side = square_ * GetContentScaleFactor();
  const auto bytes = static_cast<uint64_t>(side * side) * 3;
  const size_t shown = visible.end - visible.first;
  thumbnails_.MakeRoomFor(kScreensKept * shown * bytes);
  const size_t room = static_cast<size_t>(thumbnails_.Room() / std::max<uint64_t>(bytes, 1));
  return room > 2 * shown ? room - 2 * shown : 0;
}

// Previews of visible folders come last.
void ThumbnailCanvas::WantFolders(const CellLayout::Range& lines,
                                  std::vector<ThumbnailRequest>& requests) {
  if (settings.AlternateFolderGraphics != 0) return;
  for (size_t line = lines.first; line < lines.end; ++line) {
    if (!model_.Line(line).folder || model_.Line(line).modified == 0) continue;
    ThumbnailRequest request = RequestOf(line);
    request.folder = true;
    if (thumbnails_.Find(request) == nullptr) requests.push_back(std::move(request));
  }
}

std::vector<ThumbnailRequest> ThumbnailCanvas::StandInsFor(const CellLayout::Range& lines) const {
  std::vector<ThumbnailRequest> standIns;
  for (size_t line = lines.first; line < lines.end; ++line) {
    const FolderItem& item = model_.Line(line);
    if (item.folder || item.modified == 0 || !MayHoldThumbnail(item.format)) continue;
    if (thumbnails_.FindAny(model_.PathOfLine(line)) != nullptr) continue;
    standIns.push_back(RequestOf(line));
    standIns.back().standIn = true;
  }
  return standIns;
}

void ThumbnailCanvas::ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results) {
  std::unordered_set<std::string> visible;
  const CellLayout::Range range = layout_.Visible(scroll_);
  size_t empty = 0;
  for (size_t line = range.first; line < range.end; ++line) {
    visible.insert(model_.PathOfLine(line));
    if (!model_.Line(line).folder && thumbnails_.FindAny(model_.PathOfLine(line)) == nullptr)
      ++empty;
  }
  const auto shows = [&](const ThumbnailLoader::Result& result) {
    return visible.contains(result.request.path);
  };
  if (std::any_of(results.begin(), results.end(), shows)) Refresh();
  if (empty == 0 && filled_ != model_.Folder()) LogEvent("filled", std::to_string(visible.size()));
  if (empty == 0) filled_ = model_.Folder();
  if (thumbnails_.Pending() == 0) WantThumbnails();
}

size_t ThumbnailCanvas::MissingThumbnails() {
  size_t missing = 0;
  const CellLayout::Range visible = layout_.Visible(scroll_);
  for (size_t line = visible.first; line < visible.end && square_ > 0; ++line) {
    if (!model_.Line(line).folder && thumbnails_.Find(RequestOf(line)) == nullptr) ++missing;
  }
  return missing;
}

void ThumbnailCanvas::ShowLine(size_t line) {
  if (line != kNoLine) ScrollTo(layout_.ScrollToShow(line, scroll_));
}

bool ThumbnailCanvas::InSight(size_t line) const {
  return line != kNoLine && layout_.Shows(line, scroll_);
}

void ThumbnailCanvas::RestorePlace(int64_t scroll, size_t line) {
  restored_ = {scroll, line};
  ShowRestored();
}

void ThumbnailCanvas::ShowRestored() {
  const auto [scroll, line] = *restored_;
  if (scroll >= 0) ScrollTo(scroll);
  ShowLine(line);
}

void ThumbnailCanvas::ScrollTo(int64_t scroll) {
  scroll = std::clamp<int64_t>(scroll, 0, layout_.LargestScroll());
  if (scroll == scroll_) return;
  editor_.Finish(true);
  direction_ = scroll > scroll_ ? 1 : -1;
  scroll_ = scroll;
  UpdateScrollbar();
  WaitForRest();
  WantThumbnails();
  Refresh();
}

// --- scrolling ---

// Keeps the first visible file in place, and the focused one in sight if it was.
void ThumbnailCanvas::OnSize(wxSizeEvent& event) {
  const size_t focus = model_.Selected().Focus();
  const bool seen = InSight(focus);
  const size_t first = layout_.Visible(scroll_).first;
  const int64_t below = scroll_ - layout_.Cell(first).y;
  layout_.SetWindow(GetClientSize().x, GetClientSize().y);
  scroll_ = std::clamp<int64_t>(layout_.Cell(first).y + below, 0, layout_.LargestScroll());
  if (seen) scroll_ = layout_.ScrollToShow(focus, scroll_);
  if (restored_) ShowRestored();
  UpdateScrollbar();
  WantThumbnails();
  Refresh();
  event.Skip();
}

void ThumbnailCanvas::OnScroll(wxScrollWinEvent& event) {
  const wxEventType type = event.GetEventType();
  const int64_t page = std::max(GetClientSize().y - layout_.RowHeight(), layout_.RowHeight());
  int64_t target = event.GetPosition();
  if (type == wxEVT_SCROLLWIN_TOP) target = 0;
  if (type == wxEVT_SCROLLWIN_BOTTOM) target = layout_.LargestScroll();
  if (type == wxEVT_SCROLLWIN_LINEUP) target = scroll_ - layout_.RowHeight();
  if (type == wxEVT_SCROLLWIN_LINEDOWN) target = scroll_ + layout_.RowHeight();
  if (type == wxEVT_SCROLLWIN_PAGEUP) target = scroll_ - page;
  if (type == wxEVT_SCROLLWIN_PAGEDOWN) target = scroll_ + page;
  restored_.reset();
  ScrollTo(target);
}

void ThumbnailCanvas::OnWheel(wxMouseEvent& event) {
  if (event.GetWheelAxis() != wxMOUSE_WHEEL_VERTICAL || event.GetWheelDelta() == 0)
    return event.Skip();
  const double notches = static_cast<double>(event.GetWheelRotation()) / event.GetWheelDelta();
  if (event.ControlDown()) {
    if (events_.resize && notches != 0) events_.resize(notches > 0 ? 1 : -1);
    return;
  }
  const double step = ListsNames() ? 3.0 * layout_.RowHeight()
                                   : std::max(layout_.RowHeight() / 2.0, FromDIP(60) * 1.0);
  restored_.reset();
  ScrollTo(scroll_ - std::lround(notches * step));
}

// --- mouse ---

size_t ThumbnailCanvas::LineAt(const wxPoint& point) const {
  return layout_.LineAt(point.x, point.y + scroll_);
}

// Screen readers identify the canvas by its focused file; updates that on change.
void ThumbnailCanvas::ReportFocus() {
  const wxString focus = Shown(model_.FocusText());
  const wxString count = Label("Thumbnails, %1 selected", model_.Selected().SelectedCount());
  ReportToScreenReader(*this, focus.empty() ? Label("Thumbnails") : focus, count);
}

void ThumbnailCanvas::ReportSelection() {
  restored_.reset();
  Refresh();
  ReportFocus();
  if (events_.selectionChanged) events_.selectionChanged();
}

void ThumbnailCanvas::OnMouseDown(wxMouseEvent& event) {
  editor_.Finish(true);
  SetFocus();
  const size_t line = LineAt(event.GetPosition());
  pressed_ = wxPoint(event.GetX(), static_cast<int>(event.GetY() + scroll_));
  pressedLine_ = line;
  if (!HasCapture()) CaptureMouse();
  Selection& selection = model_.Selected();
  if (line == kNoLine) {
    const bool keep = event.ControlDown() || event.ShiftDown();
    if (!keep) selection.ClickBlank(settings.ClearAllOnBlankClick != 0);
    return ReportSelection();
  }
  // Pressing on a selected line may start a drag of the selection; a plain click is handled on
  // release.
  if (selection.IsSelected(line) && !event.ControlDown() && !event.ShiftDown()) return;
  selection.Click(line, event.ShiftDown(), event.ControlDown());
  ReportSelection();
}

void ThumbnailCanvas::OnMouseUp(wxMouseEvent& event) {
  if (HasCapture()) ReleaseMouse();
  bandTimer_.Stop();
  const bool click = pressed_ && !banding_ && pressedLine_ != kNoLine && !event.ControlDown() &&
                     !event.ShiftDown();
  if (click && LineAt(event.GetPosition()) == pressedLine_) {
    model_.Selected().Click(pressedLine_, false, false);
    ReportSelection();
  }
  pressed_.reset();
  banding_ = false;
  Refresh();
}

void ThumbnailCanvas::OnMouseMove(wxMouseEvent& event) {
  if (!pressed_ || !event.LeftIsDown()) return UpdateTip(LineAt(event.GetPosition()));
  const wxPoint now(event.GetX(), static_cast<int>(event.GetY() + scroll_));
  const wxPoint way = now - *pressed_;
  if (!banding_ && std::abs(way.x) + std::abs(way.y) < FromDIP(6)) return;
  if (pressedLine_ != kNoLine) {
    if (HasCapture()) ReleaseMouse();
    pressed_.reset();
    if (events_.dragBegins) events_.dragBegins();
    return;
  }
  Selection& selection = model_.Selected();
  if (!banding_) {
    selection.BeginBand(event.ControlDown() || event.ShiftDown());
    banding_ = true;
    bandTimer_.Start(40);
  }
  bandEnd_ = now;
  const Rect band{std::min(pressed_->x, now.x), std::min(pressed_->y, now.y), std::abs(way.x) + 1,
                  std::abs(way.y) + 1};
  selection.MoveBand(layout_.LinesIn(band));
  ReportSelection();
}

void ThumbnailCanvas::OnDoubleClick(wxMouseEvent& event) {
  const size_t line = LineAt(event.GetPosition());
  if (line != kNoLine && events_.activated) events_.activated(line);
}

void ThumbnailCanvas::OnRightDown(wxMouseEvent& event) {
  editor_.Finish(true);
  SetFocus();
  const size_t line = LineAt(event.GetPosition());
  model_.Selected().ContextClick(line);
  if (line == kNoLine) model_.Selected().ClickBlank(settings.ClearAllOnBlankClick != 0);
  ReportSelection();
  if (events_.contextMenu) events_.contextMenu(line, event.GetPosition());
}

void ThumbnailCanvas::UpdateTip(size_t line) {
  if (line >= model_.LineCount()) return tip_.Over(model_.Folder(), nullptr, Status::Ok);
  const ThumbnailPointer thumbnail = thumbnails_.FindAny(model_.PathOfLine(line));
  tip_.Over(model_.Folder(), &model_.Line(line),
            thumbnail == nullptr ? Status::Ok : thumbnail->status);
}

// --- keyboard ---

void ThumbnailCanvas::MoveFocus(Step step, const wxKeyEvent& event) {
  const size_t line = layout_.Move(model_.Selected().Focus(), step);
  if (line == kNoLine) return;
  model_.Selected().MoveFocus(line, event.ShiftDown(), event.ControlDown());
  ShowLine(line);
  ReportSelection();
}

void ThumbnailCanvas::OnKey(wxKeyEvent& event) {
  struct KeyStep {
    int key;
    Step step;
  };
  constexpr KeyStep kSteps[] = {
      {WXK_LEFT, Step::Left},  {WXK_RIGHT, Step::Right}, {WXK_UP, Step::Up},         {WXK_DOWN, Step::Down},
      {WXK_HOME, Step::First}, {WXK_END, Step::Last},    {WXK_PAGEUP, Step::PageUp}, {WXK_PAGEDOWN, Step::PageDown},
  };
  if (event.AltDown()) return event.Skip();
  if (event.GetKeyCode() == WXK_TAB && !event.ControlDown()) {
    Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                               : wxNavigationKeyEvent::IsForward);
    return;
  }
  for (const KeyStep& row : kSteps) {
    if (row.key == event.GetKeyCode()) return MoveFocus(row.step, event);
  }
  const size_t focus = model_.Selected().Focus();
  if (OpensMenu(event) && focus != kNoLine && events_.contextMenu) {
    const Rect cell = layout_.Cell(focus);
    return events_.contextMenu(
        focus,
        wxPoint(cell.x + cell.width / 2, static_cast<int>(cell.y - scroll_) + cell.height / 2));
  }
  const bool enter = event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER;
  if (enter && !event.HasAnyModifiers() && focus != kNoLine) return events_.activated(focus);
  if (event.GetKeyCode() == WXK_SPACE && typed_.empty()) {
    model_.Selected().ToggleFocus();
    return ReportSelection();
  }
  event.Skip();
}

// Jumps to the next name starting with the typed letters.
void ThumbnailCanvas::OnChar(wxKeyEvent& event) {
  const wxChar key = event.GetUnicodeKey();
  if (key < 0x20 || key == 0x7f || event.HasModifiers()) return event.Skip();
  const double now = platform::MonotonicSeconds();
  if (now - typedAt_ > kTypingPause) typed_.clear();
  const int digit = static_cast<int>(key);
  if (typed_.empty() && digit < 0x80 && events_.digit && events_.digit(digit)) return;
  typedAt_ = now;
  const std::string letter = Utf8(wxString(key));
  const bool again = typed_ == letter;
  if (!again) typed_ += letter;
  const size_t line = model_.FindTyped(typed_, typed_ == letter);
  if (line == kNoLine) return;
  model_.Selected().MoveFocus(line, false, false);
  ShowLine(line);
  ReportSelection();
}

// --- renaming in place ---

void ThumbnailCanvas::EditName(size_t line) {
  editor_.Finish(true);
  if (line >= model_.LineCount()) return;
  ShowLine(line);
  const std::string name(ShownName(model_.Line(line)));
  const size_t base = model_.Line(line).folder
                          ? name.size()
                          : name.size() - platform::SplitPath(name).extension.size();
  editedLine_ = line;
  editedPath_ = model_.PathOfLine(line);
  editor_.Begin(EditorPlace(), Label("New name"), name, base, [this](const std::string& changed) {
    if (editedLine_ < model_.LineCount() && changed != ShownName(model_.Line(editedLine_)) &&
        events_.renamed)
      events_.renamed(editedLine_, changed);
  });
}

wxRect ThumbnailCanvas::EditorPlace() const {
  const Rect cell = layout_.Cell(editedLine_);
  const int height = textHeight_ + FromDIP(12);
  const int top = static_cast<int>(cell.y - scroll_) + cell.height - height;
  return {cell.x, top, std::max(cell.width, FromDIP(160)), height};
}

// What is typed stays when others change the folder, unless the file is gone.
void ThumbnailCanvas::KeepEditing() {
  if (!editor_.Open()) return;
  editedLine_ = model_.LineOfPath(editedPath_);
  if (editedLine_ == kNoLine) return editor_.Finish(false);
  editor_.MoveTo(EditorPlace());
}

}  // namespace fotomill::desktop
