// HD Photo, also known as JPEG XR: the layout is described in hdp_file.cpp, hdp_codec.cpp calls the
// library, hdp_write.cpp is the writer.
//
// Reader: bilevel stays bilevel, grays become 8 bits, everything else 24 bits, with an alpha plane
// if the file has alpha; premultiplied colors are divided by alpha. Integers of more than 8 bits
// are rounded; floating and fixed point values are linear light and converted to sRGB, 0 being
// black and 1 white. CMYK is converted to RGB by the usual formula. Video YCbCr and other channels
// are rejected. Rotation is not applied but stored in an EXIF block. XMP, ICC profile, description,
// EXIF and resolution are kept. Further pages are read by number. Source: ITU-T T.832 (2019); IEC
// 61966-2-2 for the linear ranges.
#include "formats/hdphoto/hdp.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <memory>
#include <vector>

#include "core/limits.h"
#include "formats/hdphoto/hdp_codec.h"
#include "formats/hdphoto/hdp_file.h"
#include "formats/metadata_blocks.h"
#include "picture/gray_palette.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr double kFixed16One = 1 << 13, kFixed32One = 1 << 24;
constexpr int kRgbeBias = 128 + 8;

uint8_t Rounded(double value) {
  return !(value > 0) ? uint8_t{0}
         : value >= 1 ? uint8_t{255}
                      : static_cast<uint8_t>(value * 255 + 0.5);
}

// Linear light, 0 to 1 in 65535 steps, to sRGB. Source: IEC 61966-2-1.
const std::vector<uint8_t>& SrgbCurve() {
  static const std::vector<uint8_t> curve = [] {
    std::vector<uint8_t> values(65536);
    for (size_t i = 0; i < values.size(); ++i) {
      const double light = static_cast<double>(i) / 65535;
      values[i] =
          Rounded(light <= 0.0031308 ? 12.92 * light : 1.055 * std::pow(light, 1 / 2.4) - 0.055);
    }
    return values;
  }();
  return curve;
}

uint8_t OfLight(double light, const std::vector<uint8_t>& curve) {
  return !(light > 0) ? uint8_t{0}
         : light >= 1 ? uint8_t{255}
                      : curve[static_cast<size_t>(light * 65535 + 0.5)];
}

template <typename T>
T Load(const uint8_t* source) {
  T value;
  std::memcpy(&value, source, sizeof value);
  return value;
}

double HalfToReal(uint16_t half) {
  const int exponent = half >> 10 & 31, fraction = half & 1023;
  const double value =
      exponent == 0 ? std::ldexp(fraction, -24) : std::ldexp(fraction + 1024, exponent - 25);
  return exponent == 31         ? (fraction == 0 && (half & 0x8000) == 0 ? 2 : 0)
         : (half & 0x8000) != 0 ? -value
                                : value;
}

// A sample as a floating point number, 1 being white.
double RealSample(const uint8_t* source, HdpDepth depth) {
  switch (depth) {
    case HdpDepth::Fixed16: return Load<int16_t>(source) / kFixed16One;
    case HdpDepth::Half: return HalfToReal(Load<uint16_t>(source));
    case HdpDepth::Fixed32: return Load<int32_t>(source) / kFixed32One;
    case HdpDepth::U32: return Load<uint32_t>(source) / 4294967295.0;
    default: return Load<float>(source);
  }
}

bool IsLinear(HdpDepth depth) {
  return depth == HdpDepth::Fixed16 || depth == HdpDepth::Half || depth == HdpDepth::Fixed32 ||
         depth == HdpDepth::Float;
}

