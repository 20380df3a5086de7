#include "processing/color/ink_transform.h"

#include <lcms2.h>

#include "processing/color/color_profile.h"

namespace fotomill {

namespace {

void PassThroughInks(const uint8_t* inks, size_t count, uint8_t* bgr) {
  for (size_t x = 0; x < count; ++x, inks += 4, bgr += 3) {
    for (size_t i = 0; i < 3; ++i)
      bgr[i] = static_cast<uint8_t>((uint32_t{inks[2 - i]} * inks[3] + 127) / 255);
  }
}

}  // namespace

InkTransform::InkTransform(Kind kind, std::span<const uint8_t> profile) {
  const bool lab = kind == Kind::Lab;
  const Profile from = lab ? Profile(cmsCreateLab4Profile(nullptr)) : OpenTrustedProfile(profile);
  if (from == nullptr || cmsGetColorSpace(from.get()) != (lab ? cmsSigLabData : cmsSigCmykData))
    return;
  const Profile to(cmsCreate_sRGBProfile());
  if (to == nullptr) return;
  // The library's optimization for Lab uses a grid without a point at neutral gray, so white would
  // be tinted.
  const cmsUInt32Number flags = lab ? cmsFLAGS_NOOPTIMIZE : 0;
  transform_ = cmsCreateTransform(from.get(), lab ? TYPE_Lab_8 : TYPE_CMYK_8_REV, to.get(),
                                  TYPE_BGR_8, INTENT_PERCEPTUAL, flags);
}

InkTransform::~InkTransform() {
  if (transform_ != nullptr) cmsDeleteTransform(transform_);
}

void InkTransform::Apply(const uint8_t* samples, size_t count, uint8_t* bgr) const {
  if (transform_ == nullptr) return PassThroughInks(samples, count, bgr);
  cmsDoTransform(transform_, samples, bgr, static_cast<cmsUInt32Number>(count));
}

}  // namespace fotomill
