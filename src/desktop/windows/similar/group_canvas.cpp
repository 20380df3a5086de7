#include "desktop/windows/similar/group_canvas.h"

#include <wx/control.h>
#include <wx/dcbuffer.h>
#include <wx/renderer.h>
#include <wx/settings.h>

#include <algorithm>
#include <utility>

#include "core/choice_lists.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/detail_columns.h"
#include "desktop/models/drawing/list_palette.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kSquare = 180, kPadding = 6, kGap = 6, kBox = 18, kScrollStep = 24;
constexpr int kTextLines = 4;  // name, folder, size, date
constexpr int kVeil = 150;     // opacity of what lies over a ticked picture

}  // namespace

GroupCanvas::GroupCanvas(wxWindow* parent, GroupList& list, Events events)
    : wxScrolledCanvas(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                       wxVSCROLL | wxWANTS_CHARS | wxBORDER_NONE, Label("Groups")),
      list_(list),
      events_(std::move(events)),
      thumbnails_([this] { Refresh(); }) {
  SetBackgroundStyle(wxBG_STYLE_PAINT);
  SetScrollRate(0, FromDIP(kScrollStep));
  BindEvents();
  ListChanged();
}

void GroupCanvas::BindEvents() {
  Bind(wxEVT_PAINT, &GroupCanvas::OnPaint, this);
  Bind(wxEVT_SIZE, &GroupCanvas::OnSize, this);
  Bind(wxEVT_LEFT_DOWN, &GroupCanvas::OnMouseDown, this);
  Bind(wxEVT_LEFT_DCLICK, [this](wxMouseEvent& event) {
    if (focus_ != kNoLine && CellAt(event.GetPosition()) == focus_ &&
        !BoxOf(focus_).Contains(event.GetPosition()))
      return events_.view();
    OnMouseDown(event);
  });
  Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) {
    SetFocus();
    if (const size_t cell = CellAt(event.GetPosition()); cell != kNoLine) FocusCell(cell);
    events_.menu(event.GetPosition());
  });
  Bind(wxEVT_MOTION, &GroupCanvas::OnMouseMove, this);
  Bind(wxEVT_KEY_DOWN, &GroupCanvas::OnKey, this);
  for (const auto type : {wxEVT_SET_FOCUS, wxEVT_KILL_FOCUS}) {
    Bind(type, [this](wxFocusEvent& event) {
      Refresh();
      event.Skip();
    });
  }
}

// --- layout ---

void GroupCanvas::Measure() {
  textHeight_ = GetCharHeight();
  const int padding = FromDIP(kPadding);
  layout_.SetCells(FromDIP(kSquare) + 2 * padding,
                   FromDIP(kSquare) + kTextLines * textHeight_ + 3 * padding, FromDIP(kGap));
  layout_.SetCount(list_.Cells().size());
  layout_.SetGroups(list_.Starts(), textHeight_ + 2 * padding);
  layout_.SetWindow(GetClientSize().x, GetClientSize().y);
  SetVirtualSize(0, static_cast<int>(layout_.TotalHeight()));
}

void GroupCanvas::OnSize(wxSizeEvent& event) {
  Measure();
  Refresh();
  event.Skip();
}

void GroupCanvas::ListChanged() {
  Measure();
  const size_t count = list_.Cells().size();
  const size_t kept = list_.CellOf(focusPath_);
  if (kept < count) focus_ = kept;
  focus_ = count == 0 ? kNoLine : std::min(focus_ == kNoLine ? 0 : focus_, count - 1);
  focusPath_ = focus_ == kNoLine ? std::string() : list_.Picture(focus_).path;
  ReportFocus();
  Refresh();
}

void GroupCanvas::SetNote(const wxString& note) {
  note_ = note;
  Refresh();
}

int GroupCanvas::Top() const {
  int x = 0, y = 0;
  GetViewStart(&x, &y);
  return y * FromDIP(kScrollStep);
}

size_t GroupCanvas::CellAt(const wxPoint& place) const {
  return layout_.LineAt(place.x, place.y + Top());
}

wxRect GroupCanvas::SquareOf(size_t cell) const {
  const Rect place = layout_.Cell(cell);
  const int side = FromDIP(kSquare);
  return {place.x + (place.width - side) / 2, static_cast<int>(place.y) - Top() + FromDIP(kPadding),
          side, side};
}

wxRect GroupCanvas::BoxOf(size_t cell) const {
  const wxRect square = SquareOf(cell);
  const int side = FromDIP(kBox), below = (textHeight_ - side) / 2;
  return {square.x, square.GetBottom() + 1 + FromDIP(kPadding) + below, side, side};
}

// --- painting ---

