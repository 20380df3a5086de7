#include "desktop/models/view/view_picture.h"

#include <algorithm>
#include <cmath>

#include "batch/picture_failure.h"
#include "core/choice_lists.h"
#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/view/photo_facts.h"
#include "desktop/models/view/view_transform.h"
#include "metadata/tags/sidecar.h"
#include "platform/clock.h"
#include "processing/color/color_transform.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

std::mutex screenMutex;
std::vector<std::vector<uint8_t>> screenProfiles;

// Empty for sRGB.
std::vector<uint8_t> ScreenProfile(size_t screen) {
  const std::lock_guard lock(screenMutex);
  return screen < screenProfiles.size() ? screenProfiles[screen] : std::vector<uint8_t>();
}

constexpr uint64_t kRecordBytes = 64 * 1024;  // of a decoded picture besides its pixels

ScaleFilter ShrinkFilter() {
  const ScaleFilter filter = ScaleFilterFromKey(settings.ResizeFilter);
  return filter == ScaleFilter::Nearest ? ScaleFilter::Bilinear : filter;
}

Status Shrink(const PictureRecord& picture, int32_t width, int32_t height, ViewPixels& shrunk) {
  return ScaleFiltered(picture.image, picture.alpha, {width, height}, ShrinkFilter(), shrunk.image,
                       shrunk.alpha);
}

// The transform for the thread's last profiles, as the pictures in a folder and frames of an
// animation mostly share theirs.
const ColorTransform& TransformOf(const std::vector<uint8_t>& profile,
                                  const std::vector<uint8_t>& screen) {
  thread_local std::vector<uint8_t> last, lastScreen;
  thread_local std::unique_ptr<ColorTransform> transform;
  if (transform == nullptr || profile != last || screen != lastScreen) {
    transform = std::make_unique<ColorTransform>(profile, screen);
    last = profile;
    lastScreen = screen;
  }
  return *transform;
}

// Forwards decoding progress, at a limited rate.
class ProgressReports : public ProgressSink {
 public:
  ProgressReports(const ViewLoader::Progress& report, const std::string& path)
      : report_(report), path_(path) {}

  void Step(int32_t done, int32_t total) override {
    const double now = platform::MonotonicSeconds();
    if (total <= 0 || now < next_) return;
    next_ = now + kSeconds;
    report_(path_, static_cast<int>(100 * static_cast<int64_t>(done) / total));
  }

 private:
  static constexpr double kSeconds = 0.1;  // between reports, and before the first one

  const ViewLoader::Progress& report_;
  const std::string& path_;
  double next_ = platform::MonotonicSeconds() + kSeconds;
};

Status LoadInto(const ViewRequest& request, ViewPicture& view, ProgressSink* progress) {
  PicturePointer picture;
  ReadRequest read{.fileName = request.path, .partial = true, .options = request.read};
  RETURN_IF_BAD(LoadPictureInfo(read, picture));
  read.page = request.page;
  read.progress = progress;
  RETURN_IF_BAD(ReadPicture(read, *picture));
  return PrepareView(std::move(picture), view);
}

}  // namespace

void SetScreenProfiles(std::vector<std::vector<uint8_t>> profiles) {
  const std::lock_guard lock(screenMutex);
  screenProfiles = std::move(profiles);
}

void ToScreenColors(const std::vector<uint8_t>& icc, size_t screen, PackedImage& image) {
  const std::vector<uint8_t> profile = ScreenProfile(screen);
  if (!icc.empty() || !profile.empty()) (void)TransformOf(icc, profile).Apply(image);
}

ViewLook ViewLook::FromSettings() {
  return {settings.ViewModeColorProfiles != 0, settings.ViewModeCheckerboard != 0};
}

uint64_t ViewPicture::Bytes() const {
  const auto bytes = [](const PackedImage& image, const PackedImage& alpha) {
    return image.Bytes().size() + alpha.Bytes().size();
  };
  return kRecordBytes + bytes(fitted.image, fitted.alpha) +
         (picture == nullptr ? 0 : bytes(picture->image, picture->alpha));
}