// Converts `count` samples of a row to bytes; a pixel has `step` samples, the last one being alpha
// if there is alpha.
void SamplesToBytes(const uint8_t* row, HdpDepth depth, size_t count, size_t step, bool alpha,
                    uint8_t* target) {
  if (depth == HdpDepth::U16) {
    for (size_t i = 0; i < count; ++i)
      target[i] = static_cast<uint8_t>((Load<uint16_t>(row + 2 * i) * 255u + 32895) >> 16);
    return;
  }
  const size_t bytes = depth == HdpDepth::Fixed16 || depth == HdpDepth::Half ? 2 : 4;
  const auto& curve = SrgbCurve();
  for (size_t i = 0; i < count; ++i) {
    const double value = RealSample(row + bytes * i, depth);
    const bool curved = IsLinear(depth) && !(alpha && i % step == step - 1);
    target[i] = curved ? OfLight(value, curve) : Rounded(value);
  }
}

// 16 or 32-bit pixels with three colors, whose widths are given from the lowest bit up: blue first.
void PackedToBytes(const uint8_t* row, HdpDepth depth, int32_t width, uint8_t* image) {
  const uint32_t outer = depth == HdpDepth::Rgb101010 ? 10 : 5;
  const uint32_t middle = depth == HdpDepth::Rgb101010 ? 10 : depth == HdpDepth::Rgb565 ? 6 : 5;
  const auto scaled = [](uint32_t value, uint32_t bits) {
    const uint32_t most = (1u << bits) - 1;
    return static_cast<uint8_t>(((value & most) * 255 + most / 2) / most);
  };
  for (int32_t x = 0; x < width; ++x, image += 3) {
    const uint32_t pixel = outer == 10 ? Load<uint32_t>(row + 4 * static_cast<size_t>(x))
                                       : Load<uint16_t>(row + 2 * static_cast<size_t>(x));
    image[0] = scaled(pixel, outer);
    image[1] = scaled(pixel >> outer, middle);
    image[2] = scaled(pixel >> (outer + middle), outer);
  }
}

void RgbeToBytes(const uint8_t* row, int32_t width, uint8_t* image) {
  const auto& curve = SrgbCurve();
  for (int32_t x = 0; x < width; ++x, row += 4, image += 3) {
    const double unit = row[3] == 0 ? 0 : std::ldexp(1.0, row[3] - kRgbeBias);
    for (size_t i = 0; i < 3; ++i) image[i] = OfLight(row[2 - i] * unit, curve);
  }
}

struct HdpTarget {
  PackedImage image, alpha;
};

// Converts rows of the raster to the picture's.
class HdpConverter {
 public:
  HdpConverter(const HdpPage& page, const HdpRaster& raster, HdpTarget& target)
      : form_(page.image),
        raster_(raster),
        target_(target),
        multiplied_(raster.alpha && page.image.multiplied),
        bytes_(static_cast<size_t>(page.image.width) * raster.samples) {}

  void Store(int32_t y) {
    const uint8_t* row = raster_.Row(y);
    uint8_t* image = target_.image.Row(y).data();
    if (raster_.sampleBytes == 0) {
      std::memcpy(image, row, (static_cast<size_t>(form_.width) + 7) / 8);
    } else if (form_.depth == HdpDepth::Rgb555 || form_.depth == HdpDepth::Rgb565 ||
               form_.depth == HdpDepth::Rgb101010) {
      PackedToBytes(row, form_.depth, form_.width, image);
    } else if (form_.colors == HdpColors::Rgbe) {
      RgbeToBytes(row, form_.width, image);
    } else {
      StoreSamples(row, image);
      if (raster_.alpha) StoreAlpha(image, target_.alpha.Row(y).data());
    }
  }

