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
  std::string source;  // the file that it is about; empty for none

  bool IsAboutFile() const { return line.item.file >= 0 && !source.empty(); }
  bool IsFailure() const { return line.item.status != Status::Ok && !line.item.skipped; }
};

// The list of a progress box that draws its rows, with the thumbnail of each file. Long lines are
// scrolled sideways: by the scroll bar, the wheel with Shift, or the Left and Right keys.
class ProgressList : public wxVListBox {
 public:
  // Rows and thumbnails must outlive it.
  ProgressList(wxWindow* parent, const std::vector<ProgressRow>& rows,
               ProgressThumbnails& thumbnails, const ProgressSettings& settings, long style);

  // Rows were added at the end, or thumbnails have come.
  void ShowNewRows();
  void ShowNewThumbnails();

 private:
  void OnDrawItem(wxDC& dc, const wxRect& rect, size_t n) const override;
  wxCoord OnMeasureItem(size_t n) const override;
  // Null for rows without one.
  ThumbnailPointer ThumbnailOf(const ProgressRow& row) const;
  void DrawThumbnail(wxDC& dc, const Thumbnail& thumbnail, const wxRect& place) const;
  wxString TextOf(const ProgressRow& row, int height) const;
  int Lead() const;  // what is in front of a row's text, at most
  void UpdateSideways();
  void ScrollSideways(int left);

  const std::vector<ProgressRow>& rows_;
  ProgressThumbnails& thumbnails_;
  const ProgressSettings settings_;
  size_t measured_ = 0;  // rows
  int widest_ = 0;       // text of them, in pixels
  int left_ = 0;         // what is scrolled out of sight
};

}  // namespace fotomill::desktop
