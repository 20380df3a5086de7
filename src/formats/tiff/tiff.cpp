// TIFF and BigTIFF, either byte order, decoded by libtiff; tiff_write.cpp is the writer.
//
//   "II" or "MM", 42, offset of the first directory (BigTIFF: 43, 8, 0, 8-byte offset); a directory
//   is a count, entries of tag, type, count and value or offset, and the offset of the next one:
//   each is a page. 254 subfile   256 width   257 height   258 bits   259 compression   262 colors
//   273, 279 strips 277 samples   282, 283, 296 resolution   284 planes   320 palette   322-325
//   tiles 338 extra samples   339 sample format   700 XMP   34665 EXIF   34675 ICC profile
//
// Reader: grays and palettes of 1, 2, 4 and 8 bits keep their depth (2 becomes 4), deeper grays
// become 8 bits, everything else 24 bits, with an alpha plane if an extra sample is marked as
// alpha; premultiplied colors are divided by alpha. CMYK is converted to RGB by the usual formula,
// CIE L*a*b* to sRGB by lcms2. YCbCr other than JPEG, and LogLuv, are converted by libtiff.
// Orientation is not applied here but stored in the EXIF block, which is assembled from the
// camera's directories. XMP, ICC profile, description and resolution are kept as well.
//
// A file that ends before its last pixel fails (status 3). If the decoder recovers from damaged
// data, the record's `warning` is set. Source: Adobe, "TIFF Revision 6.0", 1992; Technical Notes 1
// to 3; libtiff's documentation of BigTIFF.
#include "formats/tiff/tiff.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "containers/exif_directories.h"
#include "core/limits.h"
#include "formats/metadata_blocks.h"
#include "formats/png/png_filter.h"
#include "formats/tiff/tiff_file.h"
#include "formats/tiff/tiff_layout.h"
#include "formats/tiff/tiff_lzw.h"
#include "formats/tiff/tiff_rows.h"
#include "picture/gray_palette.h"
#include "picture/partial.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr double kCentimetersPerInch = 2.54;
constexpr uint32_t kMostRowSamples = 1 << 25;  // whole rows are kept in memory

// Checks that uncompressed pixels are within the file before allocating memory for them.
bool FileHoldsPixels(const TiffInput& input, const TiffLayout& layout) {
  if (layout.compression != COMPRESSION_NONE || layout.rows == TiffRows::Library) return true;
  const uint64_t rowBytes = (uint64_t{layout.width} * layout.form.bits * layout.samples + 7) / 8;
  return rowBytes <= input.Bytes().size() / layout.height;
}

// 16-bit colors; some programs store 8 bits.
void TakeColors(TIFF* tiff, size_t count, Palette& palette) {
  uint16_t* channels[3] = {};
  if (TIFFGetField(tiff, TIFFTAG_COLORMAP, &channels[0], &channels[1], &channels[2]) == 0) return;
  bool wide = false;
  for (const uint16_t* channel : channels)
    wide = wide || std::any_of(channel, channel + count, [](uint16_t v) { return v > 255; });
  for (size_t i = 0; i < std::min<size_t>(count, 256); ++i) {
    for (size_t c = 0; c < 3; ++c)
      palette[3 * i + c] = static_cast<uint8_t>(wide ? channels[c][i] >> 8 : channels[c][i]);
  }
}

void TakePalette(TIFF* tiff, const TiffLayout& layout, Palette& palette) {
  if (layout.photometric == PHOTOMETRIC_PALETTE && layout.rows != TiffRows::Library) {
    palette.fill(0);
    TakeColors(tiff, size_t{1} << layout.form.bits, palette);
    return;
  }
  if (layout.bitsPerPixel == 24) {
    MakeDefaultPalette(&palette, nullptr, kDisplayPalette);
    return;
  }
  palette = GrayLevels(layout.bitsPerPixel);
  if (layout.photometric == PHOTOMETRIC_MINISWHITE) {
    std::reverse(palette.begin(), palette.begin() + (3 << layout.bitsPerPixel));
  }
}

