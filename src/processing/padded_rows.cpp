#include "processing/padded_rows.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

Status PaddedRows::Open(const PackedImage& image, int32_t reach) {
  if (image.Bits() != 24 && image.Bits() != 8) return Status::UnsuitableImage;
  image_ = &image;
  reach_ = reach;
  kept_ = 2 * reach + 1;
  pixel_ = image.Bits() == 24 ? 3 : 1;
  stride_ = (static_cast<size_t>(image.Width()) + 2 * static_cast<size_t>(reach)) * pixel_;
  const auto kept = static_cast<uint64_t>(kept_);
  if (!rows_.Allocate(stride_ * kept, platform::Fill::Unset) ||
      !held_.Allocate(kept * sizeof(int32_t))) {
    return Status::MemoryAllocationError;
  }
  std::ranges::fill(held_.Items<int32_t>(), -1);
  return Status::Ok;
}

const uint8_t* PaddedRows::Row(int32_t y) {
  y = std::clamp(y, 0, image_->Height() - 1);
  const auto slot = static_cast<size_t>(y % kept_);
  uint8_t* row = rows_.Data() + slot * stride_;
  uint8_t* start = row + static_cast<size_t>(reach_) * pixel_;
  int32_t& held = held_.Items<int32_t>()[slot];
  if (held == y) return start;
  held = y;
  const size_t bytes = static_cast<size_t>(image_->Width()) * pixel_;
  std::memcpy(start, image_->Row(y).data(), bytes);
  for (int32_t i = 0; i < reach_; ++i) {
    std::memcpy(row + static_cast<size_t>(i) * pixel_, start, pixel_);
    std::memcpy(start + bytes + static_cast<size_t>(i) * pixel_, start + bytes - pixel_, pixel_);
  }
  return start;
}

}  // namespace fotomill
