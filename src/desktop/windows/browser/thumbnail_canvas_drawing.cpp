#include <wx/control.h>
#include <wx/datetime.h>
#include <wx/dcclient.h>
#include <wx/dcmemory.h>
#include <wx/settings.h>

#include <algorithm>
#include <cmath>

#include "core/text.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/thumbnails/placeholder.h"
#include "desktop/windows/browser/thumbnail_badges.h"
#include "desktop/windows/browser/thumbnail_canvas.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

constexpr double kBitmapBytes = 12e6;  // of bitmaps that are not on the screen
constexpr double kPixelBytes = 11;     // of a bitmap: its own, and two copies of the toolkit
constexpr size_t kMostCutNames = 5000;
constexpr int kAheadMs = 5;  // after painting
constexpr unsigned long kInkOnPaper = 0x3D3D90;  // for an extension on the sheet, 0xBBGGRR

// "22 November 2026", "November 2026" or "2026" in the user's language.
wxString TitleOfGroup(int32_t date) {
  const int year = date / 10'000, month = date / 100 % 100, day = date % 100;
  if (year == 0) return Label("Folders");
  if (month < 1 || month > 12) return wxString::Format("%d", year);
  const wxString name = wxDateTime::GetMonthName(static_cast<wxDateTime::Month>(month - 1));
  if (day == 0) return wxString::Format("%s %d", name, year);
  return wxString::Format("%d %s %d", day, name, year);
}

}  // namespace

// Colors for one paint event.
struct ThumbnailCanvas::Looks {
  ListPalette palette = CurrentPalette();
  wxColour background = ToWx(palette.background), text = ToWx(palette.text);
  wxColour selected = ToWx(palette.selected), selectedText = ToWx(palette.selectedText);
  wxColour resting = ToWx(palette.resting), restingText = ToWx(palette.restingText);
  wxColour frame = ToWx(palette.frame), note = ToWx(palette.note), faint = ToWx(palette.faint);
};

// Logs the first paint, the first one with files, and slow ones.
void ThumbnailCanvas::OnPaint(wxPaintEvent&) {
  constexpr double kFrame = 1.0 / 60;
  const double start = platform::MonotonicSeconds();
  Paint();
  const double seconds = platform::MonotonicSeconds() - start;
  const int stage = model_.LineCount() > 0 ? 2 : 1;
  if (stage > painted_)
    LogEvent(stage == 2 ? "painted-files" : "painted", std::to_string(model_.LineCount()));
  painted_ = std::max(painted_, stage);
  if (seconds > kFrame) LogEvent("slow-paint", std::to_string(std::lround(seconds * 1000)) + " ms");
}

void ThumbnailCanvas::Paint() {
  wxPaintDC dc(this);
  const Looks looks;
  dc.SetBackground(wxBrush(looks.background));
  dc.Clear();
  dc.SetFont(GetFont());
  if (model_.LineCount() == 0 && model_.Listed()) {
    dc.SetTextForeground(looks.note);
    const wxString empty =
        Label("There are no pictures in this folder.") + "\n\n" +
        Label("Choose a folder on the left, or drop pictures here to copy them.");
    dc.DrawLabel(model_.Filter().empty() ? empty : Label("No name matches the filter."),
                 wxRect(GetClientSize()), wxALIGN_CENTER);
  }
  const CellLayout::Range visible = layout_.Visible(scroll_);
  ++paints_;
  for (size_t line = visible.first; line < visible.end; ++line) DrawCell(dc, line, looks);
  DropBitmaps();
  DrawHeadings(dc, looks);
  if (!aheadTimer_.IsRunning()) aheadTimer_.StartOnce(kAheadMs);
  if (banding_ && pressed_) {
    const wxRect band(
        wxPoint(std::min(pressed_->x, bandEnd_.x),
                static_cast<int>(std::min(pressed_->y, bandEnd_.y) - scroll_)),
        wxSize(std::abs(pressed_->x - bandEnd_.x) + 1, std::abs(pressed_->y - bandEnd_.y) + 1));
    dc.SetPen(wxPen(looks.selected));
    dc.SetBrush(
        wxBrush(wxColour(looks.selected.Red(), looks.selected.Green(), looks.selected.Blue(), 48)));
    dc.DrawRectangle(band);
  }
}

