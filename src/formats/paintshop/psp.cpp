// Paint Shop Pro images (PSP). For the file layout see psp_file.cpp.
//
// The first page is the whole picture: the composite stored by later versions if it is lossless,
// else the visible layers, composited. Further pages are the layers, if there are several, from the
// bottom up. All layers are blended in normal mode; vectors, adjustments and masks are ignored, and
// the record's warning says so. 16-bit samples are reduced to 8.
//
// The writer creates version 3, which Paint Shop Pro 5 and later read: one layer, compressed by
// deflate; up to 8 bits as 8 with a palette, everything else in three channels.
#include "formats/paintshop/psp.h"

#include <zlib.h>

#include <algorithm>
#include <bit>
#include <vector>

#include "core/byte_writer.h"
#include "formats/paintshop/psp_file.h"
#include "formats/paintshop/psp_planes.h"
#include "platform/file_view.h"
#include "processing/pixel_rows.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// The layers shown on a page: one, or all visible ones.
std::span<const PspLayer> LayersOf(const PspFile& psp, int32_t page) {
  if (page > 0) return std::span(psp.layers).subspan(static_cast<size_t>(page) - 1, 1);
  return psp.composite.HasPixels() ? std::span(&psp.composite, 1) : std::span(psp.layers);
}

bool Covers(const PspLayer& layer, const PspFile& psp) {
  return layer.place == Rectangle{0, 0, psp.width, psp.height} && layer.opacity == 255 &&
         layer.visible && layer.Channel(PspBitmap::Transparency, PspColor::Composite) == nullptr;
}

// Whether a page is a single opaque layer of palette indices.
bool IsIndexed(const PspFile& psp, int32_t page) {
  const auto layers = LayersOf(psp, page);
  return layers.size() == 1 && Covers(layers[0], psp) &&
         layers[0].Channel(PspBitmap::Image, PspColor::Composite) != nullptr;
}

bool HasAlpha(const PspFile& psp, int32_t page) {
  const auto layers = LayersOf(psp, page);
  return std::ranges::none_of(layers, [&](const PspLayer& layer) { return Covers(layer, psp); });
}

Status DescribePicture(const PspFile& psp, int32_t page, PictureRecord& picture) {
  picture.typeName.AssignCut("Paint Shop Pro");
  picture.width = psp.width;
  picture.height = psp.height;
  picture.pageCount = psp.layers.size() > 1 ? static_cast<int32_t>(psp.layers.size()) + 1 : 1;
  if (page < 0 || page >= picture.pageCount) return Status::NoImages;
  const bool indexed = IsIndexed(psp, page);
  picture.bitsPerPixel = !indexed ? 24 : std::min(psp.bits, 8);
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags = static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) |
                                            (HasAlpha(psp, page) ? kHasAlpha : 0));
  picture.simplified =
      psp.bits == 16 || psp.bits == 48 || psp.layers.size() > 1 || psp.otherLayers > 0;
  picture.unread = psp.bits == 16 || psp.bits == 48 ? kUnreadDepth : uint8_t{0};
  picture.metadata.dpiX = picture.metadata.dpiY = psp.dpi;
  picture.warning.Clear();
  const bool plain =
      std::ranges::all_of(psp.layers, [](const PspLayer& layer) { return layer.blendMode == 0; });
  if (page == 0 && !psp.composite.HasPixels() && (psp.otherLayers > 0 || !plain)) {
    picture.warning.AssignCut(TrLater("Layers other than plain pixels are not shown correctly."));
  }
  if (indexed) {
    picture.palette = psp.hasPalette ? psp.palette : GrayRamp();
  } else {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  }
  return psp.layers.empty() && !psp.composite.HasPixels() ? Status::NoImages : Status::Ok;
}

// Rows of a layer as blue, green, red and opacity.
class LayerRows {
 public:
  Status Open(const PspFile& psp, const PspLayer& layer) {
    width_ = static_cast<size_t>(layer.place.width);
    palette_ = psp.hasPalette ? psp.palette : GrayRamp();
    opacity_ = layer.opacity;
    const PspChannel* all = layer.Channel(PspBitmap::Image, PspColor::Composite);
    count_ = all != nullptr ? 1 : 3;
    if (all != nullptr) {
      RETURN_IF_BAD(colors_[0].Open(layer, *all));
    } else {
      constexpr PspColor kColors[] = {PspColor::Red, PspColor::Green, PspColor::Blue};
      for (size_t c = 0; c < 3; ++c)
        RETURN_IF_BAD(colors_[c].Open(layer, *layer.Channel(PspBitmap::Image, kColors[c])));
    }
    const PspChannel* transparency = layer.Channel(PspBitmap::Transparency, PspColor::Composite);
    hasTransparency_ = transparency != nullptr;
    if (hasTransparency_) RETURN_IF_BAD(transparency_.Open(layer, *transparency));
    samples_.resize(3 * width_);
    bgr.resize(3 * width_);
    alpha.assign(width_, opacity_);
    return Status::Ok;
  }

