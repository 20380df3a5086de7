#include "support/codecs.h"

#include <cstdio>

#include "settings/job_options.h"
#include "support/files.h"

namespace fotomill::test {

namespace {

// Writes the bytes to a file in `folder`; returns its name.
std::string NameOf(const TemporaryFolder& folder, std::span<const uint8_t> file) {
  const std::string path = folder.Path("picture");
  WriteBytes(path, file);
  return path;
}

}  // namespace

ReadRequest RequestFor(const std::string& fileName) {
  return {.fileName = fileName, .options = ReadOptionsFromSettings()};
}

Decoded Describe(InfoOperation info, std::span<const uint8_t> file) {
  const TemporaryFolder folder;
  Decoded result{Status::Ok, NewPictureRecord()};
  result.status = info(*result.picture, RequestFor(NameOf(folder, file)));
  return result;
}

Decoded Decode(ReadOperation read, std::span<const uint8_t> file) {
  const TemporaryFolder folder;
  Decoded result{Status::Ok, NewPictureRecord()};
  result.status = read(*result.picture, RequestFor(NameOf(folder, file)));
  return result;
}

std::vector<uint8_t> Encode(WriteOperation write, PictureRecord& picture, Status* status) {
  const TemporaryFolder folder;
  picture.fileName.AssignCut(folder.Path("written"));
  const Status result = write(picture, {.encode = EncodeOptionsFromSettings()});
  if (status != nullptr) *status = result;
  return result == Status::Ok ? ReadBytes(folder.Path("written")) : std::vector<uint8_t>{};
}

std::string PixelText(const PackedImage& image) {
  std::string text;
  for (int32_t y = 0; y < image.Height(); ++y) {
    for (int32_t x = 0; x < image.Width(); ++x) {
      char value[16];
      std::snprintf(value, sizeof value, image.Bits() == 24 ? "%06X" : "%d", image.PixelAt(x, y));
      text += x > 0 ? " " : y > 0 ? " / " : "";
      text += value;
    }
  }
  return text;
}

void SetPixel(PackedImage& image, int32_t x, int32_t y, int32_t value) {
  uint8_t* row = image.Row(y).data();
  const int32_t bits = image.Bits();
  if (bits == 24) {
    for (int32_t i = 0; i < 3; ++i) row[3 * x + i] = static_cast<uint8_t>(value >> (8 * i));
    return;
  }
  const int32_t shift = 8 - bits - x * bits % 8, mask = (1 << bits) - 1;
  uint8_t& place = row[x * bits / 8];
  place = static_cast<uint8_t>((place & ~(mask << shift)) | (value & mask) << shift);
}

PicturePointer PatternPicture(int32_t width, int32_t height, int32_t bitsPerPixel) {
  PicturePointer picture = NewPictureRecord();
  picture->width = width;
  picture->height = height;
  picture->bitsPerPixel = bitsPerPixel;
  MakeDefaultPalette(&picture->palette, nullptr,
                     bitsPerPixel == 1 ? kBlackAndWhitePalette : kDisplayPalette);
  if (NewPackedImage(width, height, &picture->palette, bitsPerPixel, picture->image) != Status::Ok)
    return picture;
  uint32_t state = 1;
  int32_t value = 0;
  for (int32_t i = 0; i < width * height; ++i) {
    state = state * 1664525 + 1013904223;
    // Runs in even blocks of 64 pixels, single values in odd ones.
    if (i % 64 < 32 ? state >> 28 == 0 : true) value = static_cast<int32_t>(state >> 8);
    SetPixel(picture->image, i % width, i / width,
             bitsPerPixel < 24 ? value & ((1 << bitsPerPixel) - 1) : value);
  }
  return picture;
}

bool SamePixels(const PackedImage& a, const PackedImage& b) {
  if (a.Width() != b.Width() || a.Height() != b.Height() || a.Bits() != b.Bits()) return false;
  for (int32_t y = 0; y < a.Height(); ++y) {
    for (int32_t x = 0; x < a.Width(); ++x) {
      if (a.PixelAt(x, y) != b.PixelAt(x, y)) return false;
    }
  }
  return true;
}

}  // namespace fotomill::test