void ThumbnailCanvas::DrawCell(wxDC& dc, size_t line, const Looks& looks) {
  const Rect place = layout_.Cell(line);
  const wxRect cell(place.x, static_cast<int>(place.y - scroll_), place.width, place.height);
  const bool selected = model_.Selected().IsSelected(line);
  const bool focused = model_.Selected().Focus() == line && HasFocus();
  const wxColour text = !selected    ? looks.text
                        : HasFocus() ? looks.selectedText
                                     : looks.restingText;
  if (selected) {
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(HasFocus() ? looks.selected : looks.resting));
    dc.DrawRoundedRectangle(cell, FromDIP(5));
  }
  if (focused) {
    dc.SetPen(wxPen(selected ? looks.selectedText : looks.selected, FromDIP(1)));
    dc.SetBrush(*wxTRANSPARENT_BRUSH);
    dc.DrawRoundedRectangle(wxRect(cell).Deflate(FromDIP(2)), FromDIP(4));
  }
  const FolderItem& item = model_.Line(line);
  const int padding = FromDIP(kPadding);
  dc.SetTextForeground(text);
  if (square_ == 0) {
    const wxRect icon(cell.x + padding, cell.y + (cell.height - FromDIP(16)) / 2, FromDIP(16),
                      FromDIP(16));
    DrawPlaceholder(dc, line, icon, CellTrouble::None, looks);
    const int left = icon.GetRight() + padding;
    dc.SetTextForeground(text);
    const int width = cell.GetRight() - left - padding;
    dc.DrawText(CutName(dc, std::string(ShownName(item)), width).text, left,
                cell.y + (cell.height - textHeight_) / 2);
    return;
  }
  const wxRect square(cell.x + (cell.width - square_) / 2, cell.y + padding, square_, square_);
  DrawPicture(dc, line, square, looks);
  if (!item.folder) DrawTags(dc, *this, square, item);
  if (editor_.Open() && line == editedLine_) return;
  const CutText& name = CutName(dc, std::string(ShownName(item)), NameWidth());
  dc.SetTextForeground(text);
  dc.DrawText(name.text, cell.x + (cell.width - name.width) / 2,
              square.GetBottom() + 1 + padding);
}

void ThumbnailCanvas::DrawPicture(wxDC& dc, size_t line, const wxRect& square, const Looks& looks) {
  const FolderItem& item = model_.Line(line);
  if (item.folder) {
    DrawFolder(dc, square);
    return DrawFolderPreview(dc, line, square);
  }
  const ThumbnailRequest request = RequestOf(line);
  ThumbnailPointer thumbnail = thumbnails_.Find(request);
  const bool right = thumbnail != nullptr;
  if (!right) thumbnail = thumbnails_.FindAny(request.path);
  if (thumbnail == nullptr || thumbnail->status != Status::Ok)
    return DrawPlaceholder(dc, line, square,
                           thumbnail == nullptr ? CellTrouble::None : TroubleOf(thumbnail->status),
                           looks);
  const wxBitmap& bitmap = BitmapOfThumbnail(thumbnail);
  if (!bitmap.IsOk()) return DrawPlaceholder(dc, line, square, CellTrouble::Damaged, looks);
  // Uses another size, or the embedded thumbnail, until the right one is loaded.
  double scale = 1;
  const wxSize size = wxSize(static_cast<int>(std::lround(bitmap.GetLogicalWidth())),
                             static_cast<int>(std::lround(bitmap.GetLogicalHeight())));
  if (!right) scale = static_cast<double>(square_) / std::max({size.x, size.y, 1});
  if (!right && !thumbnail->standIn && thumbnail->width > 0) {
    const int largest = std::max(thumbnail->width, thumbnail->height);
    scale = std::min(scale, static_cast<double>(largest) / std::max({size.x, size.y, 1}));
  }
  const wxSize shown(std::max(static_cast<int>(size.x * scale), 1),
                     std::max(static_cast<int>(size.y * scale), 1));
  const wxPoint corner(square.x + (square.width - shown.x) / 2,
                       square.y + (square.height - shown.y) / 2);
  if (scale == 1) {
    dc.DrawBitmap(bitmap, corner);
  } else {
    dc.SetUserScale(scale, scale);
    dc.DrawBitmap(bitmap, static_cast<int>(corner.x / scale), static_cast<int>(corner.y / scale));
    dc.SetUserScale(1, 1);
  }
  dc.SetPen(wxPen(looks.frame));
  dc.SetBrush(*wxTRANSPARENT_BRUSH);
  dc.DrawRectangle(wxRect(corner, shown).Inflate(1));
  DrawBadges(dc, *this, wxRect(corner, shown), *thumbnail, looks.selected, looks.selectedText);
}

void ThumbnailCanvas::DrawFolder(wxDC& dc, const wxRect& square) {
  const int side = square.width;
  const wxRect body(square.x + side / 10, square.y + side * 3 / 10, side * 8 / 10, side * 11 / 20);
  const wxColour paper(0xe8, 0xb9, 0x4a), tab(0xc9, 0x95, 0x2b);
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(wxBrush(tab));
  dc.DrawRoundedRectangle(body.x, body.y - side / 10, body.width * 9 / 20, side / 4,
                          std::max(side / 24.0, 1.0));
  dc.SetBrush(wxBrush(paper));
  dc.DrawRoundedRectangle(body, std::max(side / 24.0, 1.0));
}

