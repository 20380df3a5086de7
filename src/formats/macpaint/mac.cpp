// MacPaint, big-endian: black and white, always 576 x 720 pixels.
//
//   offset size  field
//        0  128  MacBinary header, optional, identified by its type field
//        +0   1    version, 0
//        +1   1    length of the name
//        +2  63    file name
//       +65   4    type, "PNTG"
//       +69   4    creator, "MPNT"
//       +83   4    size of everything after this header
//       +91   8    creation and modification, seconds each
//        .  512  MacPaint header: version, four bytes, then fill patterns
//        .       720 rows, top first, each packed separately into 72 bytes; a set bit is black
//
// Rows are packed by PackBits: a control byte n below 128 precedes n + 1 literal bytes; one above
// 128 precedes a byte that is repeated 257 - n times. Every byte is inverted, since entry 1 of the
// palette is white.
//
// Also reads files without a MacBinary header, and files of rows only, identified by a nonzero
// first byte. The name in a MacBinary header becomes the picture's type name. Control byte 128 is
// skipped at the start of a row; after a run it is an error, as is a run beyond the row's end,
// although some programs wrote such files.
//
// Writes runs of two and more, a MacBinary header on request, and version 2 at the start of each
// quarter of the MacPaint header. Dates count from 1904, minus four hours: the constant is part of
// the format as written by this program.
//
// Source: Apple Computer, Macintosh Technical Note 86, "MacPaint Document Format" (1985); Dennis F.
// Brothers, "Macintosh Binary Transfer Format Standard Proposal" (1985).
#include "formats/macpaint/mac.h"

#include <algorithm>
#include <array>
#include <string>
#include <string_view>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/creator.h"
#include "core/text.h"
#include "formats/plain_codec.h"
#include "platform/clock.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr int32_t kWidth = 576;
constexpr int32_t kHeight = 720;
constexpr size_t kRowBytes = kWidth / 8;
constexpr uint64_t kMacBinarySize = 128;
constexpr uint64_t kMacPaintSize = 512;
constexpr size_t kNameBytes = 63;
constexpr uint64_t kTypeOffset = 65;
constexpr uint64_t kLengthOffset = 83;
constexpr std::string_view kType = "PNTG";
constexpr std::string_view kCreatorType = "MPNT";
constexpr int64_t kDateOffset = 2082830400;  // added to seconds since 1970
constexpr uint8_t kNoRun = 0x80;

using MacRow = std::array<uint8_t, kRowBytes>;
static_assert(RowStride(kWidth, 1) == kRowBytes);

bool HasMacBinaryHeader(std::span<const uint8_t> bytes) {
  ByteReader reader(bytes);
  reader.Seek(kTypeOffset);
  return reader.Match(kType);
}

std::string_view MacBinaryName(std::span<const uint8_t> bytes) {
  ByteReader reader(bytes);
  reader.Skip(1);
  const auto name = reader.Take(std::min<size_t>(reader.U8(), kNameBytes));
  return {reinterpret_cast<const char*>(name.data()), name.size()};
}

struct MacHeader {
  uint64_t rowsOffset = 0;
};

// Offset of the first row.
uint64_t RowsOffset(std::span<const uint8_t> bytes) {
  if (HasMacBinaryHeader(bytes)) return kMacBinarySize + kMacPaintSize;
  return bytes[0] != 0 ? 0 : kMacPaintSize;
}

// Unpacks and inverts one row. Ok, or FileReadError if the data end within the row or a run goes
// beyond it.
Status UnpackRow(ByteReader& bytes, std::span<uint8_t> row) {
  size_t filled = 0;
  while (filled < row.size()) {
    const uint8_t control = bytes.U8();
    if (!bytes.Ok()) return Status::FileReadError;
    if (control == kNoRun && filled == 0) continue;
    const bool repeats = control >= kNoRun;
    const size_t count = repeats ? 257u - control : control + 1u;
    const auto data = bytes.Take(repeats ? 1 : count);
    if (!bytes.Ok() || control == kNoRun || count > row.size() - filled)
      return Status::FileReadError;
    for (size_t i = 0; i < count; ++i)
      row[filled + i] = static_cast<uint8_t>(~data[repeats ? 0 : i]);
    filled += count;
  }
  return Status::Ok;
}

