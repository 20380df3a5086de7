#pragma once

#include <wx/vlbox.h>

#include <functional>
#include <string>
#include <vector>

#include "batch/progress_model.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "desktop/windows/batch/progress_thumbnails.h"

namespace fotomill::desktop {

// A line of a progress box.
struct ProgressRow {
  ProgressLine line;
  std::string source;  // the file of the line; may be empty

  bool IsAboutFile() const { return line.item.file >= 0 && !source.empty(); }
  bool IsFailure() const { return line.item.status != Status::Ok && !line.item.skipped; }
};

// The owner-drawn list of a progress box, with the thumbnail of each file. Long lines scroll
// horizontally: with the scroll bar, Shift and the wheel, or the Left and Right keys.
class ProgressList : public wxVListBox {
 public:
  // `rows` and `thumbnails` must outlive this object.
  ProgressList(wxWindow* parent, const std::vector<ProgressRow>& rows,
               ProgressThumbnails& thumbnails, const ProgressSettings& settings, long style);

  // Call after rows were added at the end, or thumbnails have been loaded.
  void ShowNewRows();
  void ShowNewThumbnails();

 private:
  void OnDrawItem(wxDC& dc, const wxRect& rect, size_t n) const override;
  wxCoord OnMeasureItem(size_t n) const override;
  // Null if the row has none.
  ThumbnailPointer ThumbnailOf(const ProgressRow& row) const;
  void DrawThumbnail(wxDC& dc, const Thumbnail& thumbnail, const wxRect& place) const;
  wxString TextOf(const ProgressRow& row, int height) const;
  int Lead() const;  // maximum width before a row's text
  void UpdateSideways();
  void ScrollSideways(int left);

  const std::vector<ProgressRow>& rows_;
  ProgressThumbnails& thumbnails_;
  const ProgressSettings settings_;
  size_t measured_ = 0;  // number of rows
  int widest_ = 0;       // of the measured texts, in pixels
  int left_ = 0;         // horizontal scroll position
};

}  // namespace fotomill::desktop
