// The TIFF writer: little-endian, in strips, compressed according to TiffOptions. Palettes of 1, 4
// and 8 bits keep their depth (grays as gray), colors are RGB, with an alpha plane as a separate
// extra sample. CCITT Group 4 is used for black and white only, JPEG for 8-bit grays and colors
// without alpha; everything else falls back to LZW. The resolution is the picture's, else
// TiffResolution. An EXIF block is stored in the file's own directories, without its thumbnail,
// which would become a page.
#include <algorithm>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "containers/exif_directories.h"
#include "core/choice_lists.h"
#include "core/creator.h"
#include "formats/tiff/tiff.h"
#include "formats/tiff/tiff_file.h"
#include "formats/tiff/tiff_lzw.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint64_t kStripBytes = 128 * 1024;
constexpr uint32_t kJpegBlock = 16;  // strip heights are a multiple

enum class Grays { No, Rising, Falling };

// Whether the palette is the gray ramp of its depth, starting at black or at white.
Grays GraysOf(const PictureRecord& picture) {
  const int colors = picture.image.Colors();
  bool rising = colors > 0, falling = colors > 0;
  for (int i = 0; i < 3 * colors; ++i) {
    const int level = i / 3 * 255 / (colors - 1), value = picture.palette[static_cast<size_t>(i)];
    rising = rising && value == level;
    falling = falling && value == (colors - 1 - i / 3) * 255 / (colors - 1);
  }
  return rising ? Grays::Rising : falling ? Grays::Falling : Grays::No;
}

struct TiffPlan {
  uint16_t compression = COMPRESSION_LZW;
  uint16_t photometric = PHOTOMETRIC_RGB;
  uint16_t samples = 1, bits = 8;
  bool predict = false;  // horizontal differencing
  bool invert = false;   // fax pictures are black on white
};

uint16_t CompressionFor(const TiffPlan& plan, Grays grays, int32_t choice) {
  switch (std::clamp<int32_t>(choice, choice::kTiffNone, choice::kTiffJpeg)) {
    case choice::kTiffNone: return COMPRESSION_NONE;
    case choice::kTiffPackBits: return COMPRESSION_PACKBITS;
    case choice::kTiffCcitt:
      return plan.bits == 1 && grays != Grays::No ? COMPRESSION_CCITTFAX4 : COMPRESSION_LZW;
    case choice::kTiffDeflate: return COMPRESSION_ADOBE_DEFLATE;
    case choice::kTiffJpeg:
      return plan.bits == 8 && (plan.samples == 3 || (plan.samples == 1 && grays == Grays::Rising))
                 ? COMPRESSION_JPEG
                 : COMPRESSION_LZW;
    default: return COMPRESSION_LZW;
  }
}

TiffPlan MakePlan(const PictureRecord& picture, int32_t compression) {
  TiffPlan plan;
  const Grays grays = GraysOf(picture);
  const bool color = picture.image.Bits() == 24;
  plan.bits = static_cast<uint16_t>(color ? 8 : picture.image.Bits());
  plan.samples = static_cast<uint16_t>(!color ? 1 : picture.alpha.Empty() ? 3 : 4);
  plan.compression = CompressionFor(plan, grays, compression);
  if (!color) {
    plan.photometric = grays == Grays::Rising    ? PHOTOMETRIC_MINISBLACK
                       : grays == Grays::Falling ? PHOTOMETRIC_MINISWHITE
                                                 : PHOTOMETRIC_PALETTE;
  }
  if (plan.compression == COMPRESSION_CCITTFAX4) {
    plan.invert = plan.photometric == PHOTOMETRIC_MINISBLACK;
    plan.photometric = PHOTOMETRIC_MINISWHITE;
  }
  if (plan.compression == COMPRESSION_JPEG && color) plan.photometric = PHOTOMETRIC_YCBCR;
  plan.predict =
      (plan.compression == COMPRESSION_LZW || plan.compression == COMPRESSION_ADOBE_DEFLATE) &&
      plan.bits == 8 && plan.photometric != PHOTOMETRIC_PALETTE;
  return plan;
}

void SetColors(TIFF* tiff, const PictureRecord& picture) {
  std::vector<uint16_t> channels[3];
  for (size_t c = 0; c < 3; ++c) {
    for (size_t i = 0; i < static_cast<size_t>(picture.image.Colors()); ++i) {
      channels[c].push_back(static_cast<uint16_t>(picture.palette[3 * i + c] * 257));
    }
  }
  TIFFSetField(tiff, TIFFTAG_COLORMAP, channels[0].data(), channels[1].data(), channels[2].data());
}

