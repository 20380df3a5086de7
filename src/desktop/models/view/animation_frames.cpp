#include "desktop/models/view/animation_frames.h"

#include <algorithm>

#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "registry/registry.h"

namespace fotomill::desktop {

namespace {

// Larger canvases are not played: besides the canvas, a copy, the frame made from it and the one on
// the screen must fit in memory.
constexpr uint64_t kMostCanvasBytes = uint64_t{256} << 20;

// Copies the animation's current frame from the canvas to a new record.
Status CopyFrame(const PictureRecord& facts, const Canvas& canvas, PicturePointer& picture) {
  picture = NewPictureRecord(facts.defaultColour);
  if (picture == nullptr) return Status::MemoryAllocationError;
  picture->fileName = facts.fileName;
  picture->typeName = facts.typeName;
  picture->fileSize = facts.fileSize;
  picture->formatIndex = facts.formatIndex;
  picture->pageCount = facts.pageCount;
  picture->width = canvas.image.Width();
  picture->height = canvas.image.Height();
  picture->bitsPerPixel = 24;
  picture->alphaFlags = kHasAlpha;
  picture->metadata = facts.metadata;
  RETURN_IF_BAD(NewPackedImage(picture->width, picture->height, nullptr, 24, picture->image, platform::Fill::Unset));
  RETURN_IF_BAD(NewAlphaPlane(picture->width, picture->height, picture->alpha, platform::Fill::Unset));
  std::ranges::copy(canvas.image.Rows(), picture->image.Rows().begin());
  std::ranges::copy(canvas.alpha.Rows(), picture->alpha.Rows().begin());
  return Status::Ok;
}

}  // namespace

AnimationFrames::AnimationFrames(ViewRequest request, uint64_t capacity, std::function<void()> wake)
    : capacity_(capacity),
      wake_(std::move(wake)),
      request_(std::move(request)),
      work_(Lane::Urgent, 1, [this] { return Next(); }) {
  work_.Look();
}

AnimationFrames::~AnimationFrames() {
  const std::lock_guard lock(mutex_);
  stop_ = true;
}

size_t AnimationFrames::Count() const {
  const std::lock_guard lock(mutex_);
  return delaysMs_.size();
}

Status AnimationFrames::Failure() const {
  const std::lock_guard lock(mutex_);
  return failure_;
}

int32_t AnimationFrames::DelayMs(size_t frame) const {
  const std::lock_guard lock(mutex_);
  return frame < delaysMs_.size() ? ShownDelayMs(delaysMs_[frame]) : 0;
}

int32_t AnimationFrames::Rounds() const {
  const std::lock_guard lock(mutex_);
  return rounds_;
}

void AnimationFrames::Want(size_t frame) {
  {
    const std::lock_guard lock(mutex_);
    if (frame == shown_ || frame >= frames_.size()) return;
    shown_ = frame;
    for (size_t i = 0; i < frames_.size(); ++i) {
      if (!Keeps(i)) frames_[i].reset();
    }
  }
  work_.Look();
}

ViewPicturePointer AnimationFrames::Find(size_t frame) const {
  const std::lock_guard lock(mutex_);
  return frame < frames_.size() ? frames_[frame] : nullptr;
}

void AnimationFrames::Fit(int32_t width, int32_t height) {
  {
    const std::lock_guard lock(mutex_);
    request_.fitWidth = width;
    request_.fitHeight = height;
  }
  work_.Look();
}

// The number of frames to keep, at least the current and the next one.
size_t AnimationFrames::Room() const {
  const uint64_t room = frameBytes_ == 0 ? 2 : std::max<uint64_t>(capacity_ / frameBytes_, 2);
  return static_cast<size_t>(std::min<uint64_t>(room, frames_.size()));
}

// If there is not enough room for all frames, a quarter of it is for those before the current one.
bool AnimationFrames::Keeps(size_t frame) const {
  const size_t count = frames_.size(), room = Room();
  if (room == count) return true;
  const size_t behind = (room - 1) / 4, ahead = room - 1 - behind;
  return (frame + count - shown_) % count <= ahead || (shown_ + count - frame) % count <= behind;
}

bool AnimationFrames::IsFitted(size_t frame) const {
  const ViewRequest& request = frames_[frame]->request;
  return request.fitWidth == request_.fitWidth && request.fitHeight == request_.fitHeight;
}

// The next frame to decode: the first missing one in playing order; then, if all are kept, the
// first one made for another window size.
bool AnimationFrames::NextFrame(size_t& frame) const {
  const size_t count = frames_.size();
  const auto first = [&](auto isWanted) {
    for (size_t i = 0; i < count; ++i) {
      frame = (shown_ + i) % count;
      if (isWanted(frame)) return true;
    }
    return false;
  };
  if (first([&](size_t i) { return frames_[i] == nullptr && (Keeps(i) || i == shown_); }))
    return true;
  return Room() == count && first([&](size_t i) { return !IsFitted(i); });
}

Status AnimationFrames::OpenFile() {
  RETURN_IF_BAD(LoadPictureInfo({.fileName = request_.path, .options = request_.read}, facts_));
  if (EstimateImageBytes(facts_->width, facts_->height, 32) > kMostCanvasBytes)
    return Status::MemoryAllocationError;
  return OpenAnimation({.fileName = request_.path, .options = request_.read}, animation_);
}

// Composes frames from `position_`, the animation's next one, up to `frame`. Null on failure; then
// there are no frames from `position_` on.
ViewPicturePointer AnimationFrames::Decode(size_t frame) {
  ViewRequest request;
  if (frame < position_) {
    animation_->Rewind();
    position_ = 0;
  }
  Status status = Status::Ok;
  for (; position_ <= frame; ++position_) {
    status = animation_->Next();
    const std::lock_guard lock(mutex_);
    request = request_;
    if (status != Status::Ok) failure_ = status;
    if (status != Status::Ok || stop_) return nullptr;
  }
  PicturePointer picture;
  status = CopyFrame(*facts_, animation_->Frame(), picture);
  auto view = std::make_shared<ViewPicture>();
  view->request = request;
  if (status == Status::Ok) status = PrepareView(std::move(picture), *view);
  if (status == Status::Ok) {
    view->picture->metadata = {};  // the same for all frames
    return view;
  }
  position_ = frame;
  const std::lock_guard lock(mutex_);
  failure_ = status;
  return nullptr;
}

void AnimationFrames::Keep(size_t frame, ViewPicturePointer picture) {
  frameBytes_ = std::max(frameBytes_, picture->Bytes());
  if (Keeps(frame) || frame == shown_) frames_[frame] = std::move(picture);
}

LatestWork::Piece AnimationFrames::Next() {
  const std::lock_guard lock(mutex_);
  if (!opened_) return [this] { Open(); };
  size_t frame = 0;
  if (stop_ || !NextFrame(frame)) return {};
  return [this, frame] { MakeFrame(frame); };
}

void AnimationFrames::Open() {
  const Status opened = Guarded([this] {
    const FolderScope folder(request_.path);
    return OpenFile();
  });
  {
    const std::lock_guard lock(mutex_);
    opened_ = true;
    failure_ = opened;
    if (opened == Status::Ok) {
      delaysMs_ = animation_->Delays();
      rounds_ = animation_->Rounds();
      frames_.resize(delaysMs_.size());
    }
  }
  wake_();
}

void AnimationFrames::MakeFrame(size_t frame) {
  ViewPicturePointer picture;
  const Status status = Guarded([&] { picture = Decode(frame); });
  {
    const std::lock_guard lock(mutex_);
    if (status != Status::Ok) failure_ = status;
    if (picture != nullptr) {
      Keep(frame, std::move(picture));
    } else if (!stop_) {  // later frames cannot be decoded either
      position_ = std::min(position_, frame);
      delaysMs_.resize(position_);
      frames_.resize(position_);
      shown_ = std::min(shown_, position_ == 0 ? 0 : position_ - 1);
    }
  }
  wake_();
}

}  // namespace fotomill::desktop