// The first picture of a folder, on its front.
void ThumbnailCanvas::DrawFolderPreview(wxDC& dc, size_t line, const wxRect& square) {
  const ThumbnailPointer thumbnail = thumbnails_.FindAny(model_.PathOfLine(line));
  if (thumbnail == nullptr || thumbnail->pixels.Empty()) return;
  const wxBitmap& bitmap = BitmapOfThumbnail(thumbnail);
  if (!bitmap.IsOk()) return;
  const int side = square.width;
  const wxRect front(square.x + side * 15 / 100, square.y + side * 36 / 100, side * 70 / 100,
                     side * 43 / 100);
  const double width = bitmap.GetLogicalWidth(), height = bitmap.GetLogicalHeight();
  const double scale = std::min({front.width / width, front.height / height, 1.0});
  const wxSize shown(std::max(static_cast<int>(width * scale), 1),
                     std::max(static_cast<int>(height * scale), 1));
  const wxPoint corner(front.x + (front.width - shown.x) / 2,
                       front.y + (front.height - shown.y) / 2);
  dc.SetPen(*wxTRANSPARENT_PEN);
  dc.SetBrush(*wxWHITE_BRUSH);
  dc.DrawRectangle(wxRect(corner, shown).Inflate(FromDIP(2)));
  dc.SetUserScale(scale, scale);
  dc.DrawBitmap(bitmap, static_cast<int>(corner.x / scale), static_cast<int>(corner.y / scale));
  dc.SetUserScale(1, 1);
}

// The dates of groups, with a line up to the edge.
void ThumbnailCanvas::DrawHeadings(wxDC& dc, const Looks& looks) {
  dc.SetFont(GetFont().Bold());
  dc.SetTextForeground(looks.text);
  dc.SetPen(wxPen(looks.frame, FromDIP(1)));
  for (size_t i = 0; i < layout_.GroupCount(); ++i) {
    const Rect place = layout_.Heading(i);
    const int top = static_cast<int>(place.y - scroll_);
    if (top + place.height < 0 || top > GetClientSize().y) continue;
    const wxString title = TitleOfGroup(model_.Groups()[i].date);
    const int gap = FromDIP(kPadding), middle = top + place.height / 2;
    dc.DrawText(title, place.x + gap, middle - textHeight_ / 2);
    const int from = place.x + 3 * gap + dc.GetTextExtent(title).x;
    if (from < place.x + place.width) dc.DrawLine(from, middle, place.x + place.width, middle);
  }
  dc.SetFont(GetFont());
}

// A sheet with a lock or a question mark, and what that means below. Damaged files have a
// crossed-out sheet instead.
void ThumbnailCanvas::DrawTrouble(wxDC& dc, const wxRect& square, CellTrouble trouble,
                                  const Looks& looks, const wxColour& text) {
  const int side = square.width;
  const wxRect sheet(square.x + side / 5, square.y + side / 12, side * 3 / 5, side * 13 / 20);
  dc.SetPen(wxPen(looks.frame, FromDIP(1)));
  dc.SetBrush(wxBrush(looks.faint));
  dc.DrawRoundedRectangle(sheet, std::max(side / 24.0, 1.0));
  const wxPoint middle(sheet.x + sheet.width / 2, sheet.y + sheet.height / 2);
  if (trouble == CellTrouble::NoAccess) {
    const int width = side / 4, arch = side / 7;
    dc.SetPen(wxPen(looks.note, std::max(side / 28, 1)));
    dc.SetBrush(*wxTRANSPARENT_BRUSH);
    dc.DrawEllipticArc(middle.x - arch / 2, middle.y - arch, arch, 2 * arch, 0, 180);
    dc.SetBrush(wxBrush(looks.note));
    dc.DrawRectangle(middle.x - width / 2, middle.y, width, width * 3 / 4);
  } else {
    dc.SetFont(GetFont().Scaled(static_cast<float>(side) / 40.0F));
    dc.SetTextForeground(looks.note);
    dc.DrawLabel("?", sheet, wxALIGN_CENTER);
    dc.SetFont(GetFont());
  }
  if (side < FromDIP(80)) return;
  dc.SetTextForeground(text);
  dc.DrawLabel(wxControl::Ellipsize(Label(TroubleText(trouble)), dc, wxELLIPSIZE_END, side),
               wxRect(square.x, sheet.GetBottom(), side, square.GetBottom() - sheet.GetBottom()),
               wxALIGN_CENTER);
}

