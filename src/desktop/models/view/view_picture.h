#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "core/status.h"
#include "core/workers/latest_work.h"
#include "desktop/models/drawing/rgb_image.h"
#include "picture/picture_record.h"
#include "platform/files.h"
#include "picture/read_request.h"
#include "processing/geometry/orient.h"
#include "settings/job_options.h"

namespace fotomill::desktop {

// How a picture is to look, whichever it is.
struct ViewLook {
  bool profiles = false;   // in the colors that its color profile means
  bool keepAlpha = false;  // with its alpha plane, instead of on ViewModeBackground

  // From the keys as they are now.
  static ViewLook FromSettings();
  bool operator==(const ViewLook&) const = default;
};

// The color profile of the screen that pictures are made for from here on; empty for sRGB. To be
// told before the first picture is asked for.
void SetScreenProfile(std::vector<uint8_t> profile);

// A picture as a view window wants it: a page of a file, with the size of the window that it is to
// fit.
struct ViewRequest {
  std::string path;
  int32_t page = 0;
  int32_t fitWidth = 0, fitHeight = 0;  // device pixels, 0 for none
  ViewLook look = ViewLook::FromSettings();
  ReadOptions read = ReadOptionsFromSettings();

  // Whether both mean the same pixels, whatever window they are to fit.
  bool SamePicture(const ViewRequest& other) const {
    return path == other.path && page == other.page && look == other.look;
  }
};

// Pixels of 24 bits with their alpha plane, which is empty where all are opaque.
struct ViewPixels {
  PackedImage image, alpha;
};

// A decoded picture: upright, 24 bits, with an alpha plane only if its look wants it and not all of
// it is opaque.
struct ViewPicture {
  ViewRequest request;
  platform::FileFacts facts;  // of the file, as it was read
  Status status = Status::Ok;
  std::string problem;             // why there is no picture, for people; empty if Ok
  PicturePointer picture;          // null unless Ok
  // as large as the fit of the request's window; empty where that is the picture's own size or more
  ViewPixels fitted;
  std::vector<std::string> photo;  // what the camera wrote about it, in lines
  double seconds = 0;              // that decoding took

  // What it takes of memory, for caches.
  uint64_t Bytes() const;
  // Whether the file has become another one since.
  bool HasChanged() const;
};
// Shared between threads; no one changes it once it is made.
using ViewPicturePointer = std::shared_ptr<const ViewPicture>;

// "4000 x 3000 pixels, 3.2 MB, 25%" of a picture at a scale, and whether its file is incomplete.
std::string SizeAndZoom(const PictureRecord& picture, double scale);

// A decoded picture's pixels for other programs: on a background, 0x00BBGGRR, and in sRGB whatever
// the screen's colors are.
Status PixelsForOthers(const ViewPicture& view, Color background, RgbImage& pixels);

// Makes a decoded picture what the request of `view` asks for. Statuses of PrepareForDisplay.
Status PrepareView(PicturePointer picture, ViewPicture& view);
// Decodes and prepares a picture; never null, its status tells a failure. Any thread.
ViewPicturePointer LoadViewPicture(const ViewRequest& request, ProgressSink* progress = nullptr);
// A turned copy of a picture that was loaded; null if there is no memory for it.
ViewPicturePointer TurnedView(const ViewPicture& view, Orientation turn);

// Decodes pictures ahead, apart, and keeps those that are wanted up to a number of bytes.
class ViewLoader {
 public:
  // How far a file is decoded, in percent, a few times a second at most.
  using Progress = std::function<void(const std::string& path, int percent)>;
  // `wake` is called on a thread of the pool whenever a wanted picture is there, `progress` on the
  // way to it.
  ViewLoader(uint64_t capacity, std::function<void()> wake, Progress progress = {});
  ~ViewLoader() = default;  // waits for the picture that is decoded
  ViewLoader(const ViewLoader&) = delete;
  ViewLoader& operator=(const ViewLoader&) = delete;

  // What is wanted from here on, most urgent first. Pictures that are not among these are given
  // back; what does not fit into the capacity beside more urgent ones is not decoded, the first one
  // always is.
  void Want(std::vector<ViewRequest> requests);
  // The picture of a request if it is there, whatever window it was fitted to.
  ViewPicturePointer Find(const ViewRequest& request) const;
  // Forgets a picture whose file has changed.
  void Forget(const std::string& path);

 private:
  LatestWork::Piece Next();
  void Decode(const ViewRequest& request);
  bool NextRequest(ViewRequest& request);
  void DropUnwanted();

  const uint64_t capacity_;
  const std::function<void()> wake_;
  const Progress progress_;
  mutable std::mutex mutex_;
  std::vector<ViewRequest> requests_;
  std::vector<ViewPicturePointer> pictures_;
  bool full_ = false;
  LatestWork work_;  // last: it uses the rest
};

// Scales pictures apart; only the latest request counts.
class ViewScaler {
 public:
  // `wake` is called on a thread of the pool when Fetch has something.
  explicit ViewScaler(std::function<void()> wake);
  ~ViewScaler() = default;
  ViewScaler(const ViewScaler&) = delete;
  ViewScaler& operator=(const ViewScaler&) = delete;

  // Wants the picture scaled to a size in device pixels, in place of an earlier request.
  void Request(ViewPicturePointer picture, int32_t width, int32_t height);
  // A picture, and its pixels in the size that was wanted.
  struct Scaled {
    ViewPicturePointer picture;
    ViewPixels pixels;
  };
  // What was finished since the last call, null if nothing.
  std::unique_ptr<Scaled> Fetch();

 private:
  LatestWork::Piece Next();
  void Scale(ViewPicturePointer picture, int32_t width, int32_t height);

  const std::function<void()> wake_;
  std::mutex mutex_;
  ViewPicturePointer request_;
  int32_t width_ = 0, height_ = 0;
  std::unique_ptr<Scaled> finished_;
  LatestWork work_;  // last: it uses the rest
};

}  // namespace fotomill::desktop