void SetLayout(TIFF* tiff, const PictureRecord& picture, const TiffPlan& plan,
               int32_t jpegQuality) {
  const PackedImage& image = picture.image;
  TIFFSetField(tiff, TIFFTAG_IMAGEWIDTH, static_cast<uint32_t>(image.Width()));
  TIFFSetField(tiff, TIFFTAG_IMAGELENGTH, static_cast<uint32_t>(image.Height()));
  TIFFSetField(tiff, TIFFTAG_BITSPERSAMPLE, int{plan.bits});
  TIFFSetField(tiff, TIFFTAG_SAMPLESPERPIXEL, int{plan.samples});
  TIFFSetField(tiff, TIFFTAG_COMPRESSION, int{plan.compression});
  TIFFSetField(tiff, TIFFTAG_PHOTOMETRIC, int{plan.photometric});
  TIFFSetField(tiff, TIFFTAG_PLANARCONFIG, PLANARCONFIG_CONTIG);
  if (plan.predict) TIFFSetField(tiff, TIFFTAG_PREDICTOR, PREDICTOR_HORIZONTAL);
  if (plan.photometric == PHOTOMETRIC_PALETTE) SetColors(tiff, picture);
  if (plan.samples == 4) {
    uint16_t kind = EXTRASAMPLE_UNASSALPHA;
    TIFFSetField(tiff, TIFFTAG_EXTRASAMPLES, 1, &kind);
  }
  if (plan.compression == COMPRESSION_JPEG) {
    TIFFSetField(tiff, TIFFTAG_JPEGQUALITY, std::clamp<int>(jpegQuality, 1, 100));
    if (plan.photometric == PHOTOMETRIC_YCBCR)
      TIFFSetField(tiff, TIFFTAG_JPEGCOLORMODE, JPEGCOLORMODE_RGB);
  }
  const uint64_t rowBytes =
      (static_cast<uint64_t>(image.Width()) * plan.bits * plan.samples + 7) / 8;
  uint64_t rows = std::max<uint64_t>(kStripBytes / rowBytes, 1);
  if (plan.compression == COMPRESSION_JPEG)
    rows = (rows + kJpegBlock - 1) / kJpegBlock * kJpegBlock;
  if (plan.compression == COMPRESSION_CCITTFAX4) rows = static_cast<uint64_t>(image.Height());
  TIFFSetField(
      tiff, TIFFTAG_ROWSPERSTRIP,
      static_cast<uint32_t>(std::min<uint64_t>(rows, static_cast<uint64_t>(image.Height()))));
}

// Tags of titles and ratings that are unknown to the library. Source: Microsoft,
// "Photo Metadata Policies".
constexpr TIFFFieldInfo kTitles[] = {
    {0x4746, 1, 1, TIFF_SHORT, FIELD_CUSTOM, 1, 0, const_cast<char*>("Rating")},
    {0x4749, 1, 1, TIFF_SHORT, FIELD_CUSTOM, 1, 0, const_cast<char*>("RatingPercent")},
    {0x9C9B, TIFF_VARIABLE2, TIFF_VARIABLE2, TIFF_BYTE, FIELD_CUSTOM, 1, 1, const_cast<char*>("XPTitle")},
    {0x9C9C, TIFF_VARIABLE2, TIFF_VARIABLE2, TIFF_BYTE, FIELD_CUSTOM, 1, 1, const_cast<char*>("XPComment")},
    {0x9C9D, TIFF_VARIABLE2, TIFF_VARIABLE2, TIFF_BYTE, FIELD_CUSTOM, 1, 1, const_cast<char*>("XPAuthor")},
    {0x9C9E, TIFF_VARIABLE2, TIFF_VARIABLE2, TIFF_BYTE, FIELD_CUSTOM, 1, 1, const_cast<char*>("XPKeywords")},
    {0x9C9F, TIFF_VARIABLE2, TIFF_VARIABLE2, TIFF_BYTE, FIELD_CUSTOM, 1, 1, const_cast<char*>("XPSubject")},
};

// Copies tags of the EXIF block's IFD0 that describe the picture to the file's directory.
void SetDescription(TIFF* tiff, const ExifDirectories& directories) {
  TIFFMergeFieldInfo(tiff, kTitles, static_cast<uint32_t>(std::size(kTitles)));
  for (const ExifEntry& entry : directories.first) {
    const bool title =
        std::any_of(std::begin(kTitles), std::end(kTitles), [&](const TIFFFieldInfo& info) {
          return info.field_tag == entry.tag && info.field_type == entry.type;
        });
    if (entry.type == TIFF_ASCII) {
      const std::string text(entry.value.begin(),
                             std::find(entry.value.begin(), entry.value.end(), uint8_t{0}));
      TIFFSetField(tiff, entry.tag, text.c_str());
    } else if (title && entry.type == TIFF_SHORT && entry.value.size() >= 2) {
      const uint8_t* value = entry.value.data();
      TIFFSetField(tiff, entry.tag,
                   directories.bigEndian ? value[0] << 8 | value[1] : value[1] << 8 | value[0]);
    } else if (title && entry.type == TIFF_BYTE) {
      TIFFSetField(tiff, entry.tag, entry.count, entry.value.data());
    }
  }
  TIFFSetField(tiff, TIFFTAG_ORIENTATION, int{OrientationOf(directories)});
}