void GroupCanvas::OnPaint(wxPaintEvent&) {
  wxAutoBufferedPaintDC dc(this);
  const ListPalette palette = CurrentPalette();
  dc.SetBackground(wxBrush(ToWx(palette.background)));
  dc.Clear();
  dc.SetFont(GetFont());
  if (list_.Cells().empty()) {
    dc.SetTextForeground(ToWx(palette.note));
    dc.DrawLabel(note_, wxRect(GetClientSize()), wxALIGN_CENTER);
    return;
  }
  const CellLayout::Range visible = layout_.Visible(Top());
  for (size_t cell = visible.first; cell < visible.end; ++cell) DrawCell(dc, cell, palette);
  DrawHeadings(dc, palette);
  WantThumbnails();
}

void GroupCanvas::DrawHeadings(wxDC& dc, const ListPalette& palette) {
  dc.SetFont(GetFont().Bold());
  dc.SetTextForeground(ToWx(palette.text));
  dc.SetPen(wxPen(ToWx(palette.frame), FromDIP(1)));
  for (size_t i = 0; i < layout_.GroupCount(); ++i) {
    const Rect place = layout_.Heading(i);
    const int top = static_cast<int>(place.y) - Top();
    if (top + place.height < 0 || top > GetClientSize().y) continue;
    const wxString text = Shown(list_.GroupText(list_.Starts()[i]));
    const int left = place.x + FromDIP(kPadding), middle = top + place.height / 2;
    dc.DrawText(text, left, middle - textHeight_ / 2);
    const int from = left + dc.GetTextExtent(text).x + 2 * FromDIP(kPadding);
    if (from < place.x + place.width) dc.DrawLine(from, middle, place.x + place.width, middle);
  }
}

void GroupCanvas::DrawCell(wxDC& dc, size_t cell, const ListPalette& palette) {
  const Rect place = layout_.Cell(cell);
  const wxRect frame(place.x, static_cast<int>(place.y) - Top(), place.width, place.height);
  if (cell == focus_) {
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(ToWx(HasFocus() ? palette.selected : palette.resting)));
    dc.DrawRoundedRectangle(frame, FromDIP(5));
  }
  const wxRect square = SquareOf(cell);
  DrawPicture(dc, cell, square, palette);
  DrawTexts(dc, cell, square, palette);
}

void GroupCanvas::DrawPicture(wxDC& dc, size_t cell, const wxRect& square,
                              const ListPalette& palette) {
  const GroupList::Cell& shown = list_.Cells()[cell];
  const wxBitmap* const bitmap =
      thumbnails_.Find(list_.Picture(cell), square.width, GetContentScaleFactor());
  wxRect picture = square;
  if (bitmap != nullptr && bitmap->IsOk()) {
    const wxSize size(static_cast<int>(bitmap->GetLogicalWidth()),
                      static_cast<int>(bitmap->GetLogicalHeight()));
    picture = wxRect(size).CentreIn(square);
    dc.DrawBitmap(*bitmap, picture.GetTopLeft());
    dc.SetBrush(*wxTRANSPARENT_BRUSH);
  } else {
    dc.SetBrush(wxBrush(ToWx(palette.faint)));
  }
  dc.SetPen(wxPen(ToWx(palette.frame)));
  dc.DrawRectangle(wxRect(picture).Inflate(bitmap != nullptr ? 1 : 0));
  if (shown.ticked || shown.now != FileNow::Same) {
    const wxColour back = ToWx(palette.background);
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(wxColour(back.Red(), back.Green(), back.Blue(), kVeil)));
    dc.DrawRectangle(picture);
  }
  if (!shown.best) return;
  const wxString text = Label("Best");
  dc.SetFont(GetFont().Bold());
  const wxSize size = dc.GetTextExtent(text) + FromDIP(wxSize(12, 4));
  const wxRect badge(wxPoint(picture.GetRight() - size.x - FromDIP(4), picture.y + FromDIP(5)),
                     size);
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(wxColour(0x1b, 0x6e, 0x2f)));
  dc.DrawRoundedRectangle(badge, FromDIP(4));
  dc.SetTextForeground(*wxWHITE);
  dc.DrawLabel(text, badge, wxALIGN_CENTER);
  dc.SetFont(GetFont());
}

