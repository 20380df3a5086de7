// CALS raster (CAL, CALS): bilevel scanned drawings.
//
//   2048 bytes of text: blank-padded records of 128 bytes, each a name, a colon and a value
//     srcdocid, dstdocid, txtfilid, figid, srcgph, doccls   identification, written as "NONE"
//     rtype      1: one picture; 2: tiles
//     rorient    degrees: direction of the pixels in a row, counterclockwise from the right, and
//                direction of the rows relative to it
//     rpelcnt    pixels per row, and rows
//     rdensty    pixels per inch
//     notes      written as "NONE"
//   then the rows in fax group 4 coding; a set bit is black
//
// The reader accepts records in any order and rotates the picture upright. The writer stores the
// darker of two colors as black. Source: MIL-STD-1840 and MIL-PRF-28002C, "Raster Graphics
// Representation in Binary Format" (1997); ITU-T T.6 (1988).
#include "formats/cals/cals.h"

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <string>
#include <string_view>

#include "core/byte_writer.h"
#include "core/text.h"
#include "formats/cals/t6_coding.h"
#include "formats/plain_codec.h"
#include "processing/geometry/orient.h"
#include "processing/palette/two_colors.h"

namespace fotomill {

namespace {

constexpr size_t kHeaderSize = 2048, kRecordSize = 128;

// Directions of pixels and rows, and the orientation that makes the picture upright.
struct Direction {
  int32_t pixels, rows;
  Orientation orientation;
};
constexpr Direction kDirections[] = {
    {0, 270, Orientation::Upright},       {0, 90, Orientation::MirrorDown},  {90, 270, Orientation::QuarterLeft},
    {90, 90, Orientation::Transverse},    {180, 270, Orientation::HalfTurn}, {180, 90, Orientation::MirrorAcross},
    {270, 270, Orientation::QuarterRight}, {270, 90, Orientation::Transpose},
};

struct CalsHeader {
  int32_t type = 0;
  int32_t width = 0, height = 0;  // as stored
  int32_t density = 0;            // pixels per inch
  Orientation orientation = Orientation::Upright;

  size_t RowSize() const { return (static_cast<size_t>(width) + 7) / 8; }
};

// Parses up to two numbers separated by a comma; missing ones are unchanged.
void ReadNumbers(std::string_view text, int32_t& first, int32_t& second) {
  for (int32_t* number : {&first, &second}) {
    while (!text.empty() && (text.front() == ' ' || text.front() == ',')) text.remove_prefix(1);
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), *number);
    if (error != std::errc()) return;
    text.remove_prefix(static_cast<size_t>(end - text.data()));
  }
}

// Ok; FileReadError for a truncated header, DamagedFile if a required record is missing,
// UnsupportedFormat for tiles.
Status ParseHeader(std::span<const uint8_t> file, CalsHeader& header) {
  const std::string_view text(reinterpret_cast<const char*>(file.data()),
                              std::min(file.size(), kHeaderSize));
  int32_t pixels = 0, rows = 270, unused = 0;
  for (size_t at = 0; at + kRecordSize <= text.size(); at += kRecordSize) {
    const std::string_view record = text.substr(at, kRecordSize);
    const size_t colon = record.find(':');
    if (colon == std::string_view::npos) continue;
    const std::string_view name = record.substr(0, colon), value = record.substr(colon + 1);
    if (EqualIgnoringCase(name, "rtype")) ReadNumbers(value, header.type, unused);
    if (EqualIgnoringCase(name, "rorient")) ReadNumbers(value, pixels, rows);
    if (EqualIgnoringCase(name, "rpelcnt")) ReadNumbers(value, header.width, header.height);
    if (EqualIgnoringCase(name, "rdensty")) ReadNumbers(value, header.density, unused);
  }
  if (header.type == 2) return Status::UnsupportedFormat;
  if (header.type != 1 || header.width < 1 || header.height < 1) {
    return text.size() < kRecordSize ? Status::FileReadError : Status::DamagedFile;
  }
  if (text.size() < kHeaderSize) return Status::FileReadError;
  for (const Direction& direction : kDirections) {
    if (direction.pixels == pixels && direction.rows == rows)
      header.orientation = direction.orientation;
  }
  return Status::Ok;
}

Status DescribePicture(const platform::FileView& file, const ReadRequest&, CalsHeader& header,
                       PictureRecord& picture) {
  RETURN_IF_BAD(ParseHeader(file.Bytes(), header));
  const bool swaps = SwapsSides(header.orientation);
  SetPlainFacts(picture, swaps ? header.height : header.width, swaps ? header.width : header.height,
                1);
  picture.palette = BlackAndWhite(false);
  picture.metadata = {};
  picture.metadata.dpiX = picture.metadata.dpiY = std::max(header.density, 0);
  return Status::Ok;
}

Status Decode(platform::FileView& file, const CalsHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  const auto data = file.Bytes().subspan(kHeaderSize);
  // every row takes at least one bit
  if (static_cast<uint64_t>(header.height) > 8 * data.size()) return Status::FileReadError;
  PackedImage stored;
  RETURN_IF_BAD(NewPackedImage(header.width, header.height, &picture.palette, 1, stored));
  T6Decoder decoder(data, header.width);
  for (int32_t y = 0; y < header.height; ++y) {
    RETURN_IF_BAD(decoder.DecodeRow(stored.Row(y).first(header.RowSize())));
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  if (header.orientation != Orientation::Upright)
    return OrientImage(stored, header.orientation, image);
  image = std::move(stored);
  return Status::Ok;
}

void WriteRecord(ByteWriter& out, std::string record) {
  record.resize(kRecordSize, ' ');
  out.Text(record);
}

void WriteHeader(ByteWriter& out, const PictureRecord& picture, int32_t density) {
  const auto numbers = [](const char* format, int32_t first, int32_t second) {
    char text[40];
    std::snprintf(text, sizeof text, format, first, second);
    return std::string(text);
  };
  for (const char* name : {"srcdocid", "dstdocid", "txtfilid", "figid", "srcgph", "doccls"}) {
    WriteRecord(out, std::string(name) + ": NONE");
  }
  WriteRecord(out, "rtype: 1");
  WriteRecord(out, "rorient: 000,270");
  WriteRecord(out, numbers("rpelcnt: %06d,%06d", picture.image.Width(), picture.image.Height()));
  WriteRecord(out, numbers("rdensty: %04d", std::clamp(density, 1, 9999), 0));
  WriteRecord(out, "notes: NONE");
  while (out.Position() < kHeaderSize) WriteRecord(out, "");
}

constexpr PlainCodec<CalsHeader> kCodec = {kHeaderSize, DescribePicture, Decode};

}  // namespace

Status CalsInfo(PictureRecord& picture, const ReadRequest& request) {
  return PlainInfo(kCodec, picture, request);
}

Status CalsRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status CalsWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() > 1) return Status::TooManyColors;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const double dpi = picture.metadata.dpiX;
  WriteHeader(
      out, picture,
      dpi >= 1 ? static_cast<int32_t>(std::min(dpi + 0.5, 9999.0)) : options.encode.resolution);
  T6Encoder encoder(image.Width());
  BlackAndWhiteRows rows(image, picture.palette, 1);
  for (int32_t y = 0; y < image.Height(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    encoder.EncodeRow(rows.Row(y));
  }
  out.Bytes(encoder.Finish());
  return CommitOutput(out, options);
}

}  // namespace fotomill
