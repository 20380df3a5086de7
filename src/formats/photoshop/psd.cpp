// Photoshop documents (PSD, PDD): their pictures. For the file layout see psd_file.cpp.
//
// The reader shows the merged picture. If there is none, each layer with pixels is a page, from the
// bottom up, at its position on the canvas. Supported are bitmap, gray, indexed, RGB, CMYK, Lab;
// duotone as its gray channel; multichannel as gray, or with enough channels as cyan, magenta,
// yellow and black inks. 16-bit samples are reduced to 8. Inks are converted to sRGB by the
// embedded profile, else by the usual formula.
//
// The channel after those of the mode is alpha, unless the file has layers and says that the merged
// picture is opaque, or marks it as a spot color. If it is the opacity of the merged picture, whose
// colors are then composited onto white, the white is removed from them.
#include "formats/photoshop/psd.h"

#include <algorithm>
#include <memory>
#include <vector>

#include "core/limits.h"
#include "formats/photoshop/psd_file.h"
#include "formats/photoshop/psd_planes.h"
#include "platform/file_view.h"
#include "processing/color/ink_transform.h"
#include "processing/palette/two_colors.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

const char* ModeName(const PsdHeader& header) {
  switch (header.mode) {
    case PsdMode::Bitmap: return "bitmap";
    case PsdMode::Gray: return "gray";
    case PsdMode::Indexed: return "indexed";
    case PsdMode::Rgb: return "RGB";
    case PsdMode::Cmyk: return "CMYK";
    case PsdMode::Multichannel: return "multichannel";
    case PsdMode::Duotone: return "duotone";
    case PsdMode::Lab: return "Lab";
  }
  return "unknown";
}

bool ShowsLayers(const PsdFile& document) {
  return !document.layers.empty() && (document.merged.empty() || !document.mergedIsReal);
}

// Whether the channel after those of the mode is alpha in the merged picture.
bool MergedHasAlpha(const PsdFile& document) {
  if (document.header.mode == PsdMode::Bitmap || document.header.mode == PsdMode::Multichannel)
    return false;
  if (document.header.channels <= PsdColorChannels(document.header) || document.firstExtraIsInk)
    return false;
  return document.mergedHasOpacity || document.layerCount == 0;
}

bool HasAlpha(const PsdFile& document) {
  return ShowsLayers(document) || MergedHasAlpha(document) || document.transparentIndex >= 0;
}

int32_t BitsOf(const PsdHeader& header) {
  if (header.mode == PsdMode::Bitmap) return 1;
  return PsdColorChannels(header) == 1 ? 8 : 24;
}

Palette PaletteOf(const PsdFile& document) {
  if (document.header.mode == PsdMode::Bitmap) return BlackAndWhite(false);
  if (document.header.mode != PsdMode::Indexed) return GrayRamp();
  Palette palette;
  for (size_t i = 0; i < 256; ++i) {
    for (size_t c = 0; c < 3; ++c) palette[3 * i + c] = document.colorTable[256 * c + i];
  }
  return palette;
}

void CopyBlock(std::span<const uint8_t> block, std::vector<uint8_t>& into) {
  into.clear();
  if (block.size() <= limits.metadataBytes) into.assign(block.begin(), block.end());
}

// Ink and Lab pictures are converted to sRGB, so their profile is dropped.
bool KeepsProfile(const PsdHeader& header) {
  return header.mode == PsdMode::Gray || header.mode == PsdMode::Indexed ||
         header.mode == PsdMode::Rgb;
}

// Ok, or NoImages if there is nothing to show.
Status DescribePicture(const PsdFile& document, PictureRecord& picture) {
  const PsdHeader& header = document.header;
  picture.typeName.AssignCut(std::string("Photoshop, ") + ModeName(header));
  picture.width = header.width;
  picture.height = header.height;
  picture.bitsPerPixel = BitsOf(header);
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.pageCount = ShowsLayers(document) ? static_cast<int32_t>(document.layers.size()) : 1;
  picture.alphaFlags = static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) |
                                            (HasAlpha(document) ? kHasAlpha : 0));
  picture.simplified =
      header.depth == 16 || document.layerCount > 0 || header.channels > 4 || !KeepsProfile(header);
  picture.unread = static_cast<uint8_t>(
      (header.depth == 16 ? kUnreadDepth : 0) | (document.layerCount > 0 ? kUnreadLayers : 0) |
      (header.channels > 4 || !KeepsProfile(header) ? kUnreadInks : 0));
  if (picture.bitsPerPixel == 24) {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  } else {
    picture.palette = PaletteOf(document);
  }
  CopyBlock(document.exif, picture.metadata.exif);
  CopyBlock(document.xmp, picture.metadata.xmp);
  CopyBlock(KeepsProfile(header) ? document.icc : std::span<const uint8_t>(), picture.metadata.icc);
  picture.metadata.dpiX = document.dpiX;
  picture.metadata.dpiY = document.dpiY;
  return document.merged.empty() && document.layers.empty() ? Status::NoImages : Status::Ok;
}

