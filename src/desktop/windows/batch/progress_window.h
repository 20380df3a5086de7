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

// The progress box: lists files as they are processed, with Abort while the batch runs and Close
// after it. Not modal.
class ProgressWindow : public wxFrame {
 public:
  // What the box tells its owner. They are called on the main thread.
  struct Events {
    std::function<void()> abort;
    // the user is done with the box
    std::function<void(ProgressWindow& box)> closed;
    // shows the failed files in their browser
    std::function<void(const std::vector<std::string>& files)> selectFailed;
  };
  ProgressWindow(wxWindow* frame, ThumbnailService& thumbnails, Events events);

  // Shows what the batch reports. `source` is the file that the line is about, for its thumbnail;
  // empty for none.
  void AddLine(const ProgressLine& line, const std::string& source);
  void SetStatus(const std::string& status);
  void SetWork(const ProgressWork& work);
  // How many batches wait for this one.
  void SetWaiting(size_t batches);
  // The batch has ended and the box stays: closing lines are there, Close is live, and the status
  // line says the last.
  void StayOpen(const std::string& status);
  // Whether StayOpen was called.
  bool StaysOpen() const { return facts_.ended; }

 private:
  class PlainList;
  wxWindow* MakeList(bool scrollBar);
  wxSize InUnits(const wxSize& pixels) const;
  wxRect InPixels(const Rectangle& units) const;
  void LayOut();
  // Shows what has come since the last time: many lines at once cost as much as one.
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
  bool focusesClose_ = false;  // when the box next gets the keyboard
  wxTimer newsTimer_;
  wxWindow* panel_ = nullptr;
  wxWindow* list_ = nullptr;
  ProgressList* drawn_ = nullptr;  // the list, when the box draws it
  PlainList* plain_ = nullptr;  // the list, when it is one of texts
  wxStaticText* status_ = nullptr;
  wxGauge* bar_ = nullptr;
  wxButton* abort_ = nullptr;
  wxButton* close_ = nullptr;
  wxButton* copy_ = nullptr;  // what the errors leave to do; hidden until there are some
  wxButton* select_ = nullptr;
};

}  // namespace fotomill::desktop
