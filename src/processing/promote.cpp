#include "processing/promote.h"

#include <algorithm>
#include <cstring>
#include <vector>

namespace fotomill {

namespace {

// Unpacks a row of palette indices to one byte each.
template <int bits>
void UnpackIndices(const uint8_t* packed, int32_t width, uint8_t* indices) {
  constexpr int32_t kPerByte = 8 / bits;
  constexpr uint8_t kMask = (1 << bits) - 1;
  int32_t x = 0;
  for (; x + kPerByte <= width; x += kPerByte) {
    const uint8_t byte = *packed++;
    for (int32_t i = 0; i < kPerByte; ++i) indices[x + i] = byte >> (8 - bits * (i + 1)) & kMask;
  }
  for (int32_t i = 0; x < width; ++x, ++i) indices[x] = *packed >> (8 - bits * (i + 1)) & kMask;
}

// Stores each pixel's four-byte table entry as a whole; the next pixel overwrites the fourth byte.
template <int bits>
void ExpandRow(const uint8_t* packed, const uint8_t* colorTable, int32_t width, uint8_t* bgr) {
  constexpr int32_t kPerByte = 8 / bits;
  constexpr uint8_t kMask = (1 << bits) - 1;
  const auto entry = [&](int32_t x) {
    return colorTable + 4 * (packed[x / kPerByte] >> (8 - bits * (x % kPerByte + 1)) & kMask);
  };
  for (int32_t x = 0; x < width - 1; ++x, bgr += 3) std::memcpy(bgr, entry(x), 4);
  std::memcpy(bgr, entry(width - 1), 3);
}

uint32_t ColorAt(const uint8_t* bgr) {
  return static_cast<uint32_t>(bgr[2] << 16 | bgr[1] << 8 | bgr[0]);
}

int32_t Brightness(uint32_t color) {
  return static_cast<int32_t>(299 * (color >> 16) + 587 * (color >> 8 & 0xff) +
                              114 * (color & 0xff));
}

constexpr int32_t DepthForColors(int32_t colors) { return colors <= 2 ? 1 : colors <= 16 ? 4 : 8; }

}  // namespace

Status BgrRows::Open(const PackedImage& image) {
  image_ = &image;
  expand_ = image.Bits() == 1   ? ExpandRow<1>
            : image.Bits() == 4 ? ExpandRow<4>
            : image.Bits() == 8 ? ExpandRow<8>
                                : nullptr;
  if (expand_ == nullptr) return Status::Ok;
  const auto table = image.ColorTable();
  std::copy(table.begin(), table.end(), colors_.begin());
  const uint64_t bytes = 3 * static_cast<uint64_t>(image.Width());
  return row_.Allocate(bytes, platform::Fill::Unset) ? Status::Ok : Status::MemoryAllocationError;
}

const uint8_t* BgrRows::Row(int32_t y) {
  if (expand_ == nullptr) return image_->Row(y).data();
  CopyRow(y, row_.Data());
  return row_.Data();
}

void BgrRows::CopyRow(int32_t y, uint8_t* bgr) const {
  const uint8_t* packed = image_->Row(y).data();
  if (expand_ == nullptr) {
    std::memcpy(bgr, packed, 3 * static_cast<size_t>(image_->Width()));
  } else {
    expand_(packed, colors_.data(), image_->Width(), bgr);
  }
}

void PackIndices(const uint8_t* indices, int32_t width, int32_t bits, uint8_t* packed) {
  if (bits == 8) {
    std::memcpy(packed, indices, static_cast<size_t>(width));
    return;
  }
  const int32_t perByte = 8 / bits;
  for (int32_t x = 0; x < width; x += perByte) {
    int32_t byte = 0;
    const int32_t here = std::min(perByte, width - x);
    for (int32_t i = 0; i < here; ++i) byte |= indices[x + i] << (8 - bits * (i + 1));
    *packed++ = static_cast<uint8_t>(byte);
  }
}

Status PromoteImage(const PackedImage& image, int32_t bits, PackedImage& promoted) {
  promoted.Free();
  if (NormalizedDepth(bits) <= image.Bits()) return Status::UnsuitableImage;
  PackedImage made;
  RETURN_IF_BAD(NewPackedImage(image.Width(), image.Height(), nullptr, bits, made));
  const int32_t width = image.Width();
  if (made.Bits() == 24) {
    BgrRows rows;
    RETURN_IF_BAD(rows.Open(image));
    for (int32_t y = 0; y < image.Height(); ++y) {
      rows.CopyRow(y, made.Row(y).data());
    }
  } else {
    const auto table = image.ColorTable();
    std::copy(table.begin(), table.end(), made.ColorTable().begin());
    const auto unpack = image.Bits() == 1 ? UnpackIndices<1> : UnpackIndices<4>;
    platform::MemoryBlock indices;
    if (!indices.Allocate(static_cast<uint64_t>(width), platform::Fill::Unset))
      return Status::MemoryAllocationError;
    for (int32_t r = 0; r < image.Height(); ++r) {
      unpack(image.StoredRow(r).data(), width, indices.Data());
      PackIndices(indices.Data(), width, made.Bits(), made.StoredRow(r).data());
    }
  }
  promoted = std::move(made);
  return Status::Ok;
}

Status PromotePicture(PictureRecord& picture, int32_t bits) {
  if (picture.image.Empty() || NormalizedDepth(bits) <= picture.image.Bits()) return Status::Ok;
  PackedImage promoted;
  RETURN_IF_BAD(PromoteImage(picture.image, bits, promoted));
  const int32_t firstNew = promoted.Bits() == 24 ? 256 : picture.image.Colors();
  std::fill(picture.palette.begin() + 3 * firstNew, picture.palette.end(), uint8_t{0});
  picture.image = std::move(promoted);
  picture.bitsPerPixel = picture.image.Bits();
  return Status::Ok;
}

Status PromoteToAlpha(PictureRecord& picture) {
  RETURN_IF_BAD(PromotePicture(picture, 24));
  if (picture.alpha.Empty()) {
    PackedImage plane;
    RETURN_IF_BAD(NewAlphaPlane(picture.image.Width(), picture.image.Height(), plane, platform::Fill::Unset));
    std::memset(plane.Rows().data(), 255, plane.Rows().size());
    picture.alpha = std::move(plane);
  }
  picture.alphaFlags |= kHasAlpha;
  return Status::Ok;
}

bool ColorSet::AddRow(const uint8_t* bgr, int32_t width, int32_t most) {
  uint32_t last = kFree;
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    const uint32_t color = ColorAt(bgr);
    if (color == last) continue;
    last = color;
    const uint32_t slot = SlotOf(color);
    if (slots_[slot] == color) continue;
    if (count_ == most) return false;
    slots_[slot] = color;
    ++count_;
  }
  return true;
}