// Converts rows of channels to rows of the picture.
class RowMaker {
 public:
  RowMaker(const PsdFile& document, size_t width)
      : width_(width), channels_(PsdColorChannels(document.header)) {
    const PsdMode mode = document.header.mode;
    if (mode == PsdMode::Lab)
      ink_ = std::make_unique<InkTransform>(InkTransform::Kind::Lab, std::span<const uint8_t>());
    if (mode == PsdMode::Cmyk || channels_ == 4)
      ink_ = std::make_unique<InkTransform>(InkTransform::Kind::Cmyk, document.icc);
    if (channels_ > 1) samples_.resize(channels_ * width);
    if (ink_ != nullptr) mixed_.resize(channels_ * width);
  }

  // `planes` are the color planes.
  Status Next(std::span<PsdPlane* const> planes, std::span<uint8_t> row) {
    if (channels_ == 1) return planes[0]->Next(row);
    for (size_t c = 0; c < channels_; ++c) RETURN_IF_BAD(planes[c]->Next(Samples(c)));
    if (ink_ == nullptr) {
      MergeColors(Samples(2).data(), Samples(1).data(), Samples(0).data(), width_, row.data());
      return Status::Ok;
    }
    for (size_t c = 0; c < channels_; ++c) {
      const uint8_t* from = Samples(c).data();
      for (size_t x = 0; x < width_; ++x) mixed_[channels_ * x + c] = from[x];
    }
    ink_->Apply(mixed_.data(), width_, row.data());
    return Status::Ok;
  }

 private:
  std::span<uint8_t> Samples(size_t channel) {
    return std::span(samples_).subspan(channel * width_, width_);
  }

  const size_t width_;
  const size_t channels_;
  std::vector<uint8_t> samples_;  // one row of each channel
  std::vector<uint8_t> mixed_;    // interleaved
  std::unique_ptr<InkTransform> ink_;
};

// Removes white from colors that were composited onto white by their opacity.
void TakeOffWhite(std::span<const uint8_t> alpha, size_t samples, std::span<uint8_t> row) {
  for (size_t x = 0; x < alpha.size(); ++x) {
    const int32_t opacity = alpha[x];
    if (opacity == 0 || opacity == 255) continue;
    for (size_t c = samples * x; c < samples * (x + 1); ++c) {
      const int32_t color = 255 - ((255 - row[c]) * 255 + opacity / 2) / opacity;
      row[c] = static_cast<uint8_t>(std::max(color, 0));
    }
  }
}

Status NewPlanes(const PsdFile& document, const PictureRecord& picture, PackedImage& image,
                 PackedImage& alpha) {
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  return HasAlpha(document) ? NewAlphaPlane(picture.width, picture.height, alpha) : Status::Ok;
}

