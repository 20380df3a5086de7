// The writer of Amiga interchange files; see iff.cpp.
#include <algorithm>
#include <array>
#include <memory>
#include <vector>

#include "core/byte_writer.h"
#include "core/pack_bits.h"
#include "formats/amiga/iff.h"
#include "formats/amiga/iff_planes.h"
#include "processing/color/nearest_color.h"
#include "processing/palette/fit_palette.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint32_t kHamMode = 0x800;
constexpr int32_t kHamColors = 64;
constexpr uint8_t kHamBlue = 0x40, kHamRed = 0x80, kHamGreen = 0xc0;

struct IffLayout {
  int32_t planes = 8;
  bool packed = false;
  bool ham = false;
  bool compressed = true;
};

// Encodes 24-bit pixels as HAM8: each uses the closest of a palette color and the pixel to the left
// with blue, red or green replaced.
class HamEncoder {
 public:
  // Fits the palette to the picture. MemoryAllocationError.
  Status Open(const PackedImage& image) {
    ColorCells cells;
    RETURN_IF_BAD(cells.Open());
    for (int32_t y = 0; y < image.Height(); ++y) cells.AddRow(image.Row(y).data(), image.Width());
    ColorPoints points;
    RETURN_IF_BAD(FitPalette(cells.Bins(), kHamColors - 1, points));
    // On the hardware, rows start with color 0. Some readers start with black, so color 0 is black.
    palette_ = {};
    std::ranges::copy_n(PaletteOf(points).begin(), 3 * points.count, palette_.begin() + 3);
    nearest_ = std::make_unique<NearestColor>();
    RETURN_IF_BAD(nearest_->Open(true));
    nearest_->SetColors(PointsOf(palette_, points.count + 1));
    return Status::Ok;
  }

  const Palette& Colors() const { return palette_; }

  void EncodeRow(std::span<const uint8_t> bgr, std::span<uint8_t> pixels) {
    uint8_t color[3] = {};
    for (size_t x = 0; x < pixels.size(); ++x) pixels[x] = EncodePixel(&bgr[3 * x], color);
  }

 private:
  static constexpr uint8_t Spread(uint8_t value) {
    return static_cast<uint8_t>((value & 0xfc) | value >> 6);
  }
  static int32_t Square(int32_t value) { return value * value; }

  uint8_t EncodePixel(const uint8_t* wanted, uint8_t* color) {
    int32_t errors[3], sum = 0;
    for (size_t c = 0; c < 3; ++c) sum += errors[c] = Square(wanted[c] - color[c]);
    constexpr uint8_t kControls[3] = {kHamBlue, kHamGreen, kHamRed};
    size_t replaced = 0;
    int32_t best = INT32_MAX;
    for (size_t c = 0; c < 3; ++c) {
      const int32_t error = sum - errors[c] + Square(wanted[c] - Spread(wanted[c]));
      if (error < best) {
        best = error;
        replaced = c;
      }
    }
    if (best > 0) {
      const uint8_t index = nearest_->Find(wanted[0], wanted[1], wanted[2]);
      const uint8_t* entry = &palette_[3 * size_t{index}];
      const int32_t error = Square(wanted[0] - entry[2]) + Square(wanted[1] - entry[1]) +
                            Square(wanted[2] - entry[0]);
      if (error < best) {
        for (size_t c = 0; c < 3; ++c) color[c] = entry[2 - c];
        return index;
      }
    }
    color[replaced] = Spread(wanted[replaced]);
    return static_cast<uint8_t>(kControls[replaced] | wanted[replaced] >> 2);
  }

  Palette palette_{};
  std::unique_ptr<NearestColor> nearest_;
};

void WriteChunk(ByteWriter& out, std::string_view name, std::span<const uint8_t> data) {
  out.Text(name);
  out.Be32(static_cast<uint32_t>(data.size()));
  out.Bytes(data);
  out.Zeros(data.size() % 2);
}

void WriteHead(ByteWriter& out, const PictureRecord& picture, const IffLayout& layout,
               const Palette& palette) {
  const auto width = static_cast<uint16_t>(picture.image.Width()),
             height = static_cast<uint16_t>(picture.image.Height());
  out.Text("FORM");
  out.Be32(0);
  out.Text(layout.packed ? "PBM " : "ILBM");
  out.Text("BMHD");
  out.Be32(20);
  out.Be16(width);
  out.Be16(height);
  out.Be32(0);
  out.U8(static_cast<uint8_t>(layout.planes));
  out.U8(0);
  out.U8(layout.compressed ? 1 : 0);
  out.U8(0);
  out.Be16(0);
  out.U8(1);  // square pixels
  out.U8(1);
  out.Be16(width);
  out.Be16(height);
  const size_t colors = layout.ham            ? kHamColors
                        : layout.planes == 24 ? 0
                                              : size_t{1} << layout.planes;
  if (colors > 0) WriteChunk(out, "CMAP", std::span(palette).first(3 * colors));
  const uint8_t mode[] = {0, 0, kHamMode >> 8, 0};
  if (layout.ham) WriteChunk(out, "CAMG", mode);
}

