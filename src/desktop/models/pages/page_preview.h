#pragma once

#include <atomic>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "core/workers/latest_work.h"
#include "core/workers/stop_token.h"
#include "desktop/models/drawing/rgb_image.h"
#include "pages/page_run.h"

namespace fotomill::desktop {

// What a window wants to show.
struct PageRequest {
  uint64_t order = 0;  // another number for other options
  PageRunOptions options;
  size_t page = 0;                // the last one if there are fewer
  int32_t width = 0, height = 0;  // pane, device pixels
  double zoom = 1;                // 1: the page fits the pane
};

// A page as it is printed.
struct PageView {
  uint64_t order = 0;
  size_t page = 0, pages = 0;    // no pages if no picture can be read
  double width = 0, height = 0;  // of the page, in millimeters
  double dpi = 0;                // at which it is drawn
  Status status = Status::Ok;
  RgbImage image;
  std::vector<std::string> problems;  // a line for each picture that cannot be shown
  size_t leftOut = 0;                 // readable pictures that are on no page
};
using PageViewPointer = std::shared_ptr<const PageView>;

// Draws pages in the background. Only the latest request counts; work on earlier ones is dropped.
// Facts of the pictures are read once, and the last pages are kept.
class PagePreview {
 public:
  // `wake` is called on a pool thread when Fetch has a page.
  PagePreview(std::vector<BatchFile> files, std::function<void()> wake);
  ~PagePreview();
  PagePreview(const PagePreview&) = delete;
  PagePreview& operator=(const PagePreview&) = delete;

  void Request(PageRequest request);
  // The latest page since the last call; null if there is none.
  PageViewPointer Fetch();

 private:
  LatestWork::Piece Next();
  void Run(const PageRequest& request, uint64_t number);
  Status Make(const PageRequest& request, uint64_t number, PageView& view);
  void AddFacts(PageView& view) const;
  void Keep(const PageViewPointer& view);
  PageViewPointer Kept(const PageView& view) const;
  bool GoesOn(uint64_t number) const { return number == latest_.load(); }

  const std::vector<BatchFile> files_;
  const std::function<void()> wake_;
  const StopSource closing_;
  std::mutex mutex_;
  std::atomic<uint64_t> latest_{0};  // number of the latest request
  PageRequest request_;
  bool waits_ = false;
  PageViewPointer finished_;
  // Of the piece of work that runs; there is one at a time.
  std::unique_ptr<PageRun> run_;
  uint64_t runOrder_ = 0;
  bool drawing_ = false;
  uint64_t number_ = 0;
  std::deque<PageViewPointer> kept_;
  LatestWork work_;  // must be last: it uses the other members
};

}  // namespace fotomill::desktop