Status ReadMerged(const PsdFile& document, const PictureRecord& picture, PackedImage& image,
                  PackedImage& alpha) {
  const PsdHeader& header = document.header;
  const auto width = static_cast<size_t>(header.width);
  const size_t colors = PsdColorChannels(header);
  PsdPlanes planes;
  RETURN_IF_BAD(planes.Open(document.merged, header, header.width, header.height, header.channels));
  RETURN_IF_BAD(NewPlanes(document, picture, image, alpha));
  const size_t bytes = image.Bits() == 1    ? header.RowSize(width)
                       : image.Bits() == 24 ? 3 * width
                                            : width;
  std::vector<PsdPlane*> ofColors;
  for (size_t c = 0; c < colors; ++c) ofColors.push_back(&planes[c]);
  RowMaker maker(document, width);
  for (int32_t y = 0; y < header.height; ++y) {
    const auto row = image.Row(y).first(bytes);
    RETURN_IF_BAD(maker.Next(ofColors, row));
    if (MergedHasAlpha(document)) {
      const auto opacity = alpha.Row(y).first(width);
      RETURN_IF_BAD(planes[colors].Next(opacity));
      if (document.mergedHasOpacity) TakeOffWhite(opacity, bytes / width, row);
    } else if (document.transparentIndex >= 0) {
      for (size_t x = 0; x < width; ++x)
        alpha.Row(y)[x] = row[x] == document.transparentIndex ? 0 : 255;
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

// Copies the part of a layer's row within the canvas.
void PlaceRow(std::span<const uint8_t> row, int32_t left, int32_t canvasWidth,
              std::span<uint8_t> target) {
  const auto bytes = static_cast<int64_t>(target.size()) / canvasWidth;
  const int64_t first = std::max<int64_t>(0, -int64_t{left});
  const int64_t end =
      std::min<int64_t>(static_cast<int64_t>(row.size()) / bytes, int64_t{canvasWidth} - left);
  if (first >= end) return;
  std::copy(row.begin() + first * bytes, row.begin() + end * bytes,
            target.begin() + (first + left) * bytes);
}

Status ReadLayer(const PsdFile& document, const PsdLayer& layer, const PictureRecord& picture,
                 PackedImage& image, PackedImage& alpha) {
  const PsdHeader& header = document.header;
  const int32_t width = layer.right - layer.left, height = layer.bottom - layer.top;
  const size_t colors = PsdColorChannels(header), samples = picture.bitsPerPixel == 24 ? 3 : 1;
  std::vector<PsdPlanes> planes(colors + 1);
  std::vector<PsdPlane*> ofColors;
  for (size_t c = 0; c < colors; ++c) {
    const PsdChannel* channel = layer.Channel(static_cast<int16_t>(c));
    if (channel == nullptr) return Status::DamagedFile;
    RETURN_IF_BAD(planes[c].Open(channel->data, header, width, height, 1));
    ofColors.push_back(&planes[c][0]);
  }
  const PsdChannel* opacity = layer.Channel(kPsdTransparency);
  if (opacity != nullptr)
    RETURN_IF_BAD(planes[colors].Open(opacity->data, header, width, height, 1));
  RETURN_IF_BAD(NewPlanes(document, picture, image, alpha));
  RowMaker maker(document, static_cast<size_t>(width));
  std::vector<uint8_t> row(samples * static_cast<size_t>(width)),
      opacityRow(static_cast<size_t>(width), 255);
  const auto canvasWidth = static_cast<size_t>(header.width);
  for (int32_t i = 0; i < height; ++i) {
    RETURN_IF_BAD(picture.ReportRow(i, height));
    const int64_t y = int64_t{layer.top} + i;
    if (y >= header.height) break;
    RETURN_IF_BAD(maker.Next(ofColors, row));
    if (opacity != nullptr) RETURN_IF_BAD(planes[colors][0].Next(opacityRow));
    if (y < 0) continue;
    PlaceRow(row, layer.left, header.width,
             image.Row(static_cast<int32_t>(y)).first(samples * canvasWidth));
    PlaceRow(opacityRow, layer.left, header.width,
             alpha.Row(static_cast<int32_t>(y)).first(canvasWidth));
  }
  return Status::Ok;
}

Status OpenDocument(platform::FileView& file, const std::string& name, PsdFile& document,
                    PictureRecord& picture) {
  if (!file.Open(name)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  RETURN_IF_BAD(ParsePsd(file.Bytes(), document));
  return DescribePicture(document, picture);
}

const char* CompressionName(std::span<const uint8_t> merged) {
  constexpr const char* kNames[] = {"none", "PackBits", "deflate", "deflate, differences"};
  if (merged.size() < 2) return "no merged picture";
  return merged[0] == 0 && merged[1] < std::size(kNames) ? kNames[merged[1]] : "unknown";
}

}  // namespace

Status PsdInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  PsdFile document;
  return OpenDocument(file, request.fileName, document, picture);
}

Status PsdRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  PsdFile document;
  RETURN_IF_BAD(OpenDocument(file, request.fileName, document, picture));
  if (request.page < 0 || request.page >= picture.pageCount) return Status::NoImages;
  PackedImage image, alpha;
  if (ShowsLayers(document)) {
    RETURN_IF_BAD(ReadLayer(document, document.layers[static_cast<size_t>(request.page)], picture, image, alpha));
  } else {
    RETURN_IF_BAD(ReadMerged(document, picture, image, alpha));
  }
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status PsdDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  PsdFile document;
  RETURN_IF_BAD(OpenDocument(file, picture.fileName.c_str(), document, picture));
  DetailLines& lines = picture.detailLines;
  lines.AddFormat("         Mode: %s, %u bits", ModeName(document.header),
                  unsigned{document.header.depth});
  lines.AddFormat("     Channels: %u", unsigned{document.header.channels});
  lines.AddFormat("       Layers: %zu", document.layerCount);
  lines.AddFormat("  Compression: %s", CompressionName(document.merged));
  if (document.dpiX > 0)
    lines.AddFormat("   Resolution: %.0f x %.0f dpi", document.dpiX, document.dpiY);
  if (!document.icc.empty()) lines.AddFormat("  ICC profile: %zu bytes", document.icc.size());
  if (!document.exif.empty()) lines.AddFormat("         EXIF: %zu bytes", document.exif.size());
  if (!document.xmp.empty()) lines.AddFormat("          XMP: %zu bytes", document.xmp.size());
  return Status::Ok;
}

}  // namespace fotomill
