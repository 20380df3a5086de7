// The HD Photo writer: one page, preceded by its directory. 8-bit grays stay gray, everything else
// becomes 24-bit RGB, coded 4:4:4 with the quantizer HDPCompression (0 is lossless).
// HDPWriteOptions bit 0 selects frequency order: low frequencies of the whole picture first. The
// resolution is the picture's, else TiffResolution.
// all of it first. Resolution is the picture's, else TiffResolution.
#include <algorithm>
#include <bit>
#include <vector>

#include "containers/exif_directories.h"
#include "formats/hdphoto/hdp.h"
#include "formats/hdphoto/hdp_codec.h"
#include "formats/hdphoto/hdp_file.h"
#include "picture/gray_palette.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint32_t kPixelFormatPlace = 8, kExifPlace = kPixelFormatPlace + 16;
constexpr uint32_t kInFrequencyOrder = 1;  // bit of HDPWriteOptions

// Pixel format GUIDs for 8-bit gray and 24-bit blue, green, red, which differ in the last byte.
constexpr uint8_t kPixelFormat[15] = {0x24, 0xC3, 0xDD, 0x6F, 0x03, 0x4E, 0xFE, 0x4B,
                                      0xB1, 0x85, 0x3D, 0x77, 0x76, 0x8D, 0xC9};
constexpr uint8_t kGray8 = 0x08, kBgr24 = 0x0C;

// The file's directory, followed by data blocks at even offsets.
class Directory {
 public:
  void Value(uint16_t tag, uint16_t type, uint32_t value) { Pointer(tag, type, 1, value); }
  // An entry whose `count` values are elsewhere in the file.
  void Pointer(uint16_t tag, uint16_t type, uint32_t count, uint32_t offset) {
    entries_.push_back({tag, type, count, offset, {}});
  }
  void Block(uint16_t tag, uint16_t type, std::span<const uint8_t> block) {
    if (!block.empty())
      entries_.push_back({tag, type, static_cast<uint32_t>(block.size()), 0, block});
  }
  void Write(ByteWriter& out) {
    std::sort(entries_.begin(), entries_.end(),
              [](const Entry& a, const Entry& b) { return a.tag < b.tag; });
    out.Le16(static_cast<uint16_t>(entries_.size()));
    uint64_t at = out.Position() + 12 * entries_.size() + 4;
    for (Entry& entry : entries_) {
      out.Le16(entry.tag);
      out.Le16(entry.type);
      out.Le32(entry.count);
      entry.place = out.Position();
      const bool inside = entry.block.size() <= 4;
      uint32_t value = entry.block.empty() ? entry.value : static_cast<uint32_t>(at);
      if (!entry.block.empty() && inside) {
        value = 0;
        for (size_t i = 0; i < entry.block.size(); ++i)
          value |= static_cast<uint32_t>(entry.block[i]) << (8 * i);
      }
      out.Le32(value);
      at += Padded(entry.block.size());
    }
    out.Le32(0);
    for (const Entry& entry : entries_) {
      if (entry.block.size() <= 4) continue;
      out.Bytes(entry.block);
      out.Zeros(entry.block.size() % 2);
    }
  }
  // File offset of a written entry's value, to be patched later.
  uint64_t PlaceOf(uint16_t tag) const {
    return std::find_if(entries_.begin(), entries_.end(),
                        [tag](const Entry& entry) { return entry.tag == tag; })
        ->place;
  }

 private:
  struct Entry {
    uint16_t tag, type;
    uint32_t count, value;
    std::span<const uint8_t> block;
    uint64_t place = 0;
  };
  static uint64_t Padded(uint64_t size) { return size <= 4 ? 0 : size + size % 2; }

  std::vector<Entry> entries_;
};

// The picture as 8-bit gray, or as 24-bit color.
Status MakeSource(const PictureRecord& picture, bool gray, PackedImage& source) {
  const PackedImage& image = picture.image;
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(image));
  RETURN_IF_BAD(NewPackedImage(image.Width(), image.Height(), &picture.palette, gray ? 8 : 24, source));
  for (int32_t y = 0; y < image.Height(); ++y) {
    const uint8_t* row = rows.Row(y);
    uint8_t* target = source.Row(y).data();
    const auto width = static_cast<size_t>(image.Width());
    if (gray) {
      for (size_t x = 0; x < width; ++x) target[x] = row[3 * x];
    } else {
      std::copy_n(row, 3 * width, target);
    }
  }
  return Status::Ok;
}

