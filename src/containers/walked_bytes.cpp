#include "containers/walked_bytes.h"

#include <algorithm>

#include "core/limits.h"

namespace fotomill {

std::span<const uint8_t> WalkedBytes::At(uint64_t offset, uint64_t count) {
  if (offset >= size_ || failed_) return {};
  count = std::min({count, kMost, size_ - offset});
  if (offset + count <= held_.size()) return held_.subspan(offset, count);
  if (file_ == nullptr || ++places_ > limits.walkedPlaces) return {};
  const auto bytes = std::span(read_).first(count);
  failed_ = !file_->ReadAt(offset, bytes);
  return failed_ ? std::span<const uint8_t>() : bytes;
}

}  // namespace fotomill
