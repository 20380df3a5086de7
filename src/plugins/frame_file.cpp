#include "plugins/frame_file.h"

#include <algorithm>
#include <cstring>

#include "core/limits.h"
#include "picture/write_options.h"
#include "platform/paths.h"
#include "plugins/plugin_bitmap.h"
#include "processing/flatten.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr size_t kHead = PackedImage::kHeaderSize;
constexpr size_t kMostFrames = size_t{1} << 16;

uint64_t FrameBytes(const FrameFacts& facts) {
  return kHead + RowStride(facts.width, 32) * static_cast<uint64_t>(facts.height);
}

// Copies a bitmap of 32 bits as one of 24.
void DropAlpha(const FrameFacts& facts, std::span<const uint8_t> from, std::span<uint8_t> to) {
  const auto width = static_cast<size_t>(facts.width);
  const size_t stride = RowStride(facts.width, 24);
  std::ranges::copy(from.first(kHead), to.begin());
  to[14] = 24;
  const auto bytes = static_cast<uint32_t>(to.size() - kHead);
  for (size_t i = 0; i < 4; ++i) to[20 + i] = static_cast<uint8_t>(bytes >> (8 * i));
  for (size_t y = 0; y < static_cast<size_t>(facts.height); ++y) {
    const uint8_t* source = &from[kHead + 4 * width * y];
    uint8_t* target = &to[kHead + stride * y];
    for (size_t x = 0; x < width; ++x, source += 4, target += 3) std::memcpy(target, source, 3);
  }
}

}  // namespace

Status FrameFileWriter::Create() {
  if (!folder_.Create()) return Status::ErrorCreatingFile;
  facts.path = platform::JoinFolder(folder_.Path(), "frames");
  return out_.Create(facts.path) ? Status::Ok : Status::ErrorCreatingFile;
}

Status FrameFileWriter::Add(PictureRecord& picture, int32_t delayMs) {
  if (facts.delays.size() == kMostFrames) return Status::UnsuitableImage;
  if (facts.delays.empty()) {
    facts.width = picture.image.Width();
    facts.height = picture.image.Height();
  }
  if (picture.image.Width() != facts.width || picture.image.Height() != facts.height)
    return Status::UnsuitableImage;
  RETURN_IF_BAD(PromoteToAlpha(picture));
  bitmap_.resize(static_cast<size_t>(FrameBytes(facts)));
  PutModuleBitmap(picture.image, picture.alpha, bitmap_);
  facts.transparent |= !IsOpaque(picture.alpha);
  facts.delays.push_back(std::max(delayMs, 0));
  out_.Bytes(bitmap_);
  return out_.Failed() ? Status::ErrorWritingFile : Status::Ok;
}

Status FrameFileWriter::Finish() {
  if (facts.delays.empty()) return Status::EmptyImage;
  return CommitOutput(out_, {});
}

Status FrameFileReader::Open(const FrameFacts& facts) {
  const auto count = static_cast<int32_t>(std::min(facts.delays.size(), kMostFrames));
  RETURN_IF_BAD(CheckPackedSize(facts.width, facts.height, 24));
  if (count < 1 || !file_.OpenHead(facts.path.c_str(), 0) ||
      file_.FileSize() / FrameBytes(facts) < static_cast<uint64_t>(count))
    return Status::DamagedFile;
  frames_.size = sizeof(FMW_FRAMES);
  frames_.version = FMW_PLUGIN_VERSION_12;
  frames_.count = count;
  frames_.rounds = facts.rounds;
  frames_.width = facts.width;
  frames_.height = facts.height;
  frames_.bits = facts.transparent ? 32 : 24;
  frames_.delays = facts.delays.data();
  frames_.frame = FrameOf;
  frames_.reader = this;
  facts_ = &facts;
  bitmap_.resize(static_cast<size_t>(FrameBytes(facts)));
  if (!facts.transparent)
    opaque_.resize(kHead + RowStride(facts.width, 24) * static_cast<size_t>(facts.height));
  return Status::Ok;
}

FMW_HANDLE FMW_CALL FrameFileReader::FrameOf(const FMW_FRAMES* frames, int32_t index) {
  return static_cast<const SelfKnowing*>(frames)->reader->Frame(index);
}

FMW_HANDLE FrameFileReader::Frame(int32_t index) {
  const int32_t count = frames_.count;
  if (index < 0 || index >= count) return nullptr;
  if (!file_.ReadAt(bitmap_.size() * static_cast<uint64_t>(index), bitmap_)) return nullptr;
  if (opaque_.empty()) return bitmap_.data();
  DropAlpha(*facts_, bitmap_, opaque_);
  return opaque_.data();
}

}  // namespace fotomill
