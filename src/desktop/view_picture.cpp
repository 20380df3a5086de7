#include "desktop/view_picture.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "core/settings.h"
#include "picture/registry.h"
#include "platform/clock.h"
#include "processing/colour_transform.h"
#include "processing/pixel_rows.h"
#include "processing/scale.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kRecordBytes = 64 * 1024;  // of a decoded picture beside its pixels

ScaleFilter ShrinkFilter() {
  const ScaleFilter filter = ScaleFilterFromKey(settings.ResizeFilter);
  return filter == ScaleFilter::Nearest ? ScaleFilter::Bilinear : filter;
}

Status Shrink(const PackedImage& image, int32_t width, int32_t height, PackedImage& shrunk) {
  PackedImage noAlpha, noShrunkAlpha;
  return ScaleFiltered(image, noAlpha, {width, height}, ShrinkFilter(), shrunk, noShrunkAlpha);
}

Status LoadInto(const ViewWish& wish, ViewPicture& view) {
  PicturePointer picture;
  RETURN_IF_BAD(LoadPictureInfo(wish.path.c_str(), picture));
  picture->page = wish.page;
  RETURN_IF_BAD(ReadPicture(*picture));
  // Before the background joins in, whose colour is the screen's.
  if (wish.look.profiles && !picture->metadata.icc.empty()) ColourTransform(picture->metadata.icc).Apply(picture->image);
  RETURN_IF_BAD(PrepareForDisplay(*picture, static_cast<Color>(settings.ViewModeBackground)));
  ViewTransform fit;
  fit.SetPicture(picture->image.Width(), picture->image.Height());
  fit.SetWindow(wish.fitWidth, wish.fitHeight);
  if (wish.fitWidth > 0 && fit.Scale() < 1) {
    RETURN_IF_BAD(Shrink(picture->image, fit.ShownWidth(), fit.ShownHeight(), view.fitted));
  }
  view.picture = std::move(picture);
  return Status::Ok;
}

}  // namespace

ViewLook ViewLook::FromSettings() { return {settings.ViewModeColorProfiles != 0}; }

uint64_t ViewPicture::Bytes() const {
  return kRecordBytes + fitted.Bytes().size() + (picture == nullptr ? 0 : picture->image.Bytes().size());
}

ViewPicturePointer LoadViewPicture(const ViewWish& wish) {
  const double start = platform::MonotonicSeconds();
  auto view = std::make_shared<ViewPicture>();
  view->wish = wish;
  view->status = LoadInto(wish, *view);
  view->seconds = platform::MonotonicSeconds() - start;
  return view;
}

ViewLoader::ViewLoader(uint64_t capacity, std::function<void()> wake)
    : capacity_(capacity), wake_(std::move(wake)), worker_([this] { Work(); }) {}

ViewLoader::~ViewLoader() {
  {
    const std::lock_guard lock(mutex_);
    stop_ = true;
  }
  wanted_.notify_all();
  worker_.join();
}

void ViewLoader::Want(std::vector<ViewWish> wishes) {
  {
    const std::lock_guard lock(mutex_);
    wishes_ = std::move(wishes);
    full_ = false;
    DropUnwanted();
  }
  wanted_.notify_all();
}

ViewPicturePointer ViewLoader::Find(const ViewWish& wish) const {
  const std::lock_guard lock(mutex_);
  for (const ViewPicturePointer& picture : pictures_) {
    if (picture->wish.SamePicture(wish)) return picture;
  }
  return nullptr;
}

void ViewLoader::Forget(const std::string& path) {
  const std::lock_guard lock(mutex_);
  std::erase_if(pictures_, [&](const ViewPicturePointer& picture) { return picture->wish.path == path; });
}

// The most urgent wish that has no picture yet and may still have one.
bool ViewLoader::NextWish(ViewWish& wish) {
  if (full_) return false;
  for (const ViewWish& candidate : wishes_) {
    const bool there = std::any_of(pictures_.begin(), pictures_.end(),
                                   [&](const ViewPicturePointer& picture) { return picture->wish.SamePicture(candidate); });
    if (there) continue;
    wish = candidate;
    return true;
  }
  return false;
}