// Inverts and packs one row: equal bytes as runs, everything else as literals.
void PackRow(ByteWriter& out, const MacRow& row) {
  size_t literals = 0;  // length of the literal run before `i`
  const auto flushLiterals = [&](size_t end) {
    if (literals > 0) out.U8(static_cast<uint8_t>(literals - 1));
    for (size_t i = end - literals; i < end; ++i) out.U8(static_cast<uint8_t>(~row[i]));
    literals = 0;
  };
  size_t i = 0;
  while (i < row.size()) {
    size_t more = 0;  // additional bytes equal to the one at i
    while (i + more + 1 < row.size() && row[i + more] == row[i + more + 1]) ++more;
    if (more == 0) {
      ++literals;
      ++i;
      continue;
    }
    flushLiterals(i);
    out.U8(static_cast<uint8_t>(256 - more));
    out.U8(static_cast<uint8_t>(~row[i]));
    i += more + 1;
  }
  flushLiterals(row.size());
}

// Row y of the page with the picture: padded with white and clipped to the page.
MacRow PageRow(const PackedImage& image, int32_t y) {
  MacRow page;
  page.fill(0xFF);
  if (y >= image.Height()) return page;
  const auto row = image.Row(y);
  std::copy_n(row.begin(), std::min(row.size(), page.size()), page.begin());
  if (image.Width() >= kWidth) return page;
  const size_t width = static_cast<size_t>(image.Width());
  if (width % 8 != 0) page[width / 8] |= static_cast<uint8_t>(0xFF >> width % 8);
  std::fill(page.begin() + static_cast<std::ptrdiff_t>((width + 7) / 8), page.end(), uint8_t{0xFF});
  return page;
}

// The name in a MacBinary header: the file's, with its first letter capitalized, and the creator.
std::string HeaderName(std::string_view path) {
  std::string name = LowerCase(platform::FileNameOf(path));
  if (!name.empty()) name[0] = UpperCase(name[0]);
  name.append("-").append(kCreator);
  return name.substr(0, kNameBytes);
}

void WriteMacBinaryHeader(ByteWriter& out, std::string_view path) {
  const std::string name = HeaderName(path);
  const auto date = static_cast<uint32_t>(platform::Now() + kDateOffset);
  out.U8(0);
  out.U8(static_cast<uint8_t>(name.size()));
  out.Text(name);
  out.Zeros(kNameBytes - name.size());
  out.Text(kType);
  out.Text(kCreatorType);
  out.Zeros(kLengthOffset - out.Position());
  out.Be32(0);  // the size, patched later
  out.Zeros(4);
  out.Be32(date);
  out.Be32(date);
  out.Zeros(kMacBinarySize - out.Position());
}

void WriteMacPaintHeader(ByteWriter& out) {
  constexpr uint64_t kQuarter = kMacPaintSize / 4;
  for (int i = 0; i < 4; ++i) {
    out.Be32(2);
    out.Zeros(kQuarter - 4);
  }
}

// Fills in the record from the file header.
Status DescribePicture(const platform::FileView& file, const ReadRequest&, MacHeader& header,
                       PictureRecord& picture) {
  if (file.Bytes().size() < kMacBinarySize) return Status::FileReadError;
  if (HasMacBinaryHeader(file.Bytes())) picture.typeName.AssignCut(MacBinaryName(file.Bytes()));
  header.rowsOffset = RowsOffset(file.Bytes());
  SetPlainFacts(picture, kWidth, kHeight, 1);
  MakeDefaultPalette(&picture.palette, nullptr, kBlackAndWhitePalette);
  return Status::Ok;
}

Status Decode(platform::FileView& file, const MacHeader& header, const PictureRecord& picture,
              PackedImage& image) {
  RETURN_IF_BAD(NewPackedImage(kWidth, kHeight, &picture.palette, 1, image));
  ByteReader bytes(file.Bytes());
  bytes.Seek(header.rowsOffset);
  for (int32_t y = 0; y < kHeight; ++y) {
    RETURN_IF_BAD(UnpackRow(bytes, image.Row(y)));
    RETURN_IF_BAD(picture.ReportRow(y, kHeight));
  }
  return Status::Ok;
}

constexpr PlainCodec<MacHeader> kCodec = {kMacBinarySize, DescribePicture, Decode};

}  // namespace

Status MacInfo(PictureRecord& picture, const ReadRequest& request) {
  if (request.signedOnly) return Status::UnsupportedFormat;
  return PlainInfo(kCodec, picture, request);
}

Status MacRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(kCodec, picture, request);
}

Status MacWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  if (picture.image.Bits() != 1) return Status::TooManyColors;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const bool withMacBinary = options.encode.macBinary;
  if (withMacBinary) WriteMacBinaryHeader(out, picture.fileName);
  WriteMacPaintHeader(out);
  for (int32_t y = 0; y < kHeight && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y, kHeight));
    PackRow(out, PageRow(picture.image, y));
  }
  if (withMacBinary)
    out.PatchBe32(kLengthOffset, static_cast<uint32_t>(out.Position() - kMacBinarySize));
  return CommitOutput(out, options);
}

}  // namespace fotomill
