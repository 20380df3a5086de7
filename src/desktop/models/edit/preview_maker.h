#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "core/workers/latest_work.h"
#include "desktop/models/view/view_picture.h"
#include "desktop/models/view/view_transform.h"
#include "operations/engine.h"
#include "operations/macros.h"
#include "operations/recipe.h"
#include "picture/rectangle.h"
#include "processing/faces/face_options.h"

namespace fotomill::desktop {

// What an Edit window shows of the result.
struct PreviewRequest {
  uint64_t steps = 0;  // a number that changes with `list`
  std::vector<Step> list;
  ViewPlace place;                // zoom and position
  int32_t width = 0, height = 0;  // of the pane, in device pixels
  uint64_t view = 0;              // a number that changes with place and size
  bool original = false;          // the picture without steps is wanted as well
  double asked = 0;               // when, in seconds of the monotonic clock; set by the maker
};

// A picture made for a request: 24 bits, in the screen's colors.
struct Preview {
  uint64_t steps = 0, view = 0;  // of the request
  bool original = false;         // without steps
  bool exact = false;            // false: made from a reduced picture
  Size whole{0, 0};              // of the whole result, in its pixels; approximate unless exact
  Rectangle area;                // the part of it that the pixels show
  ViewPixels pixels;             // of any size
  Status status = Status::Ok;
  std::string problem;  // error message; empty if Ok
  double seconds = 0;   // since the request
};
using PreviewPointer = std::shared_ptr<const Preview>;

// The part of a picture of size `whole` that is visible in a pane.
Rectangle VisiblePart(const ViewTransform& transform, Size whole, int32_t width, int32_t height);

// Computes previews in the background. Every request is answered twice: at once from a picture of
// the size of the pane, then exactly, for the visible part. Only the latest request counts; work on
// earlier ones is dropped. If the last steps can be computed for a part and the picture is not
// reduced on the screen, the first answer is already exact.
class PreviewMaker {
 public:
  // `wake` is called on a pool thread when Fetch has results.
  explicit PreviewMaker(std::function<void()> wake);
  ~PreviewMaker();
  PreviewMaker(const PreviewMaker&) = delete;
  PreviewMaker& operator=(const PreviewMaker&) = delete;

  // The picture to work on; loaded with the next request. Window's thread.
  void SetPicture(const std::string& path);
  void Request(PreviewRequest request);
  // The results since the last call, oldest first.
  std::vector<PreviewPointer> Fetch();

 private:
  struct Source;
  using SourcePointer = std::shared_ptr<Source>;
  // A piece of work, which stops when `number` is no longer the latest request.
  struct Job {
    PreviewRequest request;
    SourcePointer source;
    uint64_t number = 0;
  };

  LatestWork::Piece NextQuick();
  LatestWork::Piece NextExact();
  using Make = Status (PreviewMaker::*)(const Job& job, Preview& preview);
  void Run(const Job& job, bool exact);
  void MakeOne(const Job& job, bool original, Make make);
  Status MakeReduced(const Job& job, Preview& preview);
  Status MakeExact(const Job& job, Preview& preview);
  EngineOptions OptionsFor(const Job& job) const;
  bool StartsExact(const Job& job) const;
  void Answer(const Job& job, Status status, std::shared_ptr<Preview> preview);
  bool GoesOn(uint64_t number) const { return number == latest_.load(); }

  const std::function<void()> wake_;
  std::mutex mutex_;
  std::atomic<uint64_t> latest_{0};  // number of the latest request
  PreviewRequest request_;
  SourcePointer source_;
  bool quickWaits_ = false, exactWaits_ = false;
  std::vector<PreviewPointer> finished_;
  LatestWork quick_, exact_;  // must be last: they use the other members
};

}  // namespace fotomill::desktop