// Pictures that nobody wants go, then, from the least urgent on, those beyond the capacity.
void ViewLoader::DropUnwanted() {
  std::vector<ViewPicturePointer> kept;
  uint64_t bytes = 0;
  for (const ViewWish& wish : wishes_) {
    for (const ViewPicturePointer& picture : pictures_) {
      if (!picture->wish.SamePicture(wish)) continue;
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

void ViewLoader::Work() {
  std::unique_lock lock(mutex_);
  ViewWish wish;
  while (true) {
    wanted_.wait(lock, [&] { return stop_ || NextWish(wish); });
    if (stop_) return;
    lock.unlock();
    ViewPicturePointer picture = LoadViewPicture(wish);
    lock.lock();
    pictures_.push_back(std::move(picture));
    DropUnwanted();
    lock.unlock();
    wake_();
    lock.lock();
  }
}

ViewScaler::ViewScaler(std::function<void()> wake) : wake_(std::move(wake)), worker_([this] { Work(); }) {}

ViewScaler::~ViewScaler() {
  {
    const std::lock_guard lock(mutex_);
    stop_ = true;
  }
  requested_.notify_all();
  worker_.join();
}

void ViewScaler::Request(ViewPicturePointer picture, int32_t width, int32_t height) {
  {
    const std::lock_guard lock(mutex_);
    request_ = std::move(picture);
    width_ = width;
    height_ = height;
  }
  requested_.notify_all();
}

std::unique_ptr<ViewScaler::Scaled> ViewScaler::Take() {
  const std::lock_guard lock(mutex_);
  return std::move(finished_);
}

void ViewScaler::Work() {
  std::unique_lock lock(mutex_);
  while (true) {
    requested_.wait(lock, [this] { return stop_ || request_ != nullptr; });
    if (stop_) return;
    auto scaled = std::make_unique<Scaled>();
    scaled->picture = std::exchange(request_, nullptr);
    const int32_t width = width_, height = height_;
    lock.unlock();
    const Status status = Shrink(scaled->picture->picture->image, width, height, scaled->image);
    lock.lock();
    if (status != Status::Ok || request_ != nullptr) continue;
    finished_ = std::move(scaled);
    lock.unlock();
    wake_();
    lock.lock();
  }
}

namespace {

// One row of samples between four pixels each. Positions are in 1/65536 of a source pixel.
void DrawBetween(const PackedImage& source, const std::vector<int64_t>& columns, int64_t row, uint8_t* rgb) {
  const int32_t y0 = static_cast<int32_t>(row >> 16), y1 = std::min(y0 + 1, source.Height() - 1);
  const int32_t v = static_cast<int32_t>(row & 0xffff) >> 8;
  const uint8_t* upper = source.Row(y0).data();
  const uint8_t* lower = source.Row(y1).data();
  for (const int64_t column : columns) {
    const int32_t x0 = static_cast<int32_t>(column >> 16), x1 = std::min(x0 + 1, source.Width() - 1);
    const int32_t u = static_cast<int32_t>(column & 0xffff) >> 8;
    for (int32_t channel = 2; channel >= 0; --channel) {
      const int32_t top = upper[3 * x0 + channel] * (256 - u) + upper[3 * x1 + channel] * u;
      const int32_t bottom = lower[3 * x0 + channel] * (256 - u) + lower[3 * x1 + channel] * u;
      *rgb++ = static_cast<uint8_t>((top * (256 - v) + bottom * v + 32768) >> 16);
    }
  }
}

// The source position, in 1/65536 pixels, for each of the shown pixels from `first` on.
std::vector<int64_t> Positions(int32_t first, int32_t count, int32_t shown, int32_t size, bool between) {
  std::vector<int64_t> positions(static_cast<size_t>(count));
  const double step = static_cast<double>(size) / shown;
  const double last = size - (between ? 1.0 : 1.0 / 65536);
  for (int32_t i = 0; i < count; ++i) {
    const double position = (first + i + 0.5) * step - (between ? 0.5 : 0);
    positions[static_cast<size_t>(i)] = static_cast<int64_t>(std::clamp(position, 0.0, last) * 65536);
  }
  return positions;
}

}  // namespace

void DrawView(const PackedImage& source, const ViewTransform& transform, Color background, bool smooth, RgbImage& canvas) {
  const int32_t x = transform.X(), y = transform.Y();
  const int32_t left = std::max(x, 0), right = std::min(x + transform.ShownWidth(), canvas.width);
  const int32_t top = std::max(y, 0), bottom = std::min(y + transform.ShownHeight(), canvas.height);
  if (left > 0 || top > 0 || right < canvas.width || bottom < canvas.height) {
    canvas = FilledImage(canvas.width, canvas.height, background);
  }
  if (left >= right || top >= bottom || source.Empty() || source.Bits() != 24 || canvas.Empty()) return;
  const bool same = source.Width() == transform.ShownWidth() && source.Height() == transform.ShownHeight();
  const bool between = smooth && !same;
  const auto columns = Positions(left - x, right - left, transform.ShownWidth(), source.Width(), between);
  const auto rows = Positions(top - y, bottom - top, transform.ShownHeight(), source.Height(), between);
  for (int32_t line = top; line < bottom; ++line) {
    uint8_t* rgb = canvas.Row(line) + 3 * left;
    const int64_t row = rows[static_cast<size_t>(line - top)];
    if (between) {
      DrawBetween(source, columns, row, rgb);
      continue;
    }
    const uint8_t* bgr = source.Row(static_cast<int32_t>(row >> 16)).data();
    if (same) {
      SwapColors(bgr + 3 * (left - x), static_cast<size_t>(right - left), rgb);
      continue;
    }
    for (const int64_t column : columns) {
      const uint8_t* pixel = bgr + 3 * (column >> 16);
      for (int channel = 2; channel >= 0; --channel) *rgb++ = pixel[channel];
    }
  }
}

}  // namespace fotomill::desktop