  void Read(int32_t y) {
    const std::span<uint8_t> samples(samples_);
    for (size_t c = 0; c < count_; ++c) colors_[c].Row(y, samples.subspan(c * width_, width_));
    if (count_ == 3) {
      MergeColors(&samples_[2 * width_], &samples_[width_], samples_.data(), width_, bgr.data());
    } else {
      for (size_t x = 0; x < 3 * width_; ++x)
        bgr[x] = palette_[size_t{3} * samples_[x / 3] + 2 - x % 3];
    }
    if (!hasTransparency_) return;
    transparency_.Row(y, alpha);
    if (opacity_ == 255) return;
    for (uint8_t& value : alpha) value = static_cast<uint8_t>((value * opacity_ + 127) / 255);
  }

  std::vector<uint8_t> bgr, alpha;  // of the current row

 private:
  size_t width_ = 0, count_ = 3;
  PspPlane colors_[3], transparency_;
  bool hasTransparency_ = false;
  uint8_t opacity_ = 255;
  Palette palette_{};
  std::vector<uint8_t> samples_;
};

// Composites a pixel over the target; `below` is null if everything is opaque.
void LayOver(const uint8_t* color, uint32_t opacity, uint8_t* target, uint8_t* below) {
  const uint32_t left = below == nullptr ? 255 - opacity : (*below * (255 - opacity) + 127) / 255,
                 sum = opacity + left;
  if (sum == 0) return;
  for (size_t c = 0; c < 3; ++c)
    target[c] = static_cast<uint8_t>((color[c] * opacity + target[c] * left + sum / 2) / sum);
  if (below != nullptr) *below = static_cast<uint8_t>(sum);
}

Status DrawLayer(const PspFile& psp, const PspLayer& layer, const PictureRecord& picture,
                 PackedImage& image, PackedImage& alpha) {
  LayerRows rows;
  RETURN_IF_BAD(rows.Open(psp, layer));
  const Rectangle& place = layer.place;
  const int64_t first = std::max<int64_t>(0, -int64_t{place.x});
  const int64_t end = std::min<int64_t>(place.width, int64_t{psp.width} - place.x);
  for (int32_t i = 0; i < place.height; ++i) {
    const int64_t y = int64_t{place.y} + i;
    RETURN_IF_BAD(picture.ReportRow(i, place.height));
    if (y < 0 || y >= psp.height || first >= end) continue;
    rows.Read(i);
    uint8_t* const row = image.Row(static_cast<int32_t>(y)).data();
    uint8_t* const opacity = alpha.Empty() ? nullptr : alpha.Row(static_cast<int32_t>(y)).data();
    for (int64_t x = first; x < end; ++x) {
      const int64_t target = x + place.x;
      LayOver(&rows.bgr[static_cast<size_t>(3 * x)], rows.alpha[static_cast<size_t>(x)],
              row + 3 * target, opacity == nullptr ? nullptr : opacity + target);
    }
  }
  return Status::Ok;
}

Status ReadIndexed(const PspLayer& layer, const PictureRecord& picture, PackedImage& image) {
  PspPlane plane;
  RETURN_IF_BAD(plane.Open(layer, *layer.Channel(PspBitmap::Image, PspColor::Composite)));
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  std::vector<uint8_t> samples(static_cast<size_t>(picture.width));
  const auto bits = static_cast<size_t>(image.Bits()), perByte = 8 / bits;
  for (int32_t y = 0; y < picture.height; ++y) {
    plane.Row(y, samples);
    const auto row = image.Row(y);
    for (size_t x = 0; x < samples.size(); ++x) {
      row[x / perByte] =
          static_cast<uint8_t>(row[x / perByte] | samples[x] << (8 - bits * (x % perByte + 1)));
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

Status ReadLayers(const PspFile& psp, int32_t page, const PictureRecord& picture,
                  PackedImage& image, PackedImage& alpha) {
  const auto layers = LayersOf(psp, page);
  for (const PspLayer& layer : layers)
    RETURN_IF_BAD(CheckPackedSize(layer.place.width, layer.place.height, 24));
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, 24, image));
  if (HasAlpha(psp, page)) RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, alpha));
  for (const PspLayer& layer : layers) {
    if (layer.visible || page > 0) RETURN_IF_BAD(DrawLayer(psp, layer, picture, image, alpha));
  }
  return Status::Ok;
}