void ColorSet::Number(Palette& palette) {
  std::array<uint32_t, kMost> colors;
  size_t found = 0;
  for (const uint32_t slot : slots_) {
    if (slot != kFree) colors[found++] = slot;
  }
  std::sort(colors.begin(), colors.begin() + static_cast<std::ptrdiff_t>(found),
            [](uint32_t a, uint32_t b) {
              return std::pair(Brightness(a), a) < std::pair(Brightness(b), b);
            });
  palette.fill(0);
  for (size_t i = 0; i < found; ++i) {
    indices_[SlotOf(colors[i])] = static_cast<uint8_t>(i);
    palette[3 * i] = static_cast<uint8_t>(colors[i] >> 16);
    palette[3 * i + 1] = static_cast<uint8_t>(colors[i] >> 8);
    palette[3 * i + 2] = static_cast<uint8_t>(colors[i]);
  }
}

Status PackFewColors(PictureRecord& picture, int32_t maxBits, bool& packed) {
  packed = false;
  const int32_t most = maxBits >= 8 ? 256 : maxBits >= 4 ? 16 : 2;
  if (picture.image.Empty() || picture.image.Bits() == 1) return Status::Ok;
  const int32_t width = picture.image.Width();
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(picture.image));
  ColorSet set;
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    if (!set.AddRow(rows.Row(y), width, most)) return Status::Ok;
  }
  const int32_t bits = DepthForColors(set.Count());
  if (bits >= picture.image.Bits()) return Status::Ok;

  Palette palette;
  set.Number(palette);
  PackedImage made;
  RETURN_IF_BAD(NewPackedImage(width, picture.image.Height(), &palette, bits, made));
  platform::MemoryBlock indices;
  if (!indices.Allocate(static_cast<uint64_t>(width), platform::Fill::Unset))
    return Status::MemoryAllocationError;
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    const uint8_t* bgr = rows.Row(y);
    uint32_t last = ColorAt(bgr);
    uint8_t index = set.IndexOf(last);
    for (int32_t x = 0; x < width; ++x, bgr += 3) {
      const uint32_t color = ColorAt(bgr);
      if (color != last) index = set.IndexOf(last = color);
      indices.Data()[x] = index;
    }
    PackIndices(indices.Data(), width, bits, made.Row(y).data());
  }
  picture.image = std::move(made);
  picture.palette = palette;
  picture.bitsPerPixel = bits;
  packed = true;
  return Status::Ok;
}

}  // namespace fotomill
