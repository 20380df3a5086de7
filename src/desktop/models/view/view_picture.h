#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "core/status.h"
#include "core/workers/latest_work.h"
#include "desktop/models/drawing/rgb_image.h"
#include "metadata/tags/picture_tags.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "platform/files.h"
#include "processing/geometry/orient.h"
#include "settings/job_options.h"

namespace fotomill::desktop {

// Display options of pictures.
struct ViewLook {
  bool profiles = false;   // apply color profiles
  bool keepAlpha = false;  // keep the alpha plane instead of using ViewModeBackground
  size_t screen = 0;       // number of the screen whose profile applies

  // From the current settings.
  static ViewLook FromSettings();
  bool operator==(const ViewLook&) const = default;
};

// Sets the color profiles of the screens, by their number, for pictures made from now on; empty or
// missing: sRGB. Thread-safe.
void SetScreenProfiles(std::vector<std::vector<uint8_t>> profiles);
// Converts pixels with an ICC profile, empty for sRGB, to the colors of a screen. Any thread.
void ToScreenColors(const std::vector<uint8_t>& icc, size_t screen, PackedImage& image);

// A picture for a view window: a page of a
// file, and the size of the window to fit.
struct ViewRequest {
  std::string path;
  int32_t page = 0;
  int32_t fitWidth = 0, fitHeight = 0;  // device pixels, 0: none
  ViewLook look = ViewLook::FromSettings();
  ReadOptions read = ReadOptionsFromSettings();

  // Whether both have the same pixels, regardless of window size.
  bool SamePicture(const ViewRequest& other) const {
    return path == other.path && page == other.page && look == other.look;
  }
};

// Pixels of 24 bits with their alpha plane, empty if all are opaque.
struct ViewPixels {
  PackedImage image, alpha;
};

// A decoded picture: upright, 24 bits, with an alpha plane only if its look keeps it and it is not
// opaque.
struct ViewPicture {
  ViewRequest request;
  platform::FileFacts facts;  // of the file when it was read
  Status status = Status::Ok;
  std::string problem;             // error message; empty if Ok
  PicturePointer picture;          // null unless Ok
  // scaled to fit the request's window; empty if the picture is smaller
  ViewPixels fitted;
  std::vector<std::string> photo;  // the camera's facts, in lines
  PictureTags tags;                // ratings, labels, keywords
  platform::FileFacts sidecar;     // of its file with tags, when it was read
  double seconds = 0;              // decoding time

  // Memory size, for caches.
  uint64_t Bytes() const;
  // Whether the file has changed since.
  bool HasChanged() const;
};
// Shared between threads; immutable.
using ViewPicturePointer = std::shared_ptr<const ViewPicture>;

// "4000 x 3000 pixels, 3.2 MB, 25%" for a picture at a scale; also shows if the file is incomplete.
std::string SizeAndZoom(const PictureRecord& picture, double scale);

// A decoded picture's pixels for other programs: on a background, 0x00BBGGRR, in sRGB regardless of
// the screen.
Status PixelsForOthers(const ViewPicture& view, Color background, RgbImage& pixels);

// Prepares a decoded picture for the request in `view`. Statuses of PrepareForDisplay.
Status PrepareView(PicturePointer picture, ViewPicture& view);
// Decodes and prepares a picture; never null, its status may be a failure. Any thread.
ViewPicturePointer LoadViewPicture(const ViewRequest& request, ProgressSink* progress = nullptr);
// A turned copy of a loaded picture; null if out of memory.
ViewPicturePointer TurnedView(const ViewPicture& view, Orientation turn);

// Decodes pictures ahead in the background, and caches requested ones up to a number of bytes.
class ViewLoader {
 public:
  // Decoding progress of a file, in percent, at most a few times a second.
  using Progress = std::function<void(const std::string& path, int percent)>;
  // `wake` is called on a pool thread when a requested picture is ready, `progress` while decoding
  // it.
  ViewLoader(uint64_t capacity, std::function<void()> wake, Progress progress = {});
  ~ViewLoader() = default;  // waits for the running decode
  ViewLoader(const ViewLoader&) = delete;
  ViewLoader& operator=(const ViewLoader&) = delete;

  // Sets the requested pictures, most urgent first.
  // All others are dropped; those beyond the capacity
  // are not decoded, except for the first one.
  void Want(std::vector<ViewRequest> requests);
  // The picture for a request if it is loaded, fitted to any window size.
  ViewPicturePointer Find(const ViewRequest& request) const;
  // Drops a picture whose file has changed.
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
  LatestWork work_;  // must be last: it uses the other members
};

// Scales pictures in the background; only the latest request counts.
class ViewScaler {
 public:
  // `wake` is called on a pool thread when Fetch has a result.
  explicit ViewScaler(std::function<void()> wake);
  ~ViewScaler() = default;
  ViewScaler(const ViewScaler&) = delete;
  ViewScaler& operator=(const ViewScaler&) = delete;

  // Requests a picture scaled to a size in device pixels, replacing an earlier request.
  void Request(ViewPicturePointer picture, int32_t width, int32_t height);
  // A picture, and its pixels in the requested size.
  struct Scaled {
    ViewPicturePointer picture;
    ViewPixels pixels;
  };
  // The result since the last call, null if there is none.
  std::unique_ptr<Scaled> Fetch();

 private:
  LatestWork::Piece Next();
  void Scale(ViewPicturePointer picture, int32_t width, int32_t height);

  const std::function<void()> wake_;
  std::mutex mutex_;
  ViewPicturePointer request_;
  int32_t width_ = 0, height_ = 0;
  std::unique_ptr<Scaled> finished_;
  LatestWork work_;  // must be last: it uses the other members
};

}  // namespace fotomill::desktop