// The rows of a picture in file layout, before compression.
class StoredRows {
 public:
  StoredRows(const PictureRecord& picture, const IffLayout& layout, HamEncoder* ham)
      : image_(picture.image),
        layout_(layout),
        ham_(ham),
        width_(static_cast<size_t>(image_.Width())),
        pixels_(3 * width_) {
    row_.resize(layout.packed ? PlaneSize() : PlaneSize() * static_cast<size_t>(layout.planes));
  }

  size_t PlaneSize() const {
    return layout_.packed ? (width_ + 1) / 2 * 2 : (width_ + 15) / 16 * 2;
  }

  std::span<const uint8_t> Row(int32_t y) {
    const auto source = image_.Row(y);
    const auto pixels = std::span(pixels_).first(width_);
    if (layout_.planes == 24) {
      uint8_t* const place = pixels_.data();
      SplitColors(source.data(), width_, place + 2 * width_, place + width_, place);
      for (size_t c = 0; c < 3; ++c) {
        SplitIffPlanes(std::span(pixels_).subspan(c * width_, width_), PlaneSize(), 8,
                       &row_[8 * c * PlaneSize()]);
      }
      return row_;
    }
    if (ham_ != nullptr) {
      ham_->EncodeRow(source, pixels);
    } else {
      for (size_t x = 0; x < width_; ++x)
        pixels[x] = static_cast<uint8_t>(image_.PixelAt(static_cast<int32_t>(x), y));
    }
    if (layout_.packed) {
      std::ranges::copy(pixels, row_.begin());
      // Padding repeats the last pixel to extend its run. Some readers would take a separate run
      // for part of the next row.
      row_.back() = pixels.back();
    } else {
      SplitIffPlanes(pixels, PlaneSize(), layout_.planes, row_.data());
    }
    return row_;
  }

 private:
  const PackedImage& image_;
  const IffLayout layout_;
  HamEncoder* const ham_;
  const size_t width_;
  std::vector<uint8_t> pixels_, row_;
};

Status WriteBody(ByteWriter& out, const PictureRecord& picture, const IffLayout& layout,
                 HamEncoder* ham) {
  out.Text("BODY");
  const uint64_t place = out.Position();
  out.Be32(0);
  StoredRows rows(picture, layout, ham);
  const size_t planeSize = rows.PlaneSize();
  std::vector<uint8_t> code(MostPackedBits(planeSize));
  for (int32_t y = 0; y < picture.image.Height() && !out.Failed(); ++y) {
    const auto row = rows.Row(y);
    if (!layout.compressed) out.Bytes(row);
    for (size_t at = 0; at < row.size() && layout.compressed; at += planeSize) {
      out.Bytes(std::span(code).first(PackBits(row.subspan(at, planeSize), code.data())));
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  if (out.Failed()) return Status::Ok;  // reported by the commit
  const uint64_t size = out.Position() - place - 4;
  out.Zeros(size % 2);
  out.PatchBe32(place, static_cast<uint32_t>(size));
  out.PatchBe32(4, static_cast<uint32_t>(out.Position() - 8));
  return Status::Ok;
}

Status Write(PictureRecord& picture, const WriteOptions& options, bool ham) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  IffLayout layout{.planes = image.Bits(),
                   .ham = ham && image.Bits() == 24,
                   .compressed = options.encode.iffCompressed};
  layout.packed = options.encode.iffPacked && image.Bits() <= 8;
  if (layout.packed || layout.ham) layout.planes = 8;
  HamEncoder encoder;
  if (layout.ham) RETURN_IF_BAD(encoder.Open(image));
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, picture, layout, layout.ham ? encoder.Colors() : picture.palette);
  RETURN_IF_BAD(WriteBody(out, picture, layout, layout.ham ? &encoder : nullptr));
  if (out.Position() > UINT32_MAX) return Status::UnsuitableImage;
  return CommitOutput(out, options);
}

}  // namespace

Status IffWrite(PictureRecord& picture, const WriteOptions& options) {
  return Write(picture, options, false);
}

Status HamWrite(PictureRecord& picture, const WriteOptions& options) {
  return Write(picture, options, true);
}

}  // namespace fotomill
