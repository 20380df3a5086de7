// Silicon Graphics image (SGI, RGB), big-endian.
//
//   offset size  field
//        0    2  magic number 474
//        2    1  storage: 0 uncompressed, 1 run-length coded
//        3    1  bytes per sample: 1 or 2
//        4    2  dimensions: 1 a single row, 2 one channel, 3 several
//        6    6  width, height, channels
//       12    8  minimum and maximum sample, not used
//       20    4  unused
//       24   80  name
//      104    4  color map: 0 none; 1 three-bit colors and 2 a separate map, both obsolete; 3 the
//                file is a map
//      108  404  unused
//      512       uncompressed: the rows of the first channel, bottom row first, then those of the
//                next
//      512       run-length coded: the offset of each such row (4 bytes each), then the size of
//                each, then the coded rows
//
// Channels are gray, gray and alpha, RGB, or RGB and alpha; additional ones are ignored. 16-bit
// samples are rounded to 8. Rows may share data and be in any order.
//
// The writer uses run-length coding with 8-bit samples: pictures with the gray ramp in one channel,
// everything else in three, plus an alpha channel if the picture has alpha. Source: P. Haeberli,
// "The SGI Image File Format, Version 1.00" (Silicon Graphics).
#include "formats/sgi/sgi.h"

#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "formats/sgi/sgi_runs.h"
#include "platform/file_view.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeaderSize = 512;
constexpr uint16_t kMagic = 474;
constexpr uint8_t kPlain = 0, kRunLengths = 1;
constexpr uint32_t kNoColorMap = 0, kIsColorMap = 3;

struct SgiHeader {
  uint8_t storage = kPlain;
  uint8_t sampleSize = 1;  // bytes
  int32_t width = 0, height = 0;
  uint64_t channels = 1;
  uint32_t colorMap = kNoColorMap;

  bool Gray() const { return channels < 3; }
  bool Alpha() const { return channels == 2 || channels > 3; }
  uint64_t Rows() const { return channels * static_cast<uint64_t>(height); }
  uint64_t PlainRowSize() const { return static_cast<uint64_t>(width) * sampleSize; }
};

// Ok; FileReadError for a truncated header, DamagedFile for invalid values,
// UnsupportedFormat, NoImages.
Status ParseHeader(std::span<const uint8_t> file, SgiHeader& header) {
  ByteReader bytes(file);
  const uint16_t magic = bytes.Be16();
  header.storage = bytes.U8();
  header.sampleSize = bytes.U8();
  const uint16_t dimensions = bytes.Be16();
  header.width = bytes.Be16();
  header.height = bytes.Be16();
  header.channels = bytes.Be16();
  bytes.Seek(104);
  header.colorMap = bytes.Be32();
  if (magic != kMagic && file.size() >= 2) return Status::DamagedFile;
  if (!bytes.Ok()) return Status::FileReadError;
  if (dimensions < 3) header.channels = 1;
  if (dimensions == 1) header.height = 1;
  const bool known =
      header.storage <= kRunLengths && (header.sampleSize == 1 || header.sampleSize == 2);
  if (!known || dimensions < 1 || dimensions > 3) return Status::DamagedFile;
  if (header.colorMap == kIsColorMap) return Status::NoImages;
  if (header.colorMap != kNoColorMap) return Status::UnsupportedFormat;
  return header.width < 1 || header.height < 1 || header.channels < 1 ? Status::DamagedFile
                                                                      : Status::Ok;
}

void DescribePicture(const SgiHeader& header, PictureRecord& picture) {
  picture.typeName.AssignCut(header.storage == kPlain ? "SGI, plain" : "SGI, run lengths");
  picture.width = header.width;
  picture.height = header.height;
  picture.bitsPerPixel = header.channels == 1 ? 8 : 24;
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (header.Alpha() ? kHasAlpha : 0));
  picture.simplified = header.sampleSize > 1 || header.channels > 4;
  picture.unread = static_cast<uint8_t>((header.sampleSize > 1 ? kUnreadDepth : 0) |
                                        (header.channels > 4 ? kUnreadInks : 0));
  if (header.channels == 1) {
    picture.palette = GrayRamp();
  } else {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  }
}