void GroupCanvas::DrawTexts(wxDC& dc, size_t cell, const wxRect& square,
                            const ListPalette& palette) {
  const GroupList::Cell& shown = list_.Cells()[cell];
  const SimilarPicture& picture = list_.Picture(cell);
  const bool focused = cell == focus_;
  const Shade strong = !focused     ? palette.text
                       : HasFocus() ? palette.selectedText
                                    : palette.restingText;
  const Shade weak = focused ? strong : palette.note;
  const wxRect box = BoxOf(cell);
  int flags = shown.ticked ? int{wxCONTROL_CHECKED} : 0;
  if (shown.now != FileNow::Same) flags |= wxCONTROL_DISABLED;
  wxRendererNative::Get().DrawCheckBox(this, dc, box, flags);
  int top = square.GetBottom() + 1 + FromDIP(kPadding);
  const auto draw = [&](const wxString& text, Shade color, int left) {
    dc.SetTextForeground(ToWx(color));
    dc.DrawText(wxControl::Ellipsize(text, dc, wxELLIPSIZE_MIDDLE, square.GetRight() + 1 - left,
                                     wxELLIPSIZE_FLAGS_NONE),
                left, top);
    top += textHeight_;
  };
  draw(Shown(platform::FileNameOf(picture.path)), strong, box.GetRight() + FromDIP(kPadding));
  std::string folder = platform::FolderOf(picture.path);
  if (folder.size() > 1 && folder.back() == platform::kSeparator) folder.pop_back();
  draw(Shown(folder), weak, square.x);
  const std::string size = std::to_string(picture.width) + " x " + std::to_string(picture.height) +
                           ", " + SizeText(picture.stamp.size, choice::kSizeFitting);
  draw(Shown(picture.severalPages ? size + ", " + Tr("several pages") : size), weak, square.x);
  const Shade warning = focused ? strong : palette.fault;
  switch (shown.now) {
    case FileNow::Changed: return draw(Label("Changed since the search"), warning, square.x);
    case FileNow::Unknown: return draw(Label("Cannot be reached now"), warning, square.x);
    case FileNow::Same:
    case FileNow::Gone: break;
  }
  draw(Shown(DateNumberText(picture.date)), weak, square.x);
}

// Those on the screen, then the next screen.
void GroupCanvas::WantThumbnails() {
  const int height = GetClientSize().y;
  const CellLayout::Range range = layout_.LinesBetween(Top(), Top() + 2 * int64_t{height});
  std::vector<SimilarPicture> pictures;
  for (size_t cell = range.first; cell < range.end; ++cell) pictures.push_back(list_.Picture(cell));
  thumbnails_.Want(pictures, FromDIP(kSquare), GetContentScaleFactor());
}

// --- input ---

void GroupCanvas::ReportFocus() {
  const wxString text = focus_ == kNoLine ? Label("Groups") : Shown(list_.CellText(focus_));
  ReportToScreenReader(*this, text, Shown(list_.CountText()));
}

void GroupCanvas::FocusCell(size_t cell) {
  if (cell >= list_.Cells().size()) return;
  focus_ = cell;
  focusPath_ = list_.Picture(cell).path;
  // A cell of the first row of its group is shown with the heading.
  const Rect place = layout_.Cell(cell);
  const int step = FromDIP(kScrollStep), heading = textHeight_ + 3 * FromDIP(kPadding);
  const auto top = static_cast<int>(place.y) - heading;
  const auto end = static_cast<int>(place.y) + place.height + FromDIP(kGap);
  if (top < Top()) Scroll(0, std::max(top, 0) / step);
  if (end > Top() + GetClientSize().y) Scroll(0, (end - GetClientSize().y + step - 1) / step);
  ReportFocus();
  Refresh();
  events_.changed();
}

void GroupCanvas::TickFocused(bool ticked) {
  if (focus_ == kNoLine || !list_.Tick(focus_, ticked)) return wxBell();
  ReportFocus();
  Refresh();
  events_.changed();
}

void GroupCanvas::OnMouseDown(wxMouseEvent& event) {
  SetFocus();
  const size_t cell = CellAt(event.GetPosition());
  if (cell == kNoLine) return;
  FocusCell(cell);
  if (BoxOf(cell).Inflate(FromDIP(3)).Contains(event.GetPosition()))
    TickFocused(!list_.Cells()[cell].ticked);
}

void GroupCanvas::OnMouseMove(wxMouseEvent& event) {
  const size_t cell = CellAt(event.GetPosition());
  const wxString path = cell == kNoLine ? wxString() : Shown(list_.Picture(cell).path);
  if (GetToolTipText() != path) SetToolTip(path);
  event.Skip();
}

void GroupCanvas::OnKey(wxKeyEvent& event) {
  const auto move = [this](Step step) { FocusCell(layout_.Move(focus_, step)); };
  if (event.HasModifiers()) return event.Skip();
  switch (event.GetKeyCode()) {
    case WXK_LEFT: return move(Step::Left);
    case WXK_RIGHT: return move(Step::Right);
    case WXK_UP: return move(Step::Up);
    case WXK_DOWN: return move(Step::Down);
    case WXK_PAGEUP: return move(Step::PageUp);
    case WXK_PAGEDOWN: return move(Step::PageDown);
    case WXK_HOME: return move(Step::First);
    case WXK_END: return move(Step::Last);
    case WXK_SPACE: return TickFocused(focus_ != kNoLine && !list_.Cells()[focus_].ticked);
    case WXK_TAB:
      Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                 : wxNavigationKeyEvent::IsForward);
      return;
    default: event.Skip();
  }
}

}  // namespace fotomill::desktop