Status OpenImage(platform::FileView& file, const std::string& name, int32_t page, PspFile& psp,
                 PictureRecord& picture) {
  if (!file.Open(name)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  RETURN_IF_BAD(ParsePsp(file.Bytes(), psp));
  return DescribePicture(psp, page, picture);
}

constexpr uint32_t kChannelPart = 12, kLayerPart = 375, kImagePart = 38, kBlockHead = 14;

void WriteBlockHead(ByteWriter& out, uint16_t number, uint32_t firstPart, uint32_t size) {
  out.Text("~BK");
  out.U8(0);
  out.Le16(number);
  out.Le32(firstPart);
  out.Le32(size);
}

void WriteDouble(ByteWriter& out, double value) {
  const auto bits = std::bit_cast<uint64_t>(value);
  out.Le32(static_cast<uint32_t>(bits));
  out.Le32(static_cast<uint32_t>(bits >> 32));
}

void WriteHead(ByteWriter& out, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const bool indexed = image.Bits() <= 8;
  out.Text("Paint Shop Pro Image File\n\x1a");
  out.Zeros(5);
  out.Le16(3);
  out.Le16(0);
  WriteBlockHead(out, 0, kImagePart, kImagePart);
  out.Le32(static_cast<uint32_t>(image.Width()));
  out.Le32(static_cast<uint32_t>(image.Height()));
  WriteDouble(out, picture.metadata.dpiX > 0 ? picture.metadata.dpiX : 72);
  out.U8(1);  // per inch
  out.Le16(static_cast<uint16_t>(PspCompression::Lz77));
  out.Le16(indexed ? 8 : 24);
  out.Le16(1);
  out.Le32(indexed ? 256 : 1 << 24);
  out.U8(indexed && picture.palette == GrayRamp() ? 1 : 0);
  out.Le32(static_cast<uint32_t>(image.Rows().size()));
  out.Le32(0);  // the active layer
  out.Le16(1);  // layers
  if (!indexed) return;
  WriteBlockHead(out, 2, 4, 4 + 4 * 256);
  out.Le32(256);
  const auto colors = 3 * static_cast<size_t>(image.Colors());
  for (size_t i = 0; i < 3 * 256; i += 3) {
    for (size_t c = 0; c < 3; ++c) out.U8(i < colors ? picture.palette[i + 2 - c] : 0);
    out.U8(0);
  }
}

void WriteLayerFacts(ByteWriter& out, const PackedImage& image) {
  const auto writeRectangle = [&](bool whole) {
    out.Zeros(8);
    out.Le32(whole ? static_cast<uint32_t>(image.Width()) : 0);
    out.Le32(whole ? static_cast<uint32_t>(image.Height()) : 0);
  };
  out.Text("Background");
  out.Zeros(256 - 10);
  out.U8(0);  // raster layer
  writeRectangle(true);
  writeRectangle(true);
  // opacity, blend mode, visible, not protected, no group
  for (const int fact : {255, 0, 1, 0, 0}) out.U8(static_cast<uint8_t>(fact));
  writeRectangle(false);  // no mask
  writeRectangle(false);
  out.Zeros(3 + 2 + 40);  // nor blend ranges
  out.Le16(1);            // bitmaps
  out.Le16(image.Bits() <= 8 ? 1 : 3);
}

// Compresses the rows of one channel. False on failure.
class ChannelWriter {
 public:
  explicit ChannelWriter(ByteWriter& out) : out_(out) {
    ready_ = deflateInit(&stream_, Z_DEFAULT_COMPRESSION) == Z_OK;
  }
  ~ChannelWriter() { deflateEnd(&stream_); }
  ChannelWriter(const ChannelWriter&) = delete;
  ChannelWriter& operator=(const ChannelWriter&) = delete;

  bool Write(std::span<uint8_t> row, bool last) {
    if (!ready_) return false;
    stream_.next_in = row.data();
    stream_.avail_in = static_cast<uInt>(row.size());
    do {
      stream_.next_out = out_.Reserve(ByteWriter::kMostReserved);
      stream_.avail_out = ByteWriter::kMostReserved;
      if (deflate(&stream_, last ? Z_FINISH : Z_NO_FLUSH) == Z_STREAM_ERROR) return false;
      out_.Used(ByteWriter::kMostReserved - stream_.avail_out);
    } while (stream_.avail_out == 0);
    return true;
  }

 private:
  ByteWriter& out_;
  z_stream stream_{};
  bool ready_ = false;
};

// The row of a channel: 0 red, 1 green, 2 blue, or all indices.
void GatherRow(const PackedImage& image, size_t channel, int32_t y, std::span<uint8_t> row) {
  const auto source = image.Row(y);
  if (image.Bits() == 24) {
    for (size_t x = 0; x < row.size(); ++x) row[x] = source[3 * x + 2 - channel];
  } else if (image.Bits() == 8) {
    std::copy_n(source.begin(), row.size(), row.begin());
  } else {
    for (size_t x = 0; x < row.size(); ++x)
      row[x] = static_cast<uint8_t>(image.PixelAt(static_cast<int32_t>(x), y));
  }
}

Status WriteChannel(ByteWriter& out, const PictureRecord& picture, size_t channel) {
  const PackedImage& image = picture.image;
  const bool indexed = image.Bits() <= 8;
  const uint64_t place = out.Position();
  const uint64_t plain =
      static_cast<uint64_t>(image.Width()) * static_cast<uint64_t>(image.Height());
  WriteBlockHead(out, 5, kChannelPart, 0);
  out.Le32(0);
  out.Le32(static_cast<uint32_t>(plain));
  out.Le16(0);
  out.Le16(static_cast<uint16_t>(indexed ? 0 : channel + 1));
  const uint64_t begin = out.Position();
  ChannelWriter writer(out);
  std::vector<uint8_t> row(static_cast<size_t>(image.Width()));
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    GatherRow(image, channel, y, row);
    if (!writer.Write(row, y + 1 == image.Height())) return Status::MemoryAllocationError;
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  const uint64_t size = out.Position() - begin;
  if (out.Position() > UINT32_MAX) return Status::UnsuitableImage;
  if (out.Failed()) return Status::Ok;  // reported at the end
  out.PatchLe32(place + 10, static_cast<uint32_t>(kChannelPart + size));
  out.PatchLe32(place + kBlockHead, static_cast<uint32_t>(size));
  return Status::Ok;
}

}  // namespace

