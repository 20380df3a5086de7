#include "processing/bands.h"

#include <algorithm>

namespace fotomill {

namespace {

constexpr int32_t kBandsAThread = 4;  // so that Abort is seen in time and threads end together

}  // namespace

Status ForBands(int32_t rows, int32_t least, const Work& work, const BandFunction& band) {
  const auto threads = static_cast<int32_t>(std::clamp<uint32_t>(work.threads, 1, 256));
  const int32_t height = std::max({least, 1, rows / (threads * kBandsAThread)});
  for (int32_t first = 0; first < rows; first += height) {
    if (!work.GoesOn()) return Status::FunctionCancelled;
    RETURN_IF_BAD(band(first, rows - first < height ? rows : first + height));
  }
  return Status::Ok;
}

}  // namespace fotomill
