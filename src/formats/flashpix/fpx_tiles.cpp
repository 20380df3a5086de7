#include "formats/flashpix/fpx_tiles.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "processing/color/photo_ycc.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint32_t kPlain = 0, kOneColor = 1, kJpeg = 2;

uint8_t Limited(int32_t value) { return static_cast<uint8_t>(std::clamp(value, 0, 255)); }

// JPEG's standard YCbCr conversion, in 1/65536.
void YccToRgb(uint8_t* pixel) {
  const int32_t y = pixel[0] * 65536 + 32768, cb = pixel[1] - 128, cr = pixel[2] - 128;
  pixel[0] = Limited((y + 91881 * cr) >> 16);
  pixel[1] = Limited((y - 22554 * cb - 46802 * cr) >> 16);
  pixel[2] = Limited((y + 116130 * cb) >> 16);
}

}  // namespace

FpxTileDecoder::FpxTileDecoder(const FpxFile& file, const FpxSize& size)
    : file_(file),
      size_(size),
      width_(static_cast<size_t>(size.tileWidth)),
      height_(static_cast<size_t>(size.tileHeight)),
      channels_(static_cast<size_t>(size.channels)),
      colors_(channels_ - (size.opacity ? 1 : 0)),
      samples_(width_ * height_ * channels_),
      pixels_(width_ * height_ * colors_),
      opacities_(size.opacity ? width_ * height_ : 0) {}

std::span<const uint8_t> FpxTileDecoder::Pixels(int32_t y) const {
  return std::span(pixels_).subspan(static_cast<size_t>(y) * width_ * colors_, width_ * colors_);
}

std::span<const uint8_t> FpxTileDecoder::Opacities(int32_t y) const {
  return std::span(opacities_).subspan(static_cast<size_t>(y) * width_, width_);
}

Status FpxTileDecoder::Decode(const FpxTile& tile) {
  bool ycc = false;
  switch (tile.compression) {
    case kPlain: RETURN_IF_BAD(Copy(tile)); break;
    case kOneColor: Fill(tile.subtype); break;
    case kJpeg:
      RETURN_IF_BAD(DecodeJpeg(tile));
      ycc = (tile.subtype >> 16 & 0xFF) != 0 && size_.colors == FpxColors::Rgb;
      break;
    default: return Status::UnsupportedFormat;
  }
  ToPixels(ycc);
  return Status::Ok;
}

Status FpxTileDecoder::Copy(const FpxTile& tile) {
  const auto bytes = size_.data.Bytes(tile.offset, samples_.size(), gathered_);
  if (bytes.empty()) return Status::FileReadError;
  std::ranges::copy(bytes, samples_.begin());
  return Status::Ok;
}

void FpxTileDecoder::Fill(uint32_t color) {
  for (size_t i = 0; i < samples_.size(); ++i)
    samples_[i] = static_cast<uint8_t>(color >> (8 * (i % channels_)));
}

Status FpxTileDecoder::DecodeJpeg(const FpxTile& tile) {
  const auto data = size_.data.Bytes(tile.offset, tile.size, gathered_);
  if (data.empty()) return Status::FileReadError;
  const uint32_t number = tile.subtype >> 24;
  const auto tables = number == 0 ? std::span<const uint8_t>() : file_.JpegTables(number);
  bool fits = false;
  const bool decoded = Guarded(reader_.errors, [&] {
    jpeg_decompress_struct& info = reader_.info;
    if (!created_) {
      jpeg_create_decompress(&info);
      info.client_data = &reader_;
      info.progress = &reader_.monitor;
      created_ = true;
    }
    if (number != 0 && number != tables_ && !tables.empty()) {
      jpeg_mem_src(&info, tables.data(), tables.size());
      jpeg_read_header(&info, FALSE);
      tables_ = number;
    }
    jpeg_mem_src(&info, data.data(), data.size());
    jpeg_read_header(&info, TRUE);
    fits = info.image_width == width_ && info.image_height == height_ &&
           static_cast<size_t>(info.num_components) == channels_;
    if (fits) {
      info.jpeg_color_space = info.out_color_space = JCS_UNKNOWN;  // no color conversion
      jpeg_start_decompress(&info);
      while (info.output_scanline < info.output_height) {
        JSAMPROW row = samples_.data() + info.output_scanline * width_ * channels_;
        jpeg_read_scanlines(&info, &row, 1);
      }
      jpeg_finish_decompress(&info);
    }
  });
  if (number == 0) tables_ = 0;  // its own tables apply
  if (!decoded) return reader_.Failure();
  return fits ? Status::Ok : Status::DamagedFile;
}

// Colors were premultiplied by opacity.
void FpxTileDecoder::Divide() {
  for (size_t i = 0; i < opacities_.size(); ++i) {
    const uint32_t opacity = opacities_[i];
    if (opacity == 0 || opacity == 255) continue;
    for (size_t channel = 0; channel < colors_; ++channel) {
      uint8_t& value = pixels_[i * colors_ + channel];
      value = static_cast<uint8_t>(std::min((value * 255u + opacity / 2) / opacity, 255u));
    }
  }
}

void FpxTileDecoder::ToPixels(bool fromYcc) {
  const size_t count = width_ * height_;
  std::vector<uint8_t> planes(size_.colors == FpxColors::PhotoYcc ? 3 * width_ : 0);
  if (size_.opacity) {
    for (size_t i = 0; i < count; ++i) opacities_[i] = samples_[i * channels_ + colors_];
  }
  for (size_t i = 0; fromYcc && i < count; ++i) {
    uint8_t* pixel = &samples_[i * channels_];
    YccToRgb(pixel);
    // with opacity, the negative was converted to YCbCr
    for (size_t c = 0; size_.opacity && c < 3; ++c) pixel[c] = static_cast<uint8_t>(255 - pixel[c]);
  }
  for (size_t y = 0; y < height_; ++y) {
    const uint8_t* row = &samples_[y * width_ * channels_];
    uint8_t* target = &pixels_[y * width_ * colors_];
    if (size_.colors == FpxColors::PhotoYcc) {
      for (size_t x = 0; x < width_; ++x) {
        for (size_t c = 0; c < 3; ++c) planes[c * width_ + x] = row[x * channels_ + c];
      }
      PhotoYccToColors(planes.data(), &planes[width_], &planes[2 * width_], width_, target);
    } else if (channels_ == 3) {
      SwapColors(row, width_, target);
    } else if (channels_ == 1) {
      std::memcpy(target, row, width_);
    } else {
      for (size_t x = 0; x < width_; ++x) {
        for (size_t c = 0; c < colors_; ++c)
          target[x * colors_ + c] = row[x * channels_ + colors_ - 1 - c];
      }
    }
  }
  if (size_.opacity) Divide();
}

}  // namespace fotomill