// Writes the EXIF directories, which must precede the directory that points to them.
void WriteExif(TiffOutput& output, const ExifDirectories& directories) {
  const PlacedExif placed = PlaceExif(directories, static_cast<uint32_t>(output.End()));
  output.Append(placed.bytes);
  if (placed.exifOffset != 0)
    TIFFSetField(output.Handle(), TIFFTAG_EXIFIFD, uint64_t{placed.exifOffset});
  if (placed.gpsOffset != 0)
    TIFFSetField(output.Handle(), TIFFTAG_GPSIFD, uint64_t{placed.gpsOffset});
}

void SetMetadata(TiffOutput& output, PictureRecord& picture, const WriteOptions& options) {
  const bool keep = options.KeepsMetadata();
  TIFF* tiff = output.Handle();
  const PictureMetadata& metadata = picture.metadata;
  TIFFSetField(tiff, TIFFTAG_RESOLUTIONUNIT, RESUNIT_INCH);
  TIFFSetField(tiff, TIFFTAG_XRESOLUTION,
               metadata.dpiX > 0 ? metadata.dpiX : options.encode.resolution);
  TIFFSetField(tiff, TIFFTAG_YRESOLUTION,
               metadata.dpiY > 0 ? metadata.dpiY : options.encode.resolution);
  if (!keep || picture.metadata.exif.empty())
    TIFFSetField(tiff, TIFFTAG_SOFTWARE, std::string(kCreator).c_str());
  const auto setBlock = [tiff](uint32_t tag, const std::vector<uint8_t>& block) {
    if (!block.empty()) TIFFSetField(tiff, tag, static_cast<uint32_t>(block.size()), block.data());
  };
  setBlock(TIFFTAG_ICCPROFILE, metadata.icc);
  if (!keep) return;
  const ExifDirectories exif = ParseExifBlock(metadata.exif);
  if (exif.Empty() && !metadata.exif.empty()) picture.lostMetadata |= kLostExif;
  SetDescription(tiff, exif);
  WriteExif(output, exif);
  setBlock(TIFFTAG_XMLPACKET, metadata.xmp);
  const std::string comment(picture.comment.begin(), picture.comment.end());
  const char* described = nullptr;
  if (!comment.empty() && TIFFGetField(tiff, TIFFTAG_IMAGEDESCRIPTION, &described) == 0)
    TIFFSetField(tiff, TIFFTAG_IMAGEDESCRIPTION, comment.c_str());
}

// A row in file layout. The library's predictor and byte swapping modify the buffer.
void MakeRow(const PictureRecord& picture, const TiffPlan& plan, int32_t y,
             std::vector<uint8_t>& row) {
  const uint8_t* source = picture.image.Row(y).data();
  if (picture.image.Bits() != 24) {
    const uint8_t flip = plan.invert ? 0xFF : 0;
    for (size_t i = 0; i < row.size(); ++i) row[i] = static_cast<uint8_t>(source[i] ^ flip);
    return;
  }
  if (plan.samples == 3) {
    SwapColors(source, static_cast<size_t>(picture.image.Width()), row.data());
    return;
  }
  const uint8_t* alpha = plan.samples == 4 ? picture.alpha.Row(y).data() : nullptr;
  uint8_t* target = row.data();
  for (int32_t x = 0; x < picture.image.Width(); ++x, source += 3, target += plan.samples) {
    target[0] = source[2];
    target[1] = source[1];
    target[2] = source[0];
    if (alpha != nullptr) target[3] = alpha[x];
  }
}

