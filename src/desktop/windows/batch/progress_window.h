#pragma once

#include <wx/frame.h>
#include <wx/gauge.h>
#include <wx/timer.h>

#include <functional>
#include <string>
#include <vector>

#include "batch/progress_model.h"
#include "desktop/models/batch/progress_status.h"
#include "desktop/windows/batch/progress_list.h"
#include "desktop/windows/batch/progress_thumbnails.h"

class wxButton;
class wxStaticText;

namespace fotomill::desktop {

// The progress box: lists processed files, with Abort while the batch runs and Close afterwards.
// Not modal.
class ProgressWindow : public wxFrame {
 public:
  // Callbacks to the owner, on the main thread.
  struct Events {
    std::function<void()> abort;
    // the user has closed the box
    std::function<void(ProgressWindow& box)> closed;
    // show the failed files in their browser
    std::function<void(const std::vector<std::string>& files)> selectFailed;
  };
  ProgressWindow(wxWindow* frame, ThumbnailService& thumbnails, Events events);

  // Adds a line. `source` is the file of the
  // line, for its thumbnail; may be empty.
  void AddLine(const ProgressLine& line, const std::string& source);
  void SetStatus(const std::string& status);
  void SetWork(const ProgressWork& work);
  // Sets the number of queued batches.
  void SetWaiting(size_t batches);
  // The batch has ended and the box stays open: closing lines are shown, Close is enabled, and the
  // status line is final.
  void StayOpen(const std::string& status);
  // Whether StayOpen was called.
  bool StaysOpen() const { return facts_.ended; }

 private:
  class PlainList;
  wxWindow* MakeList(bool scrollBar);
  wxSize InUnits(const wxSize& pixels) const;
  wxRect InPixels(const Rectangle& units) const;
  void LayOut();
  // Collects updates: many lines at once cost as much as one.
  void GatherNews();
  void ShowNews();
  void CopyList();
  std::vector<std::string> FailedFiles() const;
  int FirstVisible() const;
  void ShowFrom(int row, int selected);

  const Events events_;
  const ProgressSettings settings_;
  ProgressThumbnails thumbnails_;
  std::vector<ProgressRow> rows_;
  double started_ = 0;
  ProgressFacts facts_;
  std::string shownLine_;
  bool focusesClose_ = false;  // when the box is next activated
  wxTimer newsTimer_;
  wxWindow* panel_ = nullptr;
  wxWindow* list_ = nullptr;
  ProgressList* drawn_ = nullptr;  // the list, if owner-drawn
  PlainList* plain_ = nullptr;  // the list, if plain text
  wxStaticText* status_ = nullptr;
  wxGauge* bar_ = nullptr;
  wxButton* abort_ = nullptr;
  wxButton* close_ = nullptr;
  wxButton* copy_ = nullptr;  // for failed files; hidden if there are none
  wxButton* select_ = nullptr;
};

}  // namespace fotomill::desktop
