#include "batch/page_source.h"

#include <utility>

#include "processing/flatten.h"
#include "processing/geometry/cut.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

constexpr int32_t kPageDelayMs = 1000;  // for pages that become frames

}  // namespace

Status PageSource::Open(const ReadRequest& request) {
  request_ = request;
  RETURN_IF_BAD(LoadPictureInfo(request_, facts_));
  count_ = static_cast<size_t>(facts_->pageCount);
  const FormatEntry& row = FormatRow(facts_->formatIndex);
  if (row.animate == nullptr) return Status::Ok;
  ReadRequest whole = request_;  // truncated frames cannot be told from complete ones
  whole.partial = false;
  RETURN_IF_BAD(row.animate(whole, animation_));
  count_ = animation_->Delays().size();
  return Status::Ok;
}

Status PageSource::Next(PicturePointer& picture, int32_t& delayMs) {
  if (next_ >= count_) return Status::NoImages;
  PicturePointer made = NewPictureRecord(request_.options.alphaBackground);
  if (made == nullptr) return Status::MemoryAllocationError;
  made->fileName = facts_->fileName;
  made->formatIndex = facts_->formatIndex;
  made->stop = request_.stop;
  delayMs = kPageDelayMs;
  if (animation_ != nullptr) {
    RETURN_IF_BAD(NextFrame(*made, delayMs));
  } else {
    request_.page = static_cast<int32_t>(next_);
    made->pageCount = facts_->pageCount;
    RETURN_IF_BAD(ReadPicture(request_, *made));
  }
  ++next_;
  picture = std::move(made);
  return Status::Ok;
}

Status PageSource::NextFrame(PictureRecord& picture, int32_t& delayMs) {
  RETURN_IF_BAD(animation_->Next());
  const Canvas& frame = animation_->Frame();
  const Rectangle all{0, 0, frame.image.Width(), frame.image.Height()};
  RETURN_IF_BAD(CutImage(frame.image, all, picture.image));
  if (!IsOpaque(frame.alpha)) RETURN_IF_BAD(CutImage(frame.alpha, all, picture.alpha));
  delayMs = animation_->Delays()[next_];
  picture.width = all.width;
  picture.height = all.height;
  picture.bitsPerPixel = 24;
  picture.metadata = facts_->metadata;
  picture.comment = facts_->comment;
  picture.palette = facts_->palette;
  return Status::Ok;
}

}  // namespace fotomill