 private:
  void StoreSamples(const uint8_t* row, uint8_t* image) {
    samples_ = row;
    const bool deep = raster_.sampleBytes > 1;
    if (deep) {
      SamplesToBytes(row, form_.depth, bytes_.size(), raster_.samples, raster_.alpha,
                     bytes_.data());
      samples_ = bytes_.data();
    }
    const uint8_t* source = samples_;
    const auto width = static_cast<size_t>(form_.width), step = size_t{raster_.samples};
    const size_t first = deep ? 2 : 0;  // deep colors are red first
    switch (form_.colors) {
      case HdpColors::Gray:
        for (size_t x = 0; x < width; ++x, source += step) {
          if (raster_.alpha) {
            std::fill_n(image + 3 * x, 3, *source);
          } else {
            image[x] = *source;
          }
        }
        break;
      case HdpColors::Cmyk:
        for (size_t x = 0; x < width; ++x, source += step, image += 3) {
          for (size_t i = 0; i < 3; ++i)
            image[i] =
                static_cast<uint8_t>(((255u - source[2 - i]) * (255u - source[3]) + 127) / 255);
        }
        break;
      default:
        for (size_t x = 0; x < width; ++x, source += step, image += 3) {
          image[0] = source[first];
          image[1] = source[1];
          image[2] = source[2 - first];
        }
    }
  }

  void StoreAlpha(uint8_t* image, uint8_t* alpha) const {
    const uint8_t* source = samples_ + raster_.samples - 1;
    for (int32_t x = 0; x < form_.width; ++x, source += raster_.samples, image += 3) {
      alpha[x] = *source;
      if (!multiplied_) continue;
      for (size_t i = 0; i < 3; ++i) {
        image[i] =
            *source == 0
                ? uint8_t{0}
                : static_cast<uint8_t>(std::min(255u, (image[i] * 255u + *source / 2u) / *source));
      }
    }
  }

  const HdpStream& form_;
  const HdpRaster& raster_;
  HdpTarget& target_;
  const bool multiplied_;
  std::vector<uint8_t> bytes_;        // one row's samples
  const uint8_t* samples_ = nullptr;  // of the current row
};

bool HasAlpha(const HdpPage& page) {
  const bool colors = page.image.colors == HdpColors::Rgb || page.image.colors == HdpColors::Cmyk;
  return !page.alpha.bytes.empty() || (page.image.alpha && colors);
}

int32_t BitsOf(const HdpPage& page) {
  if (page.image.colors != HdpColors::Gray || HasAlpha(page)) return 24;
  return page.image.depth == HdpDepth::WhiteIsOne || page.image.depth == HdpDepth::BlackIsOne ? 1
                                                                                              : 8;
}

void TakeMetadata(std::span<const uint8_t> file, const HdpPage& page, PictureRecord& picture) {
  PictureMetadata& metadata = picture.metadata;
  metadata = {};
  metadata.exif = HdpExifBlock(file, page);
  TakeBlock(page.xmp, metadata.xmp);
  TakeBlock(page.icc, metadata.icc);
  const auto end = std::find(page.description.begin(), page.description.end(), uint8_t{0});
  TakeBlock(page.description.first(static_cast<size_t>(end - page.description.begin())),
            picture.comment);
  TakeResolution(page.dpiX, page.dpiY, metadata);
}

