#include "desktop/windows/batch/progress_list.h"

#include <wx/control.h>
#include <wx/dc.h>
#include <wx/settings.h>

#include <algorithm>
#include <string>
#include <utility>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kThumbnailSide = 48, kMargin = 6, kGap = 8, kSidewaysStep = 40;

}  // namespace

ProgressList::ProgressList(wxWindow* parent, const std::vector<ProgressRow>& rows,
                           ProgressThumbnails& thumbnails, const ProgressSettings& settings,
                           long style)
    : rows_(rows), thumbnails_(thumbnails), settings_(settings) {
  Create(parent, kProgressListId, wxDefaultPosition, wxDefaultSize,
         style | wxHSCROLL | wxBORDER_THEME, Label("Files"));
  Bind(wxEVT_SIZE, [this](wxSizeEvent& event) { UpdateSideways(), event.Skip(); });
  Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
    const int key = event.GetKeyCode();
    if (key != WXK_LEFT && key != WXK_RIGHT) return event.Skip();
    ScrollSideways(left_ + FromDIP(key == WXK_LEFT ? -kSidewaysStep : kSidewaysStep));
  });
  Bind(wxEVT_MOUSEWHEEL, [this](wxMouseEvent& event) {
    const bool sideways = event.GetWheelAxis() == wxMOUSE_WHEEL_HORIZONTAL || event.ShiftDown();
    if (!sideways) return event.Skip();
    const int way = event.GetWheelAxis() == wxMOUSE_WHEEL_HORIZONTAL ? 1 : -1;
    ScrollSideways(left_ + way * (event.GetWheelRotation() > 0 ? 1 : -1) * FromDIP(kSidewaysStep));
  });
  const auto scroll = [this](wxScrollWinEvent& event) {
    if (event.GetOrientation() != wxHORIZONTAL) return event.Skip();
    const wxEventType type = event.GetEventType();
    const int step = type == wxEVT_SCROLLWIN_LINEUP     ? -FromDIP(kSidewaysStep)
                     : type == wxEVT_SCROLLWIN_LINEDOWN ? FromDIP(kSidewaysStep)
                     : type == wxEVT_SCROLLWIN_PAGEUP   ? -GetClientSize().x
                     : type == wxEVT_SCROLLWIN_PAGEDOWN ? GetClientSize().x
                                                        : 0;
    ScrollSideways(step != 0 ? left_ + step : event.GetPosition());
  };
  for (const auto& type :
       {wxEVT_SCROLLWIN_LINEUP, wxEVT_SCROLLWIN_LINEDOWN, wxEVT_SCROLLWIN_PAGEUP,
        wxEVT_SCROLLWIN_PAGEDOWN, wxEVT_SCROLLWIN_THUMBTRACK, wxEVT_SCROLLWIN_THUMBRELEASE})
    Bind(type, scroll);
  ShowNewRows();
}

void ProgressList::ShowNewRows() {
  if (GetItemCount() == rows_.size()) return;
  SetItemCount(rows_.size());
  UpdateSideways();
  ScrollToRow(rows_.size() - 1);
  Refresh();
}

// Row heights may have changed.
void ProgressList::ShowNewThumbnails() {
  const size_t first = GetVisibleRowsBegin();
  const bool atEnd = GetVisibleRowsEnd() >= rows_.size();
  SetItemCount(rows_.size());
  if (!rows_.empty()) ScrollToRow(atEnd ? rows_.size() - 1 : first);
  Refresh();
}

int ProgressList::Lead() const {
  return FromDIP(kMargin) + (settings_.thumbnails ? FromDIP(kThumbnailSide) + FromDIP(kGap) : 0);
}

void ProgressList::UpdateSideways() {
  for (; measured_ < rows_.size(); ++measured_)
    widest_ = std::max(widest_, GetTextExtent(Shown(rows_[measured_].line.text)).x);
  ScrollSideways(left_);
}

void ProgressList::ScrollSideways(int left) {
  const int whole = Lead() + widest_ + FromDIP(kMargin), page = GetClientSize().x;
  left = std::clamp(left, 0, std::max(whole - page, 0));
  SetScrollbar(wxHORIZONTAL, left, page, whole);
  if (left == std::exchange(left_, left)) return;
  LogEvent("progress-list", "left=" + std::to_string(left));
  Refresh();
}

ThumbnailPointer ProgressList::ThumbnailOf(const ProgressRow& row) const {
  return settings_.thumbnails && row.IsAboutFile() ? thumbnails_.Find(row.source) : nullptr;
}

// Tall rows show the name above, and the result below.
wxString ProgressList::TextOf(const ProgressRow& row, int height) const {
  const bool two = row.IsAboutFile() && height >= 2 * GetCharHeight() + FromDIP(4) &&
                   row.line.text.starts_with(row.source);
  if (!two) return Shown(row.line.text);
  std::string outcome = row.line.text.substr(row.source.size());
  outcome.erase(0, std::min(outcome.find_first_not_of(": "), outcome.size()));
  return Shown(platform::FileNameOf(row.source)) + "\n" + Shown(outcome);
}

void ProgressList::OnDrawItem(wxDC& dc, const wxRect& rect, size_t n) const {
  const ProgressRow& row = rows_[n];
  int left = rect.x + FromDIP(kMargin) - left_;
  const ThumbnailPointer thumbnail = ThumbnailOf(row);
  if (thumbnail == nullptr && settings_.thumbnails && row.IsAboutFile())
    thumbnails_.Want(row.source,
                     static_cast<int>(FromDIP(kThumbnailSide) * GetContentScaleFactor()));
  if (thumbnail != nullptr)
    DrawThumbnail(dc, *thumbnail, wxRect(left, rect.y, FromDIP(kThumbnailSide), rect.height));
  if (thumbnail != nullptr || (settings_.thumbnails && settings_.showMissingThumbnails))
    left += FromDIP(kThumbnailSide) + FromDIP(kGap);
  wxColour text = wxSystemSettings::GetColour(IsSelected(n) ? wxSYS_COLOUR_HIGHLIGHTTEXT
                                                            : wxSYS_COLOUR_LISTBOXTEXT);
  if (row.IsFailure() && !IsSelected(n)) text = ToWx(CurrentPalette().fault);
  dc.SetTextForeground(text);
  dc.SetFont(GetFont());
  const wxRect place(left, rect.y, Lead() + widest_, rect.height);
  dc.DrawLabel(TextOf(row, rect.height), place, wxALIGN_CENTER_VERTICAL | wxALIGN_LEFT);
}

wxCoord ProgressList::OnMeasureItem(size_t n) const {
  const int fixed = LayOutProgressBox(1, 1, settings_).rowHeight;
  if (fixed > 0) return TextWidth(*this, fixed);
  return ThumbnailOf(rows_[n]) != nullptr ? FromDIP(kThumbnailSide + kMargin)
                                          : GetCharHeight() + FromDIP(8);
}

void ProgressList::DrawThumbnail(wxDC& dc, const Thumbnail& thumbnail, const wxRect& place) const {
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

}  // namespace fotomill::desktop