Status PspInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  PspFile psp;
  return OpenImage(file, request.fileName, request.page, psp, picture);
}

Status PspRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  PspFile psp;
  RETURN_IF_BAD(OpenImage(file, request.fileName, request.page, psp, picture));
  PackedImage image, alpha;
  if (IsIndexed(psp, request.page)) {
    RETURN_IF_BAD(ReadIndexed(LayersOf(psp, request.page)[0], picture, image));
  } else {
    RETURN_IF_BAD(ReadLayers(psp, request.page, picture, image, alpha));
  }
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status PspWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHead(out, picture);
  const uint64_t layers = out.Position();
  WriteBlockHead(out, 3, 0, 0);
  WriteBlockHead(out, 4, kLayerPart, 0);
  WriteLayerFacts(out, image);
  const size_t channels = image.Bits() <= 8 ? 1 : 3;
  for (size_t c = 0; c < channels; ++c) RETURN_IF_BAD(WriteChannel(out, picture, c));
  const auto size = static_cast<uint32_t>(out.Position() - layers - kBlockHead);
  if (!out.Failed()) {
    out.PatchLe32(layers + 10, size);
    out.PatchLe32(layers + kBlockHead + 10, size - kBlockHead);
  }
  return CommitOutput(out, options);
}

Status PspDetails(PictureRecord& picture) {
  constexpr const char* kNames[] = {"none", "run lengths", "deflate", "JPEG"};
  picture.detailLines.Clear();
  platform::FileView file;
  PspFile psp;
  RETURN_IF_BAD(OpenImage(file, picture.fileName.c_str(), 0, psp, picture));
  const auto compression = static_cast<size_t>(psp.compression);
  DetailLines& lines = picture.detailLines;
  lines.AddFormat("      Version: %u", unsigned{psp.version});
  lines.AddFormat("       Pixels: %d bits%s", psp.bits, psp.gray ? ", gray" : "");
  lines.AddFormat("       Layers: %zu of pixels", psp.layers.size());
  if (psp.otherLayers > 0) lines.AddFormat(" Other layers: %d", psp.otherLayers);
  lines.AddFormat("  Compression: %s",
                  compression < std::size(kNames) ? kNames[compression] : "unknown");
  return Status::Ok;
}

}  // namespace fotomill
