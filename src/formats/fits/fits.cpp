// Flexible Image Transport System (FITS): a header of text cards, then the values of one gray
// picture, big-endian.
//
//   offset size  content
//        0   80  a card: keyword of up to 8 characters, "=" in column 9, value; the first keyword
//                is SIMPLE
//       80   80  ...
//        .   80  the last card, END
//        .    .  at the next multiple of 2880: NAXIS2 rows, top first, of NAXIS1 values of |BITPIX|
//                bits
//        .    .  zero padding to a multiple of 2880
//
// A card is read as its keyword up to the first blank or "=", then its value after all blanks and
// "="; the last value of a repeated keyword is used. With more than two axes, the first plane is
// read. The first bytes of each row are shown unchanged, one byte per pixel, with a gray palette:
// wider values are shown as their single bytes, and BSCALE and BZERO are ignored.
//
// Writes eleven cards and one gray byte per pixel.
//
// Source: IAU FITS Working Group, "Definition of the Flexible Image Transport System (FITS)",
// version 4.0 (2018).
#include "formats/fits/fits.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <string>
#include <string_view>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/checked.h"
#include "core/creator.h"
#include "core/limits.h"
#include "core/text.h"
#include "formats/plain_codec.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr uint64_t kCardBytes = 80;
constexpr uint64_t kBlockBytes = 2880;
constexpr std::string_view kSignature = "SIMPLE";
constexpr size_t kKeywordBytes = 8;
constexpr size_t kValueBytes = 21;
constexpr size_t kMostDetailLines = 32;

struct FitsCard {
  std::string_view keyword;
  std::string_view value;  // including trailing blanks
};

struct FitsHeader {
  // absolute value of BITPIX; this and the next three are unchecked until CheckHeader
  int64_t bitsPerValue = 1;
  int64_t axes = 0;
  int64_t width = 0;
  int64_t height = 0;
  bool ended = false;       // END was found
  uint64_t dataOffset = 0;  // start of the data

  uint64_t RowBytes() const { return static_cast<uint64_t>(width * (bitsPerValue / 8)); }
};

FitsCard ParseCard(std::span<const uint8_t> bytes) {
  constexpr std::string_view kSeparators = " =";
  const std::string_view text(reinterpret_cast<const char*>(bytes.data()), bytes.size());
  const size_t keywordEnd = std::min(text.find_first_of(kSeparators), text.size());
  const size_t valueStart = std::min(text.find_first_not_of(kSeparators, keywordEnd), text.size());
  return {text.substr(0, keywordEnd), text.substr(valueStart)};
}

// The next card. False if the data end first, or the header is longer than any valid one.
bool NextCard(ByteReader& bytes, FitsCard& card) {
  if (bytes.Position() >= limits.fitsCards * kCardBytes) return false;
  const auto cardBytes = bytes.Take(kCardBytes);
  if (!bytes.Ok()) return false;
  card = ParseCard(cardBytes);
  return true;
}

FitsHeader ParseHeader(std::span<const uint8_t> fileBytes) {
  FitsHeader header;
  ByteReader bytes(fileBytes);
  FitsCard card;
  while (!header.ended && NextCard(bytes, card)) {
    if (card.keyword == "BITPIX") header.bitsPerValue = LeadingInteger(card.value);
    if (card.keyword == "NAXIS") header.axes = LeadingInteger(card.value);
    if (card.keyword == "NAXIS1") header.width = LeadingInteger(card.value);
    if (card.keyword == "NAXIS2") header.height = LeadingInteger(card.value);
    header.ended = card.keyword == "END";
  }
  if (header.bitsPerValue < 0) header.bitsPerValue = -std::max(header.bitsPerValue, -INT64_MAX);
  header.dataOffset = (bytes.Position() + kBlockBytes - 1) / kBlockBytes * kBlockBytes;
  return header;
}

// Ok; NoImages without a width or height; DamagedFile if a number is negative or absurd, or a value
// is not whole bytes.
Status CheckHeader(const FitsHeader& header) {
  if (header.width == 0 || header.height == 0) return Status::NoImages;
  for (const int64_t number : {header.axes, header.width, header.height, header.bitsPerValue}) {
    if (number < 0 || number > INT32_MAX) return Status::DamagedFile;
  }
  return header.bitsPerValue < 8 ? Status::DamagedFile : Status::Ok;
}