Status PrepareView(PicturePointer picture, ViewPicture& view) {
  const ViewRequest& request = view.request;
  // Before compositing with the background, whose color is already for the screen.
  if (request.look.profiles)
    ToScreenColors(picture->metadata.icc, request.look.screen, picture->image);
  if (request.look.keepAlpha) {
    RETURN_IF_BAD(PrepareWithAlpha(*picture));
  } else {
    RETURN_IF_BAD(PrepareForDisplay(*picture, static_cast<Color>(settings.ViewModeBackground)));
  }
  view.photo = PhotoFacts(picture->metadata.exif);
  ViewTransform fit;
  fit.SetPicture(picture->image.Width(), picture->image.Height());
  fit.SetWindow(request.fitWidth, request.fitHeight);
  if (request.fitWidth > 0 && fit.Scale() < 1) {
    RETURN_IF_BAD(Shrink(*picture, fit.ShownWidth(), fit.ShownHeight(), view.fitted));
  }
  view.picture = std::move(picture);
  return Status::Ok;
}

std::string SizeAndZoom(const PictureRecord& picture, double scale) {
  std::string text = Tr("%1 x %2 pixels, %3, %4%", picture.image.Width(), picture.image.Height(),
                        SizeText(picture.fileSize, choice::kSizeFitting), std::lround(scale * 100));
  if (picture.shortfall != Status::Ok) text += std::string(", ") + Tr("incomplete file");
  return text;
}

namespace {

platform::FileFacts SidecarFacts(const std::string& path) {
  const std::string sidecar = FindSidecar(path);
  return sidecar.empty() ? platform::FileFacts() : platform::FactsOf(sidecar);
}

}  // namespace

bool ViewPicture::HasChanged() const {
  const platform::FileFacts now = platform::FactsOf(request.path);
  const auto same = [](const platform::FileFacts& a, const platform::FileFacts& b) {
    return a.identity == b.identity && a.device == b.device && a.size == b.size &&
           a.modified == b.modified;
  };
  return !same(now, facts) || !same(SidecarFacts(request.path), sidecar);
}

Status PixelsForOthers(const ViewPicture& view, Color background, RgbImage& pixels) {
  RETURN_IF_BAD(ToRgb(view.picture->image, view.picture->alpha, background, pixels));
  const std::vector<uint8_t> screen = ScreenProfile(view.request.look.screen);
  if (!view.request.look.profiles || screen.empty()) return Status::Ok;
  PackedImage image;
  RETURN_IF_BAD(ToPacked(pixels, image));
  (void)ColorTransform(screen).Apply(image);
  return ToRgb(image, pixels);
}

ViewPicturePointer LoadViewPicture(const ViewRequest& request, ProgressSink* progress) {
  const double start = platform::MonotonicSeconds();
  auto view = std::make_shared<ViewPicture>();
  view->request = request;
  view->status = Guarded([&] {
    const FolderScope folder(request.path);
    view->facts = platform::FactsOf(request.path);
    view->sidecar = SidecarFacts(request.path);
    (void)ReadPictureTags(request.path, {}, view->tags);
    return LoadInto(request, *view, progress);
  });
  if (view->status != Status::Ok) view->problem = FailureText(request.path, view->status);
  view->seconds = platform::MonotonicSeconds() - start;
  return view;
}

ViewPicturePointer TurnedView(const ViewPicture& view, Orientation turn) {
  const PictureRecord& old = *view.picture;
  auto turned = std::make_shared<ViewPicture>();
  turned->request = view.request;
  turned->facts = view.facts;
  turned->tags = view.tags;
  turned->sidecar = view.sidecar;
  turned->photo = view.photo;
  turned->picture = NewPictureRecord(view.request.read.alphaBackground);
  if (turned->picture == nullptr) return nullptr;
  PictureRecord& picture = *turned->picture;
  if (OrientImage(old.image, turn, picture.image) != Status::Ok) return nullptr;
  if (!old.alpha.Empty() && OrientImage(old.alpha, turn, picture.alpha) != Status::Ok)
    return nullptr;
  picture.width = picture.image.Width();
  picture.height = picture.image.Height();
  picture.bitsPerPixel = old.bitsPerPixel;
  picture.palette = old.palette;
  picture.alphaFlags = old.alphaFlags;
  picture.fileName = old.fileName;
  picture.fileSize = old.fileSize;
  picture.formatIndex = old.formatIndex;
  picture.pageCount = old.pageCount;
  picture.page = old.page;
  picture.shortfall = old.shortfall;
  return turned;
}