Status WriteScanlines(TIFF* tiff, const PictureRecord& picture, const TiffPlan& plan,
                      size_t rowBytes) {
  std::vector<uint8_t> row(rowBytes);
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    MakeRow(picture, plan, y, row);
    if (TIFFWriteScanline(tiff, row.data(), static_cast<uint32_t>(y), 0) < 0)
      return Status::ErrorWritingFile;
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

// Writes LZW strips with our own encoder, which takes two thirds of the library's time.
Status WriteLzwStrips(TIFF* tiff, const PictureRecord& picture, const TiffPlan& plan,
                      size_t rowBytes) {
  uint32_t rowsPerStrip = 0;
  TIFFGetField(tiff, TIFFTAG_ROWSPERSTRIP, &rowsPerStrip);
  const auto height = static_cast<uint32_t>(picture.image.Height());
  std::vector<uint8_t> row(rowBytes), strip(rowBytes * rowsPerStrip), coded;
  TiffLzwEncoder encoder;
  for (uint32_t top = 0, index = 0; top < height; top += rowsPerStrip, ++index) {
    const uint32_t rows = std::min(rowsPerStrip, height - top);
    for (uint32_t r = 0; r < rows; ++r) {
      MakeRow(picture, plan, static_cast<int32_t>(top + r), row);
      uint8_t* target = strip.data() + r * rowBytes;
      const size_t plain = plan.predict ? plan.samples : rowBytes;
      std::copy_n(row.begin(), plain, target);
      for (size_t i = plain; i < rowBytes; ++i)
        target[i] = static_cast<uint8_t>(row[i] - row[i - plain]);
      RETURN_IF_BAD(picture.ReportRow(static_cast<int32_t>(top + r)));
    }
    encoder.Encode(std::span(strip).first(rows * rowBytes), coded);
    if (TIFFWriteRawStrip(tiff, index, coded.data(), static_cast<tmsize_t>(coded.size())) < 0)
      return Status::ErrorWritingFile;
  }
  return Status::Ok;
}

// Writes a directory with its picture; further ones may follow.
Status WritePage(TiffOutput& output, PictureRecord& picture, const WriteOptions& options) {
  TIFF* tiff = output.Handle();
  const TiffPlan plan = MakePlan(picture, options.encode.tiffCompression);
  SetLayout(tiff, picture, plan, options.encode.jpegQuality);
  SetMetadata(output, picture, options);
  const size_t rowBytes =
      (static_cast<size_t>(picture.image.Width()) * plan.bits * plan.samples + 7) / 8;
  const bool lzw = plan.compression == COMPRESSION_LZW;
  RETURN_IF_BAD((lzw ? WriteLzwStrips : WriteScanlines)(tiff, picture, plan, rowBytes));
  return TIFFWriteDirectory(tiff) != 0 ? Status::Ok : Status::ErrorWritingFile;
}

// The library would read the file back to find the last page, which is not possible while it is
// being written. So each page is written as if it were the only one, and the pages are linked here.
class TiffSequence final : public SequenceWriter {
 public:
  TiffSequence(const SequenceFacts& facts, const WriteOptions& options)
      : facts_(facts), options_(options) {}
  Status Create(const std::string& path) {
    return out_.Create(path) ? Status::Ok : Status::ErrorCreatingFile;
  }

  Status Add(PictureRecord& picture, int32_t) override {
    if (picture.image.Empty()) return Status::EmptyImage;
    TiffOutput output(out_);
    if (!output.Open()) return Status::MemoryAllocationError;
    const auto count = static_cast<uint16_t>(std::min<size_t>(facts_.count, UINT16_MAX));
    TIFFSetField(output.Handle(), TIFFTAG_SUBFILETYPE, FILETYPE_PAGE);
    TIFFSetField(output.Handle(), TIFFTAG_PAGENUMBER, page_++, count);
    RETURN_IF_BAD(WritePage(output, picture, options_));
    if (out_.Position() > UINT32_MAX) return Status::UnsuitableImage;
    if (first_ == 0) first_ = output.Directory();
    if (next_ != 0) out_.PatchLe32(next_, output.Directory());
    next_ = output.NextPlace();
    return Status::Ok;
  }

  Status Finish() override {
    if (first_ == 0) return Status::EmptyImage;
    out_.PatchLe32(kFirstPlace, first_);
    return CommitOutput(out_, options_);
  }

 private:
  static constexpr uint64_t kFirstPlace = 4;  // in the file header

  const SequenceFacts facts_;
  const WriteOptions options_;
  ByteWriter out_;
  uint32_t first_ = 0, next_ = 0;  // the first directory, and the last one's link
  uint16_t page_ = 0;
};

}  // namespace

Status TiffWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  {
    TiffOutput output(out);
    if (!output.Open()) return Status::MemoryAllocationError;
    RETURN_IF_BAD(WritePage(output, picture, options));
  }
  return CommitOutput(out, options);
}

Status TiffSequenceBegin(const std::string& path, const SequenceFacts& facts,
                         const WriteOptions& options, SequencePointer& sequence) {
  auto made = std::make_unique<TiffSequence>(facts, options);
  RETURN_IF_BAD(made->Create(path));
  sequence = std::move(made);
  return Status::Ok;
}

}  // namespace fotomill
