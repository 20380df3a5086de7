// Source: Adobe, "TIFF Revision 6.0", 1992, section 23; Technical Note "ICC L*a*b*";
// ICC.1:2022, 6.3.4.2 (encoding of 8 bits).
#include "formats/tiff/tiff_lab.h"

#include <lcms2.h>

#include <algorithm>

namespace fotomill {

TiffLab::TiffLab(bool signedColors) : flip_(signedColors ? 0x80 : 0) {
  const cmsHPROFILE lab = cmsCreateLab4Profile(nullptr), screen = cmsCreate_sRGBProfile();
  constexpr cmsUInt32Number kLab8 = COLORSPACE_SH(PT_Lab) | CHANNELS_SH(3) | BYTES_SH(1);
  const bool opened = lab != nullptr && screen != nullptr;
  transform_ = opened ? cmsCreateTransform(lab, kLab8, screen, TYPE_BGR_8,
                                           INTENT_RELATIVE_COLORIMETRIC, cmsFLAGS_NOCACHE)
                      : nullptr;
  if (lab != nullptr) cmsCloseProfile(lab);
  if (screen != nullptr) cmsCloseProfile(screen);
}

TiffLab::~TiffLab() {
  if (transform_ != nullptr) cmsDeleteTransform(transform_);
}

void TiffLab::StoreRow(const uint8_t* samples, size_t step, size_t width, uint8_t* image) {
  row_.resize(3 * width);
  for (size_t x = 0; x < width; ++x, samples += step) {
    row_[3 * x] = samples[0];
    row_[3 * x + 1] = samples[1] ^ flip_;
    row_[3 * x + 2] = samples[2] ^ flip_;
  }
  if (transform_ != nullptr) {
    cmsDoTransform(transform_, row_.data(), image, static_cast<cmsUInt32Number>(width));
    return;
  }
  for (size_t x = 0; x < width; ++x) std::fill_n(image + 3 * x, 3, row_[3 * x]);
}

}  // namespace fotomill