void TakeTag(TIFF* tiff, uint32_t tag, std::vector<uint8_t>& block) {
  uint32_t size = 0;
  void* data = nullptr;
  const bool found = TIFFGetField(tiff, tag, &size, &data) != 0 && data != nullptr;
  TakeBlock({static_cast<const uint8_t*>(data), found ? size : 0}, block);
}

void TakeMetadata(const TiffInput& input, PictureRecord& picture) {
  TIFF* tiff = input.Handle();
  PictureMetadata& metadata = picture.metadata;
  metadata = {};
  const DirectoryForm form = {TIFFIsBigEndian(tiff) != 0, TIFFIsBigTIFF(tiff) != 0};
  metadata.exif = MakePictureBlock(GatherExif(input.Bytes(), form, TIFFCurrentDirOffset(tiff)));
  TakeTag(tiff, TIFFTAG_XMLPACKET, metadata.xmp);
  TakeTag(tiff, TIFFTAG_ICCPROFILE, metadata.icc);
  picture.comment.clear();
  const char* text = nullptr;
  if (TIFFGetField(tiff, TIFFTAG_IMAGEDESCRIPTION, &text) != 0 && text != nullptr) {
    picture.comment.assign(text,
                           text + std::min<uint64_t>(std::strlen(text), limits.metadataBytes));
  }
  float x = 0, y = 0;
  const uint16_t unit = TiffField<uint16_t>(tiff, TIFFTAG_RESOLUTIONUNIT);
  TIFFGetField(tiff, TIFFTAG_XRESOLUTION, &x);
  TIFFGetField(tiff, TIFFTAG_YRESOLUTION, &y);
  const double perInch = unit == RESUNIT_CENTIMETER ? kCentimetersPerInch : 1;
  if (unit != RESUNIT_NONE) TakeResolution(x * perInch, y * perInch, metadata);
}

bool HoldsIptc(TIFF* tiff) {
  uint32_t size = 0;
  void* data = nullptr;
  return TIFFGetField(tiff, TIFFTAG_RICHTIFFIPTC, &size, &data) != 0 ||
         TIFFGetField(tiff, TIFFTAG_PHOTOSHOP, &size, &data) != 0;
}

// Whether there are important tags that would be lost in a new file: captions, GPS positions, and,
// without a camera's directory, those about the author.
bool HoldsFurtherTags(TIFF* tiff) {
  // the last one: GeoTIFF
  constexpr uint32_t kFurther[] = {
      TIFFTAG_RICHTIFFIPTC, TIFFTAG_PHOTOSHOP, 33550, 33922, 34264, 34735};
  uint64_t place = 0;
  const bool camera = TIFFGetField(tiff, TIFFTAG_EXIFIFD, &place) != 0 ||
                      TIFFGetField(tiff, TIFFTAG_GPSIFD, &place) != 0;
  const int count = TIFFGetTagListCount(tiff);
  for (int i = 0; i < count; ++i) {
    const uint32_t tag = TIFFGetTagListEntry(tiff, i);
    if (!camera && (tag == TIFFTAG_ARTIST || tag == TIFFTAG_COPYRIGHT)) return true;
    if (std::ranges::find(kFurther, tag) != std::end(kFurther)) return true;
  }
  return false;
}

