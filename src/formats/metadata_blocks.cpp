#include "formats/metadata_blocks.h"

#include <cmath>

#include "core/limits.h"

namespace fotomill {

void TakeBlock(std::span<const uint8_t> data, std::vector<uint8_t>& block) {
  block.clear();
  if (data.size() <= limits.metadataBytes) block.assign(data.begin(), data.end());
}

void TakeResolution(double dpiX, double dpiY, PictureMetadata& metadata) {
  if (!(dpiX > 0) || !(dpiY > 0) || !std::isfinite(dpiX) || !std::isfinite(dpiY)) return;
  metadata.dpiX = dpiX;
  metadata.dpiY = dpiY;
}

}  // namespace fotomill