// As much of a row of the file as fits into the picture's row, including its padding.
void CopyRow(std::span<const uint8_t> fileRow, std::span<uint8_t> row) {
  const size_t count = std::min(fileRow.size(), row.size());
  std::memcpy(row.data(), fileRow.data(), count);
  std::memset(row.data() + count, 0, row.size() - count);
}

// Hundredths of a level, rounded down. Multiply and shift instead of divide, so that compilers can
// vectorize it.
constexpr uint32_t Share(uint8_t level, uint32_t hundredths) {
  return level * ((hundredths * 65536 + 99) / 100) >> 16;
}

// Each channel is rounded separately.
constexpr uint32_t kRed = 30, kGreen = 59, kBlue = 11;
constexpr uint8_t GrayOf(uint8_t red, uint8_t green, uint8_t blue) {
  return static_cast<uint8_t>(Share(red, kRed) + Share(green, kGreen) + Share(blue, kBlue));
}
static_assert([] {
  for (uint32_t level = 0; level < 256; ++level) {
    for (const uint32_t hundredths : {kRed, kGreen, kBlue}) {
      if (Share(static_cast<uint8_t>(level), hundredths) != level * hundredths / 100) return false;
    }
  }
  return true;
}());

using GrayTable = std::array<uint8_t, 256>;

// Gray levels of a picture's palette; entries beyond its depth are black.
GrayTable PaletteGrays(const PictureRecord& picture) {
  GrayTable grays{};
  const int32_t depth = std::clamp(picture.bitsPerPixel, 1, 8);
  for (size_t i = 0; i < size_t{1} << depth; ++i) {
    const uint8_t* color = picture.palette.data() + 3 * i;
    grays[i] = GrayOf(color[0], color[1], color[2]);
  }
  return grays;
}

// Convert `count` pixels, starting at the first pixel of a byte, to gray.
void GrayBits(const uint8_t* pixels, const GrayTable&, size_t count, uint8_t* out) {
  for (size_t x = 0; x < count; ++x) out[x] = (pixels[x / 8] << x % 8 & 0x80) != 0 ? 255 : 0;
}

void GrayNibbles(const uint8_t* pixels, const GrayTable& grays, size_t count, uint8_t* out) {
  for (size_t x = 0; x < count; ++x) out[x] = grays[pixels[x / 2] >> (x % 2 == 0 ? 4 : 0) & 15];
}

void GrayBytes(const uint8_t* pixels, const GrayTable& grays, size_t count, uint8_t* out) {
  for (size_t x = 0; x < count; ++x) out[x] = grays[pixels[x]];
}

void GrayColors(const uint8_t* pixels, const GrayTable&, size_t count, uint8_t* out) {
  // the formula works on planes, so that compilers can vectorize it
  constexpr size_t kPiece = 1024;
  uint8_t blue[kPiece], green[kPiece], red[kPiece];
  for (size_t begin = 0; begin < count; begin += kPiece) {
    const size_t size = std::min(count - begin, kPiece);
    SplitColors(pixels + 3 * begin, size, blue, green, red);
    for (size_t x = 0; x < size; ++x) out[begin + x] = GrayOf(red[x], green[x], blue[x]);
  }
}

using GrayPixels = void (*)(const uint8_t*, const GrayTable&, size_t, uint8_t*);
GrayPixels GrayPixelsFor(int32_t bits) {
  if (bits == 1) return GrayBits;
  if (bits == 4) return GrayNibbles;
  return bits == 8 ? GrayBytes : GrayColors;
}

void WriteCard(ByteWriter& out, std::string_view keyword, std::string_view value = {}) {
  std::array<char, kCardBytes> card;
  card.fill(' ');
  keyword.copy(card.data(), kKeywordBytes);
  if (!value.empty()) {
    value = value.substr(0, kValueBytes);
    card[kKeywordBytes] = '=';
    value.copy(card.data() + kKeywordBytes + 1 + kValueBytes - value.size(), value.size());
  }
  out.Text({card.data(), card.size()});
}