// File offset and size of each row of each channel.
class RowTable {
 public:
  // FileReadError if the file is too short.
  Status Open(std::span<const uint8_t> file, const SgiHeader& header) {
    file_ = file;
    header_ = &header;
    const uint64_t least =
        header.storage == kPlain ? header.Rows() * header.PlainRowSize() : header.Rows() * 8;
    return file.size() - kHeaderSize < least ? Status::FileReadError : Status::Ok;
  }

  // Decodes row `y`, from the bottom, of a channel. FileReadError if its data are truncated.
  Status Decode(uint64_t channel, int32_t y, std::span<uint8_t> row) const {
    const uint64_t index =
        channel * static_cast<uint64_t>(header_->height) + static_cast<uint64_t>(y);
    ByteReader bytes(file_);
    if (header_->storage == kPlain) {
      bytes.Seek(kHeaderSize + index * header_->PlainRowSize());
      CopyPlain(bytes.Take(header_->PlainRowSize()), row);
      return Status::Ok;
    }
    bytes.Seek(kHeaderSize + 4 * index);
    const uint32_t offset = bytes.Be32();
    bytes.Seek(kHeaderSize + 4 * (header_->Rows() + index));
    const uint32_t length = bytes.Be32();
    bytes.Seek(offset);
    const auto code = bytes.Take(std::min<uint64_t>(length, bytes.Left()));
    const auto decode = header_->sampleSize == 1 ? DecodeSgiRow : DecodeWideSgiRow;
    return bytes.Ok() && decode(code, row) ? Status::Ok : Status::FileReadError;
  }

 private:
  void CopyPlain(std::span<const uint8_t> samples, std::span<uint8_t> row) const {
    if (header_->sampleSize == 1) {
      std::copy(samples.begin(), samples.end(), row.begin());
    } else {
      for (size_t x = 0; x < row.size(); ++x) row[x] = RoundSgiSample(&samples[2 * x]);
    }
  }

  std::span<const uint8_t> file_;
  const SgiHeader* header_ = nullptr;
};

