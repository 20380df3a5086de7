#pragma once

#include <wx/timer.h>
#include <wx/window.h>

#include <deque>
#include <functional>
#include <optional>
#include <string>
#include <unordered_map>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/cell_layout.h"
#include "desktop/models/browser/thumbnail_side.h"
#include "desktop/windows/browser/hover_tip.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/widgets/in_place_editor.h"

class wxDC;

namespace fotomill::desktop {

// The thumbnail list of a browser: a window that only draws visible cells, regardless of the number
// of files.
class ThumbnailCanvas : public wxWindow {
 public:
  // Callbacks to the browser.
  struct Events {
    std::function<void()> selectionChanged;
    std::function<void(size_t line)> activated;                    // double click
    // kNoLine: on empty space; position in the canvas
    std::function<void(size_t line, const wxPoint&)> contextMenu;
    std::function<void()> dragBegins;
    std::function<void(int steps)> resize;  // Ctrl and wheel
    std::function<void(size_t line, const std::string& name)> renamed;
    std::function<bool(int key)> digit;  // false: not used
  };

  ThumbnailCanvas(wxWindow* parent, BrowserModel& model, ThumbnailService& thumbnails,
                  Events events);

  // Call if the model has other lines or another view mode.
  void ModelChanged();
  void ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results);
  // Requests thumbnails of visible files, then of nearby ones. Call when this browser becomes
  // active.
  void WantThumbnails();
  void ShowLine(size_t line);
  int64_t Scroll() const { return scroll_; }
  void ScrollTo(int64_t scroll);
  // Scrolls to a position, unless negative, and to a line; and again whenever the window changes
  // its size, until the user scrolls or selects. A new window gets its size in several steps.
  void RestorePlace(int64_t scroll, size_t line);
  // Whether at least a part of the line is visible; false for kNoLine.
  bool InSight(size_t line) const;
  // The line at a point of the window; kNoLine if there is none.
  size_t LineAt(const wxPoint& point) const;
  // Lets the user rename a file in place.
  void EditName(size_t line);
  // The number of visible thumbnails not loaded yet.
  size_t MissingThumbnails();
  bool ListsNames() const;

 private:
  static constexpr int kPadding = 6;  // inside a cell, device-independent pixels
  struct Looks;
  void OnPaint(wxPaintEvent&);
  void Paint();
  void OnSize(wxSizeEvent&);
  void OnScroll(wxScrollWinEvent&);
  void OnWheel(wxMouseEvent&);
  void OnMouseDown(wxMouseEvent&);
  void OnMouseUp(wxMouseEvent&);
  void OnMouseMove(wxMouseEvent&);
  void OnDoubleClick(wxMouseEvent&);
  void OnRightDown(wxMouseEvent&);
  void OnKey(wxKeyEvent&);
  void OnChar(wxKeyEvent&);

  void MeasureCells();
  void DrawCell(wxDC& dc, size_t line, const Looks& looks);
  void DrawPicture(wxDC& dc, size_t line, const wxRect& square, const Looks& looks);
  void DrawPlaceholder(wxDC& dc, size_t line, const wxRect& square, CellTrouble trouble,
                       const Looks& looks);
  void DrawFolder(wxDC& dc, const wxRect& square);
  void DrawFolderPreview(wxDC& dc, size_t line, const wxRect& square);
  void DrawHeadings(wxDC& dc, const Looks& looks);
  void DrawTrouble(wxDC& dc, const wxRect& square, CellTrouble trouble, const Looks& looks,
                   const wxColour& text);
  const wxBitmap& PlaceholderBitmap(bool unreadable, int side, const wxColour& background);
  // A name as it fits a cell, and its width.
  struct CutText {
    wxString text;
    int width = 0;
  };
  const CutText& CutName(wxDC& dc, const std::string& name, int width);
  int NameWidth() const;
  void CutNamesAhead();
  const wxBitmap& BitmapOfThumbnail(const ThumbnailPointer& thumbnail);
  ThumbnailRequest RequestOf(size_t line) const;
  void WantFolders(const CellLayout::Range& lines, std::vector<ThumbnailRequest>& requests);
  std::vector<ThumbnailRequest> StandInsFor(const CellLayout::Range& lines) const;
  void WaitForRest();
  size_t RoomAhead(const CellLayout::Range& visible);
  void ShowRestored();
  void DropBitmaps();
  wxRect EditorPlace() const;
  void KeepEditing();
  void MoveFocus(Step step, const wxKeyEvent& event);
  void ReportFocus();
  void ReportSelection();
  void UpdateScrollbar();
  void UpdateTip(size_t line);

  BrowserModel& model_;
  ThumbnailService& thumbnails_;
  const Events events_;
  CellLayout layout_;
  int64_t scroll_ = 0;
  struct RestoredPlace {
    int64_t scroll;
    size_t line;
  };
  std::optional<RestoredPlace> restored_;
  int direction_ = 1;  // of scrolling; what is ahead is loaded first
  int square_ = 96;    // size of the picture in a cell, 0: none
  int textHeight_ = 16;
  int painted_ = 0;     // 1: anything, 2: files
  std::string filled_;  // the folder whose visible cells were all filled

  struct Drawn {
    ThumbnailPointer thumbnail;
    wxBitmap bitmap;
    uint64_t paint;  // in which it was last drawn
  };
  std::unordered_map<const Thumbnail*, Drawn> bitmaps_;
  uint64_t paints_ = 0;
  struct DrawnPlaceholder {
    bool unreadable;
    int side;
    wxColour background;
    wxBitmap bitmap;
  };
  std::deque<DrawnPlaceholder> placeholders_;
  std::unordered_map<std::string, CutText> cutNames_;
  bool resting_ = false;  // nothing has moved for a while
  wxTimer restTimer_;     // until then
  wxTimer aheadTimer_;  // until the next names are cut
  int cutWidth_ = 0;

  std::optional<wxPoint> pressed_;  // where the left button was pressed, in list coordinates
  size_t pressedLine_ = kNoLine;
  bool banding_ = false;
  wxPoint bandEnd_;
  std::string typed_;
  double typedAt_ = 0;
  wxTimer bandTimer_;
  HoverTip tip_;
  InPlaceEditor editor_;
  size_t editedLine_ = kNoLine;
  std::string editedPath_;
};

}  // namespace fotomill::desktop