// The file's extension on a photograph while the thumbnail is loading, or else why there is none.
void ThumbnailCanvas::DrawPlaceholder(wxDC& dc, size_t line, const wxRect& square,
                                      CellTrouble trouble, const Looks& looks) {
  const FolderItem& item = model_.Line(line);
  if (item.folder) return DrawFolder(dc, square);
  const bool unreadable = trouble != CellTrouble::None;
  const bool selected = model_.Selected().IsSelected(line);
  const wxColour& background = !selected    ? looks.background
                               : HasFocus() ? looks.selected
                                            : looks.resting;
  if (trouble == CellTrouble::NoAccess || trouble == CellTrouble::Unsupported) {
    const wxColour& text = !selected    ? looks.note
                           : HasFocus() ? looks.selectedText
                                        : looks.restingText;
    return DrawTrouble(dc, square, trouble, looks, text);
  }
  const wxBitmap& bitmap = PlaceholderBitmap(unreadable, square.width, background);
  if (bitmap.IsOk()) dc.DrawBitmap(bitmap, square.GetTopLeft());
  if (square.width < FromDIP(40)) return;
  // On the sheet, or below the photograph.
  const int top = square.height * (unreadable ? 70 : 80) / 100;
  dc.SetTextForeground(unreadable   ? wxColour(kInkOnPaper)
                       : !selected  ? looks.note
                       : HasFocus() ? looks.selectedText
                                    : looks.restingText);
  dc.DrawLabel(Shown(UpperCase(platform::ExtensionOf(item.name))),
               wxRect(square.x, square.y + top, square.width, square.height * 20 / 100),
               wxALIGN_CENTER);
}

// Only a few are used at a time: two kinds on three backgrounds.
const wxBitmap& ThumbnailCanvas::PlaceholderBitmap(bool unreadable, int side,
                                                   const wxColour& background) {
  constexpr size_t kMost = 12;
  for (const DrawnPlaceholder& drawn : placeholders_) {
    if (drawn.unreadable == unreadable && drawn.side == side && drawn.background == background)
      return drawn.bitmap;
  }
  if (placeholders_.size() >= kMost) placeholders_.pop_front();
  const double scale = GetContentScaleFactor();
  const RgbImage pixels =
      PlaceholderPixels(unreadable, static_cast<int32_t>(std::lround(side * scale)),
                        static_cast<Color>(background.GetRGB()));
  placeholders_.push_back(
      {unreadable, side, background, pixels.Empty() ? wxBitmap() : BitmapOf(pixels, scale)});
  return placeholders_.back().bitmap;
}

const ThumbnailCanvas::CutText& ThumbnailCanvas::CutName(wxDC& dc, const std::string& name,
                                                         int width) {
  if (width != cutWidth_ || cutNames_.size() > kMostCutNames) cutNames_.clear();
  cutWidth_ = width;
  const auto [found, added] = cutNames_.try_emplace(name);
  if (added) {
    const wxString text =
        wxControl::Ellipsize(Shown(name), dc, wxELLIPSIZE_MIDDLE, width, wxELLIPSIZE_FLAGS_NONE);
    found->second = {text, dc.GetTextExtent(text).x};
  }
  return found->second;
}

int ThumbnailCanvas::NameWidth() const { return layout_.Cell(0).width - 2 * FromDIP(3); }

// Measuring texts takes most of the time to paint new cells: does it for the next screen after
// painting this one.
void ThumbnailCanvas::CutNamesAhead() {
  if (square_ == 0) return;
  wxBitmap pixel(1, 1);
  wxMemoryDC dc(pixel);
  dc.SetFont(GetFont());
  const int height = GetClientSize().y;
  const int64_t top = std::max<int64_t>(scroll_ + direction_ * height, 0);
  const CellLayout::Range next = layout_.LinesBetween(top, top + height);
  for (size_t line = next.first; line < next.end; ++line)
    (void)CutName(dc, std::string(ShownName(model_.Line(line))), NameWidth());
}

const wxBitmap& ThumbnailCanvas::BitmapOfThumbnail(const ThumbnailPointer& thumbnail) {
  const auto [found, added] = bitmaps_.try_emplace(thumbnail.get(), Drawn{thumbnail, {}, 0});
  Drawn& drawn = found->second;
  if (added) drawn.bitmap = BitmapOf(thumbnail->pixels, GetContentScaleFactor());
  drawn.paint = paints_;
  return drawn.bitmap;
}

// Drops the bitmaps that were not drawn now, if they take much memory.
void ThumbnailCanvas::DropBitmaps() {
  const auto unused = [this](const auto& entry) { return entry.second.paint != paints_; };
  const double side = square_ * GetContentScaleFactor();
  const auto count = static_cast<double>(std::ranges::count_if(bitmaps_, unused));
  if (count * side * side * kPixelBytes > kBitmapBytes) std::erase_if(bitmaps_, unused);
}

}  // namespace fotomill::desktop
