#include "formats/tiff/tiff_rows.h"

#include <algorithm>
#include <cstring>

#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

uint8_t Divided(uint32_t value, uint32_t alpha) {
  return alpha == 0 ? 0 : static_cast<uint8_t>(std::min(255u, (value * 255 + alpha / 2) / alpha));
}

bool IsLab(const TiffLayout& layout) {
  return layout.photometric == PHOTOMETRIC_CIELAB || layout.photometric == PHOTOMETRIC_ICCLAB;
}

}  // namespace

TiffConverter::TiffConverter(const TiffLayout& layout, const Palette& palette, TiffTarget& target)
    : layout_(layout),
      palette_(palette),
      target_(target),
      bytes_(size_t{layout.samples} * layout.width) {
  if (IsLab(layout)) lab_.emplace(layout.photometric == PHOTOMETRIC_CIELAB);
}

void TiffConverter::Store(int32_t y, const uint8_t* row, size_t planeStride) {
  uint8_t* image = target_.image.Row(y).data();
  const size_t width = layout_.width;
  if (layout_.rows == TiffRows::Direct) {
    std::memcpy(image, row, (width * layout_.form.bits + 7) / 8);
  } else if (layout_.rows == TiffRows::Nibbles) {
    for (size_t x = 0; x < width; ++x) {
      const int value = row[x / 4] >> (6 - x % 4 * 2) & 3;
      image[x / 2] = static_cast<uint8_t>(x % 2 == 0 ? value << 4 : image[x / 2] | value);
    }
  } else {
    const uint8_t* samples = AsBytes(row, planeStride);
    if (layout_.rows == TiffRows::Gray) {
      for (size_t x = 0; x < width; ++x) image[x] = samples[x * layout_.samples];
    } else {
      StoreColors(samples, image);
      if (layout_.alpha >= 0) StoreAlpha(samples, image, target_.alpha.Row(y).data());
    }
  }
}

const uint8_t* TiffConverter::AsBytes(const uint8_t* row, size_t planeStride) {
  const bool scaled = layout_.photometric != PHOTOMETRIC_PALETTE;
  const TiffSampleForm& form = layout_.form;
  if (planeStride == 0) {
    if (form.bits == 8 && form.kind == TiffSampleForm::Unsigned) return row;
    ConvertSamples(row, form, scaled, bytes_.size(), bytes_.data(), 1);
    return bytes_.data();
  }
  for (size_t s = 0; s < layout_.samples; ++s) {
    ConvertSamples(row + s * planeStride, form, scaled, layout_.width, bytes_.data() + s,
                   layout_.samples);
  }
  return bytes_.data();
}

void TiffConverter::StoreColors(const uint8_t* samples, uint8_t* image) {
  const size_t width = layout_.width, step = layout_.samples;
  if (lab_) {
    lab_->StoreRow(samples, step, width, image);
  } else if (layout_.colors == 3 && step == 3) {
    SwapColors(samples, width, image);
  } else if (layout_.colors == 3) {
    for (size_t x = 0; x < width; ++x, samples += step, image += 3) {
      image[0] = samples[2];
      image[1] = samples[1];
      image[2] = samples[0];
    }
  } else if (layout_.colors == 4) {
    for (size_t x = 0; x < width; ++x, samples += step, image += 3) {
      for (size_t i = 0; i < 3; ++i)
        image[i] =
            static_cast<uint8_t>(((255u - samples[2 - i]) * (255u - samples[3]) + 127) / 255);
    }
  } else {
    const bool indexed = layout_.photometric == PHOTOMETRIC_PALETTE;
    const uint8_t flip = layout_.photometric == PHOTOMETRIC_MINISWHITE ? 255 : 0;
    for (size_t x = 0; x < width; ++x, samples += step, image += 3) {
      for (size_t i = 0; i < 3; ++i) {
        image[i] = indexed ? palette_[3 * size_t{samples[0]} + 2 - i]
                           : static_cast<uint8_t>(samples[0] ^ flip);
      }
    }
  }
}

void TiffConverter::StoreAlpha(const uint8_t* samples, uint8_t* image, uint8_t* alpha) const {
  const bool unscaled = layout_.photometric == PHOTOMETRIC_PALETTE;
  const uint32_t most = unscaled ? (1u << layout_.form.bits) - 1 : 255;
  samples += layout_.alpha;
  for (size_t x = 0; x < layout_.width; ++x, samples += layout_.samples, image += 3) {
    alpha[x] = static_cast<uint8_t>(*samples * 255u / most);
    if (!layout_.multiplied) continue;
    for (size_t i = 0; i < 3; ++i) image[i] = Divided(image[i], alpha[x]);
  }
}

}  // namespace fotomill
