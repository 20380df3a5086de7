#include <wx/control.h>
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

}  // namespace

// Colors for one paint event.
struct ThumbnailCanvas::Looks {
  ListPalette palette = CurrentPalette();
  wxColour background = ToWx(palette.background), text = ToWx(palette.text);
  wxColour selected = ToWx(palette.selected), selectedText = ToWx(palette.selectedText);
  wxColour resting = ToWx(palette.resting), restingText = ToWx(palette.restingText);
  wxColour frame = ToWx(palette.frame), note = ToWx(palette.note);
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
    dc.DrawLabel(model_.Filter().empty() ? Label("There are no pictures in this folder.")
                                         : Label("No name matches the filter."),
                 wxRect(GetClientSize()), wxALIGN_CENTER);
  }
  const CellLayout::Range visible = layout_.Visible(scroll_);
  ++paints_;
  for (size_t line = visible.first; line < visible.end; ++line) DrawCell(dc, line, looks);
  DropBitmaps();
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
    DrawPlaceholder(dc, line, icon, false, looks);
    const int left = icon.GetRight() + padding;
    dc.SetTextForeground(text);
    dc.DrawText(CutName(dc, item.name, cell.GetRight() - left - padding).text, left,
                cell.y + (cell.height - textHeight_) / 2);
    return;
  }
  const wxRect square(cell.x + (cell.width - square_) / 2, cell.y + padding, square_, square_);
  DrawPicture(dc, line, square, looks);
  if (line == editedLine_) return;
  const CutText& name = CutName(dc, item.name, NameWidth());
  dc.SetTextForeground(text);
  dc.DrawText(name.text, cell.x + (cell.width - name.width) / 2,
              square.GetBottom() + 1 + padding);
}

void ThumbnailCanvas::DrawPicture(wxDC& dc, size_t line, const wxRect& square, const Looks& looks) {
  const FolderItem& item = model_.Line(line);
  if (item.folder) return DrawPlaceholder(dc, line, square, false, looks);
  const ThumbnailRequest request = RequestOf(line);
  ThumbnailPointer thumbnail = thumbnails_.Find(request);
  const bool right = thumbnail != nullptr;
  if (!right) thumbnail = thumbnails_.FindAny(request.path);
  if (thumbnail == nullptr || thumbnail->status != Status::Ok)
    return DrawPlaceholder(dc, line, square, thumbnail != nullptr, looks);
  const wxBitmap& bitmap = BitmapOfThumbnail(thumbnail);
  if (!bitmap.IsOk()) return DrawPlaceholder(dc, line, square, true, looks);
  // Uses another size, or the embedded thumbnail, until the right one is loaded.
  double scale = 1;
  const wxSize size = wxSize(static_cast<int>(std::lround(bitmap.GetLogicalWidth())),
                             static_cast<int>(std::lround(bitmap.GetLogicalHeight())));
  if (!right) scale = static_cast<double>(square_) / std::max({size.x, size.y, 1});
  if (!right && !thumbnail->standIn) scale = std::min(scale, 1.0);
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

// Draws a folder, or the placeholder with the file's extension, before or instead of a thumbnail.
void ThumbnailCanvas::DrawPlaceholder(wxDC& dc, size_t line, const wxRect& square, bool unreadable,
                                      const Looks& looks) {
  const FolderItem& item = model_.Line(line);
  if (item.folder) {
    const int side = square.width;
    const wxRect body(square.x + side / 10, square.y + side * 3 / 10, side * 8 / 10,
                      side * 11 / 20);
    const wxColour paper(0xe8, 0xb9, 0x4a), tab(0xc9, 0x95, 0x2b);
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(tab));
    dc.DrawRoundedRectangle(body.x, body.y - side / 10, body.width * 9 / 20, side / 4,
                            std::max(side / 24.0, 1.0));
    dc.SetBrush(wxBrush(paper));
    dc.DrawRoundedRectangle(body, std::max(side / 24.0, 1.0));
    return;
  }
  const bool selected = model_.Selected().IsSelected(line);
  const wxColour& background = !selected    ? looks.background
                               : HasFocus() ? looks.selected
                                            : looks.resting;
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
    (void)CutName(dc, model_.Line(line).name, NameWidth());
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
