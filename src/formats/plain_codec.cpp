#include "formats/plain_codec.h"

namespace fotomill {

void SetPlainFacts(PictureRecord& picture, int32_t width, int32_t height, int32_t bitsPerPixel) {
  picture.width = width;
  picture.height = height;
  picture.bitsPerPixel = bitsPerPixel;
  picture.imageBytes = EstimateImageBytes(width, height, bitsPerPixel);
  picture.alphaFlags = static_cast<uint8_t>(picture.alphaFlags & ~kHasAlpha);
}

}  // namespace fotomill