Status Describe(std::span<const uint8_t> file, int32_t index, HdpPage& page,
                PictureRecord& picture) {
  RETURN_IF_BAD(ParseHdpPage(file, index, page));
  picture.pageCount = std::max(1, CountHdpPages(file));
  picture.typeName.AssignCut("HD Photo");
  picture.width = page.image.width;
  picture.height = page.image.height;
  picture.bitsPerPixel = BitsOf(page);
  picture.simplified = page.image.depth != HdpDepth::U8 || page.image.colors >= HdpColors::Cmyk;
  picture.unread = static_cast<uint8_t>((page.image.depth != HdpDepth::U8 ? kUnreadDepth : 0) |
                                        (page.image.colors >= HdpColors::Cmyk ? kUnreadInks : 0));
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (HasAlpha(page) ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  if (picture.bitsPerPixel == 24) {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  } else {
    picture.palette = GrayLevels(picture.bitsPerPixel);
  }
  TakeMetadata(file, page, picture);
  return Status::Ok;
}

const char* ColorsName(HdpColors colors) {
  constexpr const char* kNames[] = {"gray",         "YUV 4:2:0", "YUV 4:2:2",
                                    "YUV 4:4:4",    "CMYK",      "CMYK, direct",
                                    "any channels", "RGB",       "RGBE"};
  return kNames[static_cast<size_t>(colors)];
}

const char* DepthName(HdpDepth depth) {
  constexpr const char* kNames[] = {
      "1 bit",         "8 bits", "16 bits", "16 bits, fixed point", "16 bits, real", "32 bits", "32 bits, fixed point",
      "32 bits, real", "5 bits", "10 bits", "5, 6, 5 bits"};
  return depth == HdpDepth::BlackIsOne ? kNames[0] : kNames[static_cast<size_t>(depth)];
}

void AddDetails(const HdpPage& page, const PictureRecord& picture, DetailLines& lines) {
  constexpr const char* kInternal[] = {"gray", "4:2:0", "4:2:2",    "4:4:4",
                                       "CMYK", "?",     "channels", "?"};
  const HdpStream& image = page.image;
  lines.AddFormat("  Color space: %s", ColorsName(image.colors));
  lines.AddFormat("      Samples: %s", DepthName(image.depth));
  lines.AddFormat("     Sampling: %s", kInternal[image.internalColors & 7]);
  lines.AddFormat("  Compression: %s", image.lossless ? "lossless" : "lossy");
  lines.AddFormat("        Order: %s", image.frequencyOrder ? "by frequency" : "by place");
  lines.AddFormat("      Overlap: %d of 2", image.overlap);
  if (image.tiles > 1) lines.AddFormat("        Tiles: %u", image.tiles);
  if (HasAlpha(page)) {
    lines.AddFormat("        Alpha: %s%s", page.alpha.bytes.empty() ? "with colors" : "separate",
                    image.multiplied ? ", multiplied" : "");
  }
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0)
    lines.AddFormat("   Resolution: %.0f x %.0f dpi", metadata.dpiX, metadata.dpiY);
  if (page.turn > 0) lines.AddFormat("  Orientation: %u", unsigned{OrientationOfTurn(page.turn)});
  if (!metadata.icc.empty()) lines.AddFormat("  ICC profile: %zu bytes", metadata.icc.size());
  if (!metadata.xmp.empty()) lines.AddFormat("          XMP: %zu bytes", metadata.xmp.size());
  if (!metadata.exif.empty()) lines.AddFormat("         EXIF: %zu bytes", metadata.exif.size());
  if (picture.pageCount > 1) lines.AddFormat("        Pages: %d", picture.pageCount);
}

}  // namespace

bool HdpWorksHere() { return HasHdpLibrary(); }

Status HdpInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  HdpPage page;
  return Describe(file.Bytes(), request.page, page, picture);
}

Status HdpRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  HdpPage page;
  RETURN_IF_BAD(Describe(file.Bytes(), request.page, page, picture));
  RETURN_IF_BAD(CheckPackedSize(picture.width, picture.height, picture.bitsPerPixel));
  HdpRaster raster;
  RETURN_IF_BAD(DecodeHdp(page, raster, picture.stop,
                          [&](int32_t rows) { (void)picture.ReportRow(rows); }));
  if (!file.Intact()) return Status::FileReadError;
  HdpTarget target;
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, target.image));
  if (raster.alpha) RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, target.alpha));
  HdpConverter converter(page, raster, target);
  for (int32_t y = 0; y < picture.height; ++y) {
    converter.Store(y);
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  picture.image = std::move(target.image);
  picture.alpha = std::move(target.alpha);
  return Status::Ok;
}

Status HdpDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  HdpPage page;
  RETURN_IF_BAD(Describe(file.Bytes(), 0, page, picture));
  AddDetails(page, picture, picture.detailLines);
  return Status::Ok;
}

}  // namespace fotomill