ViewLoader::ViewLoader(uint64_t capacity, std::function<void()> wake, Progress progress)
    : capacity_(capacity),
      wake_(std::move(wake)),
      progress_(std::move(progress)),
      work_(Lane::Urgent, 1, [this] { return Next(); }) {}

void ViewLoader::Want(std::vector<ViewRequest> requests) {
  {
    const std::lock_guard lock(mutex_);
    requests_ = std::move(requests);
    full_ = false;
    DropUnwanted();
  }
  work_.Look();
}

ViewPicturePointer ViewLoader::Find(const ViewRequest& request) const {
  const std::lock_guard lock(mutex_);
  for (const ViewPicturePointer& picture : pictures_) {
    if (picture->request.SamePicture(request)) return picture;
  }
  return nullptr;
}

void ViewLoader::Forget(const std::string& path) {
  const std::lock_guard lock(mutex_);
  std::erase_if(pictures_,
                [&](const ViewPicturePointer& picture) { return picture->request.path == path; });
}

// The most urgent request not yet loaded or failed.
bool ViewLoader::NextRequest(ViewRequest& request) {
  if (full_) return false;
  for (const ViewRequest& candidate : requests_) {
    const bool there = std::any_of(
        pictures_.begin(), pictures_.end(),
        [&](const ViewPicturePointer& picture) { return picture->request.SamePicture(candidate); });
    if (there) continue;
    request = candidate;
    return true;
  }
  return false;
}

// Drops pictures that are no longer requested, then the least urgent ones beyond the capacity.
void ViewLoader::DropUnwanted() {
  std::vector<ViewPicturePointer> kept;
  uint64_t bytes = 0;
  for (const ViewRequest& request : requests_) {
    for (const ViewPicturePointer& picture : pictures_) {
      if (!picture->request.SamePicture(request)) continue;
      if (!kept.empty() && bytes + picture->Bytes() > capacity_) {
        full_ = true;
        continue;
      }
      bytes += picture->Bytes();
      kept.push_back(picture);
    }
  }
  pictures_ = std::move(kept);
}

LatestWork::Piece ViewLoader::Next() {
  const std::lock_guard lock(mutex_);
  ViewRequest request;
  if (!NextRequest(request)) return {};
  return [this, request = std::move(request)] { Decode(request); };
}

void ViewLoader::Decode(const ViewRequest& request) {
  ProgressReports reports(progress_, request.path);
  ViewPicturePointer picture = LoadViewPicture(request, progress_ ? &reports : nullptr);
  {
    const std::lock_guard lock(mutex_);
    pictures_.push_back(std::move(picture));
    DropUnwanted();
  }
  wake_();
}

ViewScaler::ViewScaler(std::function<void()> wake)
    : wake_(std::move(wake)), work_(Lane::Urgent, 1, [this] { return Next(); }) {}

void ViewScaler::Request(ViewPicturePointer picture, int32_t width, int32_t height) {
  {
    const std::lock_guard lock(mutex_);
    request_ = std::move(picture);
    width_ = width;
    height_ = height;
  }
  work_.Look();
}

std::unique_ptr<ViewScaler::Scaled> ViewScaler::Fetch() {
  const std::lock_guard lock(mutex_);
  return std::move(finished_);
}

LatestWork::Piece ViewScaler::Next() {
  const std::lock_guard lock(mutex_);
  if (request_ == nullptr) return {};
  return [this, picture = std::exchange(request_, nullptr), width = width_, height = height_] {
    Scale(picture, width, height);
  };
}

void ViewScaler::Scale(ViewPicturePointer picture, int32_t width, int32_t height) {
  auto scaled = std::make_unique<Scaled>();
  scaled->picture = std::move(picture);
  const Status status = Shrink(*scaled->picture->picture, width, height, scaled->pixels);
  {
    const std::lock_guard lock(mutex_);
    if (status != Status::Ok || request_ != nullptr) return;
    finished_ = std::move(scaled);
  }
  wake_();
}

}  // namespace fotomill::desktop
