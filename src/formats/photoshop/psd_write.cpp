// The writer of Photoshop documents: a merged picture without layers, compressed with PackBits.
// Black and white pictures become bitmaps, those with the gray ramp gray, other palettes indexed,
// everything else RGB. EXIF, XMP, profile and resolution are stored as resources.
#include <algorithm>
#include <cmath>
#include <vector>

#include "core/byte_writer.h"
#include "core/pack_bits.h"
#include "formats/photoshop/psd.h"
#include "formats/photoshop/psd_file.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint16_t kPackBits = 1;

bool IsColor(const Palette& palette, size_t index, uint8_t value) {
  return std::all_of(&palette[3 * index], &palette[3 * index] + 3,
                     [value](uint8_t part) { return part == value; });
}

PsdMode ModeFor(const PictureRecord& picture) {
  const int32_t bits = picture.image.Bits();
  const Palette& palette = picture.palette;
  if (bits == 24) return PsdMode::Rgb;
  if (bits == 8 && palette == GrayRamp()) return PsdMode::Gray;
  const bool blackAndWhite = (IsColor(palette, 0, 0) && IsColor(palette, 1, 255)) ||
                             (IsColor(palette, 0, 255) && IsColor(palette, 1, 0));
  return bits == 1 && blackAndWhite ? PsdMode::Bitmap : PsdMode::Indexed;
}

// Writes a resource, or nothing if the data are empty.
void WriteResource(ByteWriter& out, PsdResource number, std::span<const uint8_t> data) {
  if (data.empty()) return;
  out.Text("8BIM");
  out.Be16(static_cast<uint16_t>(number));
  out.Be16(0);
  out.Be32(static_cast<uint32_t>(data.size()));
  out.Bytes(data);
  out.Zeros(data.size() % 2);
}

void WriteResolution(ByteWriter& out, const PictureMetadata& metadata) {
  if (metadata.dpiX <= 0 || metadata.dpiY <= 0) return;
  const auto fixed = [](double dpi) {
    return static_cast<uint32_t>(std::lround(std::min(dpi, 30000.0) * 65536));
  };
  out.Text("8BIM");
  out.Be16(static_cast<uint16_t>(PsdResource::Resolution));
  out.Be16(0);
  out.Be32(16);
  for (const double dpi : {metadata.dpiX, metadata.dpiY}) {
    out.Be32(fixed(dpi));
    out.Be16(1);  // pixels per inch
    out.Be16(1);  // sizes in inches
  }
}

void WriteResources(ByteWriter& out, const PictureRecord& picture, bool withMetadata) {
  const uint64_t place = out.Position();
  out.Be32(0);
  WriteResolution(out, picture.metadata);
  WriteResource(out, PsdResource::IccProfile, picture.metadata.icc);
  if (withMetadata) {
    WriteResource(out, PsdResource::Exif, picture.metadata.exif);
    WriteResource(out, PsdResource::Xmp, picture.metadata.xmp);
  }
  out.PatchBe32(place, static_cast<uint32_t>(out.Position() - place - 4));
}

void WriteColorTable(ByteWriter& out, const PictureRecord& picture) {
  out.Be32(768);
  const auto colors = static_cast<size_t>(picture.image.Colors());
  for (size_t c = 0; c < 3; ++c) {
    for (size_t i = 0; i < 256; ++i) out.U8(i < colors ? picture.palette[3 * i + c] : 0);
  }
}

void WriteHeader(ByteWriter& out, const PackedImage& image, PsdMode mode) {
  out.Text("8BPS");
  out.Be16(1);
  out.Zeros(6);
  out.Be16(mode == PsdMode::Rgb ? 3 : 1);
  out.Be32(static_cast<uint32_t>(image.Height()));
  out.Be32(static_cast<uint32_t>(image.Width()));
  out.Be16(mode == PsdMode::Bitmap ? 1 : 8);
  out.Be16(static_cast<uint16_t>(mode));
}

// The rows of one channel, as views into the picture or copied to `room_`.
class ChannelRows {
 public:
  ChannelRows(const PictureRecord& picture, PsdMode mode)
      : image_(picture.image),
        mode_(mode),
        width_(static_cast<size_t>(image_.Width())),
        room_(3 * width_) {
    // a set bit is black
    if (mode == PsdMode::Bitmap && IsColor(picture.palette, 0, 0)) invert_ = 0xff;
  }

  std::span<const uint8_t> Row(size_t channel, int32_t y) {
    const auto row = image_.Row(y);
    if (mode_ == PsdMode::Rgb) {
      SplitColors(row.data(), width_, &room_[2 * width_], &room_[width_], room_.data());
      return std::span(room_).subspan(channel * width_, width_);
    }
    if (mode_ == PsdMode::Bitmap) {
      const size_t size = (width_ + 7) / 8;
      for (size_t i = 0; i < size; ++i) room_[i] = row[i] ^ invert_;
      return std::span(room_).first(size);
    }
    if (image_.Bits() == 8) return row.first(width_);
    for (size_t x = 0; x < width_; ++x)
      room_[x] = static_cast<uint8_t>(image_.PixelAt(static_cast<int32_t>(x), y));
    return std::span(room_).first(width_);
  }

 private:
  const PackedImage& image_;
  const PsdMode mode_;
  const size_t width_;
  std::vector<uint8_t> room_;
  uint8_t invert_ = 0;
};

Status WriteRows(ByteWriter& out, const PictureRecord& picture, PsdMode mode) {
  const int32_t height = picture.image.Height();
  const size_t channels = mode == PsdMode::Rgb ? 3 : 1;
  std::vector<uint8_t> code(MostPackedBits(static_cast<size_t>(picture.image.Width()))), sizes;
  out.Be16(kPackBits);
  const uint64_t place = out.Position();
  out.Zeros(2 * channels * static_cast<size_t>(height));
  ChannelRows rows(picture, mode);
  for (size_t c = 0; c < channels; ++c) {
    for (int32_t y = 0; y < height && !out.Failed(); ++y) {
      const size_t size = PackBits(rows.Row(c, y), code.data());
      sizes.push_back(static_cast<uint8_t>(size >> 8));
      sizes.push_back(static_cast<uint8_t>(size));
      out.Bytes(std::span(code).first(size));
      RETURN_IF_BAD(picture.ReportRow(static_cast<int32_t>((c * static_cast<size_t>(height) + static_cast<size_t>(y)) / channels), height));
    }
  }
  if (!out.Failed()) out.Patch(place, sizes);
  return Status::Ok;
}

}  // namespace

Status PsdWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const PsdMode mode = ModeFor(picture);
  WriteHeader(out, image, mode);
  if (mode == PsdMode::Indexed) {
    WriteColorTable(out, picture);
  } else {
    out.Be32(0);
  }
  WriteResources(out, picture, options.KeepsMetadata());
  out.Be32(0);  // no layers
  RETURN_IF_BAD(WriteRows(out, picture, mode));
  return CommitOutput(out, options);
}

}  // namespace fotomill