void WriteHeader(ByteWriter& out, const PackedImage& image) {
  WriteCard(out, "SIMPLE", "T");
  WriteCard(out, "BITPIX", "8");
  WriteCard(out, "NAXIS", "2");
  WriteCard(out, "NAXIS1", std::to_string(image.Width()));
  WriteCard(out, "NAXIS2", std::to_string(image.Height()));
  WriteCard(out, "ORIGIN", kCreator);
  WriteCard(out, "BSCALE", "1.0000000E+00");
  WriteCard(out, "BZERO", "0.0000000E+00");
  WriteCard(out, "DATAMIN", "0.0000000E+00");
  WriteCard(out, "DATAMAX", "255.0000000E+00");
  WriteCard(out, "END");
  while (out.Position() < kBlockBytes) WriteCard(out, "");
}

// Parses the header and fills in the record.
Status DescribePicture(const platform::FileView& file, const ReadRequest&, FitsHeader& header,
                       PictureRecord& picture) {
  header = ParseHeader(file.Bytes());
  RETURN_IF_BAD(CheckHeader(header));
  SetPlainFacts(picture, static_cast<int32_t>(header.width), static_cast<int32_t>(header.height),
                8);
  picture.simplified = header.bitsPerValue > 8 || header.axes > 2;
  picture.unread = header.bitsPerValue > 8 ? kUnreadDepth : uint8_t{0};
  picture.palette = GrayRamp();
  picture.typeName.AssignCut(std::to_string(header.axes) + " axis - " +
                             std::to_string(header.bitsPerValue) + " bits of grey");
  return Status::Ok;
}

// Ok, or FileReadError if the header has no end or the rows do not fit into the file.
Status CheckRowsFit(const platform::FileView& file, const FitsHeader& header) {
  uint64_t size = 0, end = 0;
  const bool counted =
      CheckedMultiply(header.RowBytes(), static_cast<uint64_t>(header.height), size) &&
      CheckedAdd(size, header.dataOffset, end);
  return header.ended && counted && end <= file.FileSize() ? Status::Ok : Status::FileReadError;
}

Status Decode(platform::FileView& file, const FitsHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  RETURN_IF_BAD(CheckRowsFit(file, header));
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, 8, image,
                               platform::Fill::Unset));
  ByteReader bytes(file.Bytes());
  bytes.Seek(header.dataOffset);
  for (int32_t y = 0; y < picture.height; ++y) {
    CopyRow(bytes.Take(header.RowBytes()), image.Row(y));
    file.DropBefore(bytes.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return Status::Ok;
}

}  // namespace

// Checks the signature first, unlike `read`.
Status FitsInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), limits.fitsCards * kCardBytes))
    return Status::FileOpenError;
  if (file.Bytes().size() < kSignature.size()) return Status::FileReadError;
  if (!ByteReader(file.Bytes()).Match(kSignature)) return Status::DamagedFile;
  picture.fileSize = file.FileSize();
  FitsHeader header;
  return DescribePicture(file, request, header, picture);
}

Status FitsRead(PictureRecord& picture, const ReadRequest& request) {
  const PlainCodec<FitsHeader> codec = {limits.fitsCards * kCardBytes, DescribePicture, Decode};
  return PlainRead(codec, picture, request);
}

Status FitsWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const GrayTable grays = PaletteGrays(picture);
  WriteHeader(out, image);
  const GrayPixels grayPixels = GrayPixelsFor(image.Bits());
  const auto width = static_cast<size_t>(image.Width()), bits = static_cast<size_t>(image.Bits());
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    const uint8_t* row = image.Row(y).data();
    for (size_t x = 0; x < width; x += ByteWriter::kMostReserved) {
      const size_t count = std::min(width - x, ByteWriter::kMostReserved);
      grayPixels(row + x * bits / 8, grays, count, out.Reserve(count));
      out.Used(count);
    }
  }
  out.Zeros((kBlockBytes - out.Position() % kBlockBytes) % kBlockBytes);
  return CommitOutput(out, options);
}

Status FitsDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.OpenHead(picture.fileName.c_str(), kMostDetailLines * kCardBytes))
    return Status::FileOpenError;
  ByteReader bytes(file.Bytes());
  FitsCard card;
  while (picture.detailLines.Count() < kMostDetailLines && NextCard(bytes, card)) {
    picture.detailLines.Add(std::string(card.keyword).append(" = ").append(card.value));
    if (card.keyword == "END") break;
  }
  return Status::Ok;
}

}  // namespace fotomill