// Opens a page and fills in the record.
Status Describe(TiffInput& input, int32_t page, TiffLayout& layout, PictureRecord& picture) {
  RETURN_IF_BAD(input.Open());
  const std::vector<uint64_t> offsets = input.PageOffsets();
  const size_t pages = std::max<size_t>(offsets.size(), 1);
  if (page < 0 || static_cast<size_t>(page) >= pages) return Status::NoImages;
  if (page > 0) RETURN_IF_BAD(input.OpenAt(offsets[static_cast<size_t>(page)]));
  TIFF* tiff = input.Handle();
  RETURN_IF_BAD(ReadTiffLayout(tiff, layout));
  picture.pageCount = static_cast<int32_t>(pages);
  picture.typeName.AssignCut(TIFFIsBigTIFF(tiff) != 0 ? "BigTIFF" : "TIFF");
  picture.width = static_cast<int32_t>(layout.width);
  picture.height = static_cast<int32_t>(layout.height);
  picture.bitsPerPixel = layout.bitsPerPixel;
  picture.simplified = layout.form.bits > 8 || layout.colors > 3 ||
                       layout.photometric >= PHOTOMETRIC_CIELAB || HoldsFurtherTags(tiff);
  const bool inks = layout.colors > 3 || layout.photometric >= PHOTOMETRIC_CIELAB;
  picture.unread =
      static_cast<uint8_t>((layout.form.bits > 8 ? kUnreadDepth : 0) | (inks ? kUnreadInks : 0) |
                           (HoldsIptc(tiff) ? kUnreadIptc : 0));
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (layout.alpha >= 0 ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  TakePalette(tiff, layout, picture.palette);
  TakeMetadata(input, picture);
  return Status::Ok;
}

// Whether strips can be decoded without the library: samples of at most one byte, in the
// usual bit order.
bool HasPlainStrips(TIFF* tiff, const TiffLayout& layout) {
  return !layout.tiled && !layout.separate && layout.form.bits <= 8 &&
         TiffField<uint16_t>(tiff, TIFFTAG_FILLORDER) == FILLORDER_MSB2LSB &&
         (layout.photometric != PHOTOMETRIC_YCBCR);
}

// Reads uncompressed rows directly from the file, and LZW with our own decoder, which is three
// times as fast as the library's. False, with the target in an undefined state, for all other pages
// and for any irregularity: then the library reports the error.
bool ReadPlainStrips(TiffInput& input, const TiffLayout& layout, const PictureRecord& picture,
                     TiffConverter& converter) {
  TIFF* tiff = input.Handle();
  const bool packed = layout.compression == COMPRESSION_LZW;
  if (!HasPlainStrips(tiff, layout) || (!packed && layout.compression != COMPRESSION_NONE))
    return false;
  const uint16_t predictor =
      packed ? TiffField<uint16_t>(tiff, TIFFTAG_PREDICTOR) : uint16_t{PREDICTOR_NONE};
  const bool differences = predictor == PREDICTOR_HORIZONTAL;
  if (predictor != PREDICTOR_NONE && (!differences || layout.form.bits != 8)) return false;
  const uint64_t rowBytes = (uint64_t{layout.width} * layout.form.bits * layout.samples + 7) / 8;
  const std::vector<uint8_t> none(differences ? rowBytes : 0);
  TiffLzwDecoder decoder;
  for (uint32_t top = 0, strip = 0; top < layout.height;
       top += std::min(layout.bandHeight, layout.height - top), ++strip) {
    const uint32_t rows = std::min(layout.bandHeight, layout.height - top);
    const uint64_t offset = TIFFGetStrileOffset(tiff, strip),
                   stored = TIFFGetStrileByteCount(tiff, strip);
    if (offset > input.Bytes().size() || stored > input.Bytes().size() - offset) return false;
    if ((packed && rowBytes * rows > limits.packedBlockBytes / 4) ||
        (!packed && rowBytes * rows > stored))
      return false;
    const auto data = input.Bytes().subspan(offset, stored);
    uint8_t* decoded = packed ? decoder.Decode(data, rowBytes * rows) : nullptr;
    if (packed && decoded == nullptr) return false;
    for (uint32_t r = 0; r < rows; ++r) {
      const uint64_t place = r * rowBytes;
      // Horizontal differencing is the same as PNG's Sub filter.
      if (differences && !UndoPngFilter(static_cast<uint8_t>(PngFilter::Sub), decoded + place,
                                        none.data(), rowBytes, layout.samples)) {
        return false;
      }
      const auto y = static_cast<int32_t>(top + r);
      converter.Store(y, packed ? decoded + place : data.data() + place, 0);
      if (picture.ReportRow(y) != Status::Ok) return false;  // the library then stops at once
    }
  }
  return true;
}

// `done`: rows read.
Status ReadScanlines(TiffInput& input, const TiffLayout& layout, const PictureRecord& picture,
                     TiffConverter& converter, uint32_t& done) {
  TIFF* tiff = input.Handle();
  const uint64_t rowBytes = (uint64_t{layout.width} * layout.form.bits * layout.samples + 7) / 8;
  const uint64_t given = TIFFScanlineSize64(tiff);
  if (given < rowBytes || given > 2 * rowBytes + 64) return Status::DamagedFile;
  std::vector<uint8_t> row(given);
  for (uint32_t y = 0; y < layout.height; ++y) {
    if (TIFFReadScanline(tiff, row.data(), y, 0) < 0) return input.Failure();
    converter.Store(static_cast<int32_t>(y), row.data(), 0);
    done = y + 1;
    RETURN_IF_BAD(picture.ReportRow(static_cast<int32_t>(y)));
  }
  return Status::Ok;
}

// A band of rows of full width, in one or more planes, assembled from tiles or strips.
class TiffBand {
 public:
  TiffBand(TiffInput& input, const TiffLayout& layout) : input_(input), layout_(layout) {
    bitsPerPixel_ = uint64_t{layout.form.bits} * (layout.separate ? 1 : layout.samples);
    planes_ = layout.separate ? layout.samples : 1u;
    rowBytes_ = (layout.width * bitsPerPixel_ + 7) / 8;
    rows_ = std::min(layout.bandHeight, layout.height);
  }
  // `held`: size of the picture itself.
  Status Allocate(uint64_t held) {
    const uint64_t planeBytes = rowBytes_ * rows_;
    if (planeBytes > limits.packedBlockBytes / planes_) return Status::MemoryAllocationError;
    TIFF* tiff = input_.Handle();
    pieceRow_ = layout_.tiled ? TIFFTileRowSize64(tiff) : TIFFScanlineSize64(tiff);
    pieceBytes_ = layout_.tiled ? TIFFTileSize64(tiff) : pieceRow_ * rows_;
    if (pieceRow_ == 0 || pieceBytes_ == 0) return Status::DamagedFile;
    if (pieceBytes_ > limits.packedBlockBytes) return Status::MemoryAllocationError;
    RETURN_IF_BAD(CheckFileMemory(held + planeBytes * planes_ + pieceBytes_));
    if (layout_.tiled && layout_.tileWidth < layout_.width &&
        layout_.tileWidth * bitsPerPixel_ % 8 != 0) {
      return Status::UnsupportedFormat;
    }
    const bool taken = bytes_.Allocate(planeBytes * planes_) && piece_.Allocate(pieceBytes_);
    return taken ? Status::Ok : Status::MemoryAllocationError;
  }
  Status Fill(uint32_t y) {
    for (uint32_t plane = 0; plane < planes_; ++plane) {
      for (uint32_t x = 0; x < layout_.width; x += std::min(layout_.tileWidth, layout_.width - x)) {
        RETURN_IF_BAD(FillPiece(x, y, plane));
      }
    }
    return Status::Ok;
  }
  uint32_t Rows() const { return rows_; }
  const uint8_t* Row(uint32_t r) const { return bytes_.Data() + rowBytes_ * r; }
  size_t PlaneStride() const { return planes_ > 1 ? rowBytes_ * rows_ : 0; }

 private:
  Status FillPiece(uint32_t x, uint32_t y, uint32_t plane) {
    TIFF* tiff = input_.Handle();
    const auto sample = static_cast<uint16_t>(plane);
    const auto most = static_cast<tmsize_t>(pieceBytes_);
    const tmsize_t read =
        layout_.tiled
            ? TIFFReadEncodedTile(tiff, TIFFComputeTile(tiff, x, y, 0, sample), piece_.Data(), most)
            : TIFFReadEncodedStrip(tiff, TIFFComputeStrip(tiff, y, sample), piece_.Data(), most);
    if (read < 0) return input_.Failure();
    const uint64_t left = x * bitsPerPixel_ / 8;
    const uint64_t count = std::min(pieceRow_, rowBytes_ - left);
    const uint32_t rows = std::min(rows_, layout_.height - y);
    for (uint32_t r = 0; r < rows && (r + 1) * pieceRow_ <= pieceBytes_; ++r) {
      std::memcpy(bytes_.Data() + plane * rowBytes_ * rows_ + r * rowBytes_ + left,
                  piece_.Data() + r * pieceRow_, count);
    }
    return Status::Ok;
  }

  TiffInput& input_;
  const TiffLayout& layout_;
  uint64_t bitsPerPixel_ = 0, rowBytes_ = 0, pieceRow_ = 0, pieceBytes_ = 0;
  uint32_t planes_ = 1, rows_ = 0;
  platform::MemoryBlock bytes_, piece_;
};

// `done`: rows read.
Status ReadBands(TiffInput& input, const TiffLayout& layout, const PictureRecord& picture,
                 uint64_t held, TiffConverter& converter, uint32_t& done) {
  TiffBand band(input, layout);
  RETURN_IF_BAD(band.Allocate(held));
  for (uint32_t top = 0; top < layout.height; top += std::min(band.Rows(), layout.height - top)) {
    RETURN_IF_BAD(band.Fill(top));
    for (uint32_t r = 0; r < band.Rows() && top + r < layout.height; ++r) {
      converter.Store(static_cast<int32_t>(top + r), band.Row(r), band.PlaneStride());
      done = top + r + 1;
      RETURN_IF_BAD(picture.ReportRow(static_cast<int32_t>(top + r)));
    }
  }
  return Status::Ok;
}

// Pixel formats that only the library can convert come as one raster of red, green, blue
// and alpha, premultiplied.
Status ReadThroughLibrary(TiffInput& input, const TiffLayout& layout, PictureRecord& picture,
                          TiffTarget& target) {
  const uint64_t pixels = uint64_t{layout.width} * layout.height;
  char why[1024] = {};
  TIFFRGBAImage image;
  if (TIFFRGBAImageOK(input.Handle(), why) == 0) return Status::UnsupportedFormat;
  if (TIFFRGBAImageBegin(&image, input.Handle(), 1, why) == 0) return Status::UnsupportedFormat;
  image.orientation = image.req_orientation = ORIENTATION_TOPLEFT;
  platform::MemoryBlock raster;
  const bool taken = raster.Allocate(4 * pixels);
  const bool read = taken && TIFFRGBAImageGet(&image, raster.Items<uint32_t>().data(), layout.width,
                                              layout.height) != 0;
  TIFFRGBAImageEnd(&image);
  if (!taken) return Status::MemoryAllocationError;
  if (!read) return input.Failure();
  const uint32_t* source = raster.Items<uint32_t>().data();
  for (int32_t y = 0; y < picture.height; ++y) {
    uint8_t* row = target.image.Row(y).data();
    for (uint32_t x = 0; x < layout.width; ++x, ++source, row += 3) {
      row[0] = static_cast<uint8_t>(TIFFGetB(*source));
      row[1] = static_cast<uint8_t>(TIFFGetG(*source));
      row[2] = static_cast<uint8_t>(TIFFGetR(*source));
    }
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

Status ReadPixels(TiffInput& input, const TiffLayout& layout, bool partial,
                  PictureRecord& picture) {
  if (!partial && !FileHoldsPixels(input, layout)) return Status::FileReadError;
  if (layout.width > kMostRowSamples / layout.samples) return Status::MemoryAllocationError;
  TiffTarget target;
  const uint64_t pixels = uint64_t{layout.width} * layout.height;
  const uint64_t held = PackedRowBytes(picture.width, picture.height, layout.bitsPerPixel) +
                        (layout.alpha >= 0 ? pixels : 0);
  RETURN_IF_BAD(CheckFileMemory(held + (layout.rows == TiffRows::Library ? 4 * pixels : uint64_t{layout.samples} * layout.width)));
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, layout.bitsPerPixel, target.image));
  if (layout.alpha >= 0) RETURN_IF_BAD(NewAlphaPlane(picture.width, picture.height, target.alpha));
  input.Messages().inPixels = true;
  if (layout.rows == TiffRows::Library) {
    RETURN_IF_BAD(ReadThroughLibrary(input, layout, picture, target));
  } else {
    TiffConverter converter(layout, picture.palette, target);
    uint32_t rows = 0;
    Status status = Status::Ok;
    if (!ReadPlainStrips(input, layout, picture, converter)) {
      // the library's old-style JPEG decoder requires whole strips
      const bool whole = layout.compression == COMPRESSION_OJPEG;
      status = layout.tiled || layout.separate || whole
                   ? ReadBands(input, layout, picture, held, converter, rows)
                   : ReadScanlines(input, layout, picture, converter, rows);
    }
    RETURN_IF_BAD(TakePart(picture, partial, status, rows));
  }
  picture.image = std::move(target.image);
  picture.alpha = std::move(target.alpha);
  return Status::Ok;
}

const char* CompressionName(uint16_t compression) {
  const TIFFCodec* codec = TIFFFindCODEC(compression);
  return codec != nullptr ? codec->name : "unknown";
}

const char* PhotometricName(uint16_t photometric) {
  constexpr const char* kNames[] = {
      "gray, 0 is white", "gray", "RGB", "palette", "mask", "CMYK", "YCbCr", "", "CIE L*a*b*"};
  return photometric < std::size(kNames) ? kNames[photometric] : "other";
}

void AddDetails(TIFF* tiff, const TiffLayout& layout, const PictureRecord& picture,
                DetailLines& lines) {
  const uint32_t pieces = layout.tiled ? TIFFNumberOfTiles(tiff) : TIFFNumberOfStrips(tiff);
  lines.AddFormat("  Compression: %s", CompressionName(layout.compression));
  lines.AddFormat("  Color space: %s", PhotometricName(layout.photometric));
  lines.AddFormat("      Samples: %u of %u bits%s", unsigned{layout.samples}, layout.form.bits,
                  layout.form.kind == TiffSampleForm::Float ? ", real" : "");
  if (layout.samples > 1)
    lines.AddFormat("       Planes: %s", layout.separate ? "separate" : "together");
  lines.AddFormat("       %s: %u of %u x %u", layout.tiled ? " Tiles" : "Strips", pieces,
                  layout.tileWidth, layout.bandHeight);
  lines.AddFormat("   Byte order: %s", TIFFIsBigEndian(tiff) != 0 ? "big-endian" : "little-endian");
  const PictureMetadata& metadata = picture.metadata;
  if (metadata.dpiX > 0)
    lines.AddFormat("   Resolution: %.0f x %.0f dpi", metadata.dpiX, metadata.dpiY);
  if (layout.alpha >= 0)
    lines.AddFormat("        Alpha: %s", layout.multiplied ? "multiplied in" : "separate");
  const uint16_t orientation = TiffField<uint16_t>(tiff, TIFFTAG_ORIENTATION);
  if (orientation > 1) lines.AddFormat("  Orientation: %u", unsigned{orientation});
  if (!metadata.icc.empty()) lines.AddFormat("  ICC profile: %zu bytes", metadata.icc.size());
  if (!metadata.xmp.empty()) lines.AddFormat("          XMP: %zu bytes", metadata.xmp.size());
  if (!metadata.exif.empty()) lines.AddFormat("         EXIF: %zu bytes", metadata.exif.size());
  if (picture.pageCount > 1) lines.AddFormat("        Pages: %d", picture.pageCount);
}

}  // namespace

Status TiffInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  TiffInput input(file.Bytes());
  TiffLayout layout;
  return Describe(input, request.page, layout, picture);
}

Status TiffRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  picture.warning.Clear();
  picture.note.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  TiffInput input(file.Bytes());
  TiffLayout layout;
  RETURN_IF_BAD(Describe(input, request.page, layout, picture));
  input.Messages() = {};
  const Status status = ReadPixels(input, layout, request.partial, picture);
  if (status == Status::Ok && file.Intact()) {
    const TiffMessages& messages = input.Messages();
    picture.warning.AssignCut(messages.error);
    picture.note.AssignCut(messages.warning);
    return Status::Ok;
  }
  picture.image.Free();
  picture.alpha.Free();
  return status == Status::Ok ? Status::FileReadError : status;
}

Status TiffDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  TiffInput input(file.Bytes());
  TiffLayout layout;
  RETURN_IF_BAD(Describe(input, 0, layout, picture));
  AddDetails(input.Handle(), layout, picture, picture.detailLines);
  return Status::Ok;
}

}  // namespace fotomill