// EXIF to be stored in the file's own directory besides the pointers: author, date, camera.
struct HdpMetadata {
  ExifDirectories exif;
  PlacedExif placed;
  std::vector<uint8_t> comment;  // NUL-terminated
};

Directory MakeDirectory(const PictureRecord& picture, const WriteOptions& options,
                        const HdpMetadata& extra) {
  const PictureMetadata& metadata = picture.metadata;
  const auto dpi = [&](double value) {
    return std::bit_cast<uint32_t>(
        static_cast<float>(value > 0 ? value : options.encode.resolution));
  };
  Directory directory;
  directory.Value(kHdpWidth, kHdpLong, static_cast<uint32_t>(picture.image.Width()));
  directory.Value(kHdpHeight, kHdpLong, static_cast<uint32_t>(picture.image.Height()));
  directory.Value(kHdpDpiX, kHdpFloat, dpi(metadata.dpiX));
  directory.Value(kHdpDpiY, kHdpFloat, dpi(metadata.dpiY));
  directory.Value(kHdpImageOffset, kHdpLong, 0);
  directory.Value(kHdpImageSize, kHdpLong, 0);
  directory.Block(kHdpIcc, kHdpUndefined, metadata.icc);
  if (!options.KeepsMetadata()) return directory;
  bool described = false;
  for (const ExifEntry& entry : extra.exif.first) {
    if (entry.type == kHdpText) directory.Block(entry.tag, kHdpText, entry.value);
    described = described || entry.tag == kHdpDescription;
  }
  if (!described) directory.Block(kHdpDescription, kHdpText, extra.comment);
  if (const uint16_t orientation = OrientationOf(extra.exif); orientation > 1) {
    directory.Value(kHdpOrientation, kHdpLong, HdpTurn(orientation));
  }
  if (extra.placed.exifOffset != 0) directory.Value(kHdpExif, kHdpLong, extra.placed.exifOffset);
  if (extra.placed.gpsOffset != 0) directory.Value(kHdpGps, kHdpLong, extra.placed.gpsOffset);
  directory.Block(kHdpXmp, kHdpByte, metadata.xmp);
  return directory;
}

Status WriteAll(ByteWriter& out, PictureRecord& picture, const WriteOptions& options) {
  const bool keep = options.KeepsMetadata();
  const bool gray = HasOnlyGrays(picture.palette, picture.image.Colors());
  PackedImage source;
  RETURN_IF_BAD(MakeSource(picture, gray, source));
  // The EXIF directories come first, as their offset is known then, followed by the file's own.
  HdpMetadata extra;
  if (keep) extra.exif = ParseExifBlock(picture.metadata.exif);
  if (keep && extra.exif.Empty() && !picture.metadata.exif.empty())
    picture.lostMetadata |= kLostExif;
  // some cameras omit the terminating NUL; other readers require it
  for (ExifEntry& entry : extra.exif.first) {
    if (entry.type == kHdpText && (entry.value.empty() || entry.value.back() != 0))
      entry.value.push_back(0);
  }
  if (!picture.comment.empty()) {
    extra.comment = picture.comment;
    extra.comment.push_back(0);
  }
  extra.placed = PlaceExif(extra.exif, kExifPlace);
  const auto directoryAt = static_cast<uint32_t>(kExifPlace + extra.placed.bytes.size());
  Directory directory = MakeDirectory(picture, options, extra);
  out.Text("II\xBC\x01");
  out.Le32(directoryAt);
  out.Bytes(kPixelFormat);
  out.U8(gray ? kGray8 : kBgr24);
  out.Bytes(extra.placed.bytes);
  directory.Pointer(kHdpPixelFormat, kHdpByte, 16, kPixelFormatPlace);
  directory.Write(out);
  const uint64_t start = out.Position();
  const HdpEncoding encoding = {std::clamp<int32_t>(options.encode.hdpCompression, 0, 255),
                                (options.encode.hdpBits & kInFrequencyOrder) != 0};
  RETURN_IF_BAD(EncodeHdp(source, encoding, out, [&](int32_t row) { (void)picture.ReportRow(row); }));
  if (out.Position() > UINT32_MAX) return Status::UnsuitableImage;
  out.PatchLe32(directory.PlaceOf(kHdpImageOffset), static_cast<uint32_t>(start));
  out.PatchLe32(directory.PlaceOf(kHdpImageSize), static_cast<uint32_t>(out.Position() - start));
  return Status::Ok;
}

}  // namespace

Status HdpWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  if (!HdpWorksHere()) return Status::FeatureDisabled;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  RETURN_IF_BAD(WriteAll(out, picture, options));
  return CommitOutput(out, options);
}

}  // namespace fotomill