Status ReadRows(const RowTable& table, const SgiHeader& header, const PictureRecord& picture,
                PackedImage& image, PackedImage& alpha) {
  const auto width = static_cast<size_t>(header.width);
  std::vector<uint8_t> planes(header.channels == 1 ? 0 : 3 * width);
  const std::span<uint8_t> red(planes.data(), planes.empty() ? 0 : width);
  for (int32_t y = 0; y < header.height; ++y) {
    const auto row = image.StoredRow(y);
    if (header.channels == 1) {
      RETURN_IF_BAD(table.Decode(0, y, row.first(width)));
    } else {
      const std::span<uint8_t> green(red.data() + width, width),
          blue(red.data() + 2 * width, width);
      RETURN_IF_BAD(table.Decode(0, y, red));
      if (!header.Gray()) RETURN_IF_BAD(table.Decode(1, y, green));
      if (!header.Gray()) RETURN_IF_BAD(table.Decode(2, y, blue));
      const uint8_t* second = header.Gray() ? red.data() : green.data();
      MergeColors(header.Gray() ? red.data() : blue.data(), second, red.data(), width, row.data());
    }
    if (header.Alpha())
      RETURN_IF_BAD(table.Decode(header.Gray() ? 1 : 3, y, alpha.StoredRow(y).first(width)));
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

// Number of channels to store for a picture.
uint16_t ChannelsFor(const PictureRecord& picture) {
  const bool gray = picture.image.Bits() == 8 && picture.palette == GrayRamp();
  return static_cast<uint16_t>((gray ? 1 : 3) + (picture.alpha.Empty() ? 0 : 1));
}

void WriteHeader(ByteWriter& out, const PackedImage& image, uint16_t channels) {
  out.Be16(kMagic);
  out.U8(kRunLengths);
  out.U8(1);
  out.Be16(channels == 1 ? 2 : 3);
  out.Be16(static_cast<uint16_t>(image.Width()));
  out.Be16(static_cast<uint16_t>(image.Height()));
  out.Be16(channels);
  out.Be32(0);
  out.Be32(255);
  out.Zeros(kHeaderSize - 20);
}

// One channel of row `y`, from the bottom: a view into the picture, or copied to `room`.
class ChannelRows {
 public:
  ChannelRows(const PictureRecord& picture, uint16_t channels)
      : picture_(picture),
        colors_(channels >= 3 ? 3 : 1),
        room_(3 * static_cast<size_t>(picture.image.Width())) {}

  std::span<const uint8_t> Row(uint16_t channel, int32_t y) {
    const PackedImage& image = picture_.image;
    const auto width = static_cast<size_t>(image.Width());
    if (channel == colors_) return picture_.alpha.StoredRow(y).first(width);
    if (colors_ == 1) return image.StoredRow(y).first(width);
    if (image.Bits() == 24) {
      SplitColors(image.StoredRow(y).data(), width, &room_[2 * width], &room_[width], room_.data());
    } else {
      const int32_t fromTop = image.Height() - 1 - y;
      for (size_t x = 0; x < width; ++x) {
        const auto index = static_cast<size_t>(image.PixelAt(static_cast<int32_t>(x), fromTop));
        room_[channel * width + x] = picture_.palette[3 * index + channel];
      }
    }
    return std::span(room_).subspan(channel * width, width);
  }

 private:
  const PictureRecord& picture_;
  const uint16_t colors_;  // channels before alpha
  std::vector<uint8_t> room_;
};

void PutBe32(std::vector<uint8_t>& table, size_t index, uint64_t value) {
  for (size_t i = 0; i < 4; ++i) table[4 * index + i] = static_cast<uint8_t>(value >> (24 - 8 * i));
}

// UnsuitableImage if an offset does not fit its field.
Status WriteRows(ByteWriter& out, const PictureRecord& picture, uint16_t channels) {
  const int32_t height = picture.image.Height();
  const auto width = static_cast<size_t>(picture.image.Width());
  const size_t rows = static_cast<size_t>(height) * channels;
  std::vector<uint8_t> table(8 * rows), code(MostSgiCode(width));
  out.Zeros(table.size());
  ChannelRows source(picture, channels);
  for (size_t index = 0; index < rows && !out.Failed(); ++index) {
    if (out.Position() > UINT32_MAX) return Status::UnsuitableImage;
    const auto y = static_cast<int32_t>(index % static_cast<size_t>(height));
    const size_t length = EncodeSgiRow(
        source.Row(static_cast<uint16_t>(index / static_cast<size_t>(height)), y), code.data());
    PutBe32(table, index, out.Position());
    PutBe32(table, rows + index, length);
    out.Bytes(std::span(code).first(length));
    RETURN_IF_BAD(picture.ReportRow(static_cast<int32_t>(index / channels), height));
  }
  out.Patch(kHeaderSize, table);
  return Status::Ok;
}

}  // namespace

Status SgiInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), kHeaderSize)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  SgiHeader header;
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  DescribePicture(header, picture);
  return Status::Ok;
}

Status SgiRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  SgiHeader header;
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  DescribePicture(header, picture);
  if (file.FileSize() < kHeaderSize) return Status::FileReadError;
  RowTable table;
  RETURN_IF_BAD(table.Open(file.Bytes(), header));
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &picture.palette, picture.bitsPerPixel, image));
  if (header.Alpha()) RETURN_IF_BAD(NewAlphaPlane(header.width, header.height, alpha));
  RETURN_IF_BAD(ReadRows(table, header, picture, image, alpha));
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(image);
  picture.alpha = std::move(alpha);
  return Status::Ok;
}

Status SgiWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const uint16_t channels = ChannelsFor(picture);
  WriteHeader(out, image, channels);
  RETURN_IF_BAD(WriteRows(out, picture, channels));
  return CommitOutput(out, options);
}

}  // namespace fotomill
