// CompuServe GIF, versions 87a and 89a, little-endian.
//
//   offset size  field
//        0    6  "GIF87a" or "GIF89a"
//        6    4  screen width and height
//       10    1  0x80: a global palette follows; low three bits: its size, 2^(n + 1) entries
//       11    1  background index
//       12    1  pixel aspect ratio
//       13       global palette: red, green, blue, then blocks:
//
//   0x2C  picture: left, top, width, height (2 bytes each), flags (0x80 local palette and its size, 0x40 interlaced),
//         the local palette, LZW data
//   0x21  extension: label, then sub-blocks of 1 to 255 bytes and an empty one. 0xF9 graphic control: flags (bits 2-4
//         disposal, bit 0 transparency), delay in 1/100 s (2 bytes), transparent index; 0xFE comment; 0xFF application
//   0x3B  end
//
// Interlaced rows come in four passes: every 8th from 0, every 8th from 4, every 4th from 2, every 2nd from 1.
//
// The reader shows a frame on the logical screen. A first frame that covers the screen and has no transparent index keeps
// its palette at 1 to 8 bits; everything else becomes 24 bits with an alpha plane, the uncovered screen transparent, as
// browsers show it. Frames beyond the screen are cut. A file without any palette is read as greys. Bytes of no meaning
// between blocks are skipped. A missing end code is no fault, missing pixels are (status 3).
//
// The writer makes one frame; 89a with the picture's comment when CreateGif89 is on, interlaced rows with
// WriteGIFInterlaced.
// Source: CompuServe, "Graphics Interchange Format, Version 89a" (1990); T. Welch, "A Technique for High-Performance Data
// Compression", IEEE Computer 17 (1984).
#include "formats/gif.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "core/settings.h"
#include "formats/gif_lzw.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr uint8_t kPictureBlock = 0x2C, kExtensionBlock = 0x21, kEndBlock = 0x3B;
constexpr uint8_t kGraphicControl = 0xF9, kComment = 0xFE, kApplication = 0xFF;
constexpr uint64_t kMostPixelsPerByte = 4096;  // more than LZW with 12-bit codes can ever reach
constexpr int32_t kNoIndex = -1;

enum Disposal : uint8_t { kKeep = 1, kToBackground = 2, kToPrevious = 3 };

// A palette inside the file.
struct GifPalette {
  std::span<const uint8_t> colors;  // red, green, blue
  int32_t bits = 0;                 // 2^bits entries; 0: there is none
};

struct GifScreen {
  bool is89 = false;
  int32_t width = 0, height = 0;
  GifPalette palette;
};

struct GifFrame {
  int32_t left = 0, top = 0, width = 0, height = 0;
  bool interlaced = false;
  GifPalette palette;  // local, else global
  int32_t transparent = kNoIndex;
  uint8_t disposal = 0;
  uint16_t delay = 0;       // hundredths of a second
  uint64_t dataOffset = 0;  // of the LZW data
  uint8_t pixelBits = 0;    // as the LZW data say

  // Bits per pixel of the picture that this frame is. Two-colour frames are coded with 2 bits.
  int32_t Depth() const {
    if (palette.bits == 0) return std::clamp<int32_t>(pixelBits, 1, 8);
    return palette.bits == 1 && pixelBits <= 2 ? 1 : std::clamp<int32_t>(std::max<int32_t>(palette.bits, pixelBits), 1, 8);
  }
  bool Covers(const GifScreen& screen) const { return left == 0 && top == 0 && width >= screen.width && height >= screen.height; }
};

GifPalette TakePalette(ByteReader& bytes, uint8_t flags) {
  if ((flags & 0x80) == 0) return {};
  const int32_t bits = (flags & 7) + 1;
  return {bytes.Take(uint64_t{3} << bits), bits};
}

// DamagedFile without the signature, FileReadError when the header is cut short.
Status ParseScreen(ByteReader& bytes, GifScreen& screen) {
  if (bytes.Match("GIF89a")) {
    screen.is89 = true;
  } else if (!bytes.Match("GIF87a")) {
    return Status::DamagedFile;
  }
  screen.width = bytes.Le16();
  screen.height = bytes.Le16();
  const uint8_t flags = bytes.U8();
  bytes.Skip(2);
  screen.palette = TakePalette(bytes, flags);
  return bytes.Ok() ? Status::Ok : Status::FileReadError;
}

void SkipSubBlocks(ByteReader& bytes) {
  for (uint8_t size = bytes.U8(); size != 0; size = bytes.U8()) bytes.Skip(size);
}

// The text of an extension's sub-blocks.
std::vector<uint8_t> TakeSubBlocks(ByteReader& bytes, uint64_t most) {
  std::vector<uint8_t> text;
  for (uint8_t size = bytes.U8(); size != 0; size = bytes.U8()) {
    const auto piece = bytes.Take(size);
    if (text.size() + piece.size() <= most) text.insert(text.end(), piece.begin(), piece.end());
  }
  return text;
}

void ParseGraphicControl(ByteReader& bytes, GifFrame& frame) {
  const auto block = bytes.Take(bytes.U8());
  if (block.size() >= 4) {
    frame.disposal = block[0] >> 2 & 7;
    frame.delay = static_cast<uint16_t>(block[1] | block[2] << 8);
    frame.transparent = (block[0] & 1) != 0 ? block[3] : kNoIndex;
  }
  if (!block.empty()) SkipSubBlocks(bytes);
}

void ParseFrame(ByteReader& bytes, GifScreen& screen, GifFrame& frame) {
  frame.left = bytes.Le16();
  frame.top = bytes.Le16();
  frame.width = bytes.Le16();
  frame.height = bytes.Le16();
  const uint8_t flags = bytes.U8();
  frame.interlaced = (flags & 0x40) != 0;
  frame.palette = TakePalette(bytes, flags);
  if (frame.palette.bits == 0) frame.palette = screen.palette;
  frame.dataOffset = bytes.Position();
  frame.pixelBits = bytes.U8();
  if (screen.width == 0) screen.width = frame.left + frame.width;  // a screen without size is as large as its picture
  if (screen.height == 0) screen.height = frame.top + frame.height;
}

// What lies between the frames: comment and application blocks, as the caller wants them.
struct GifRemarks {
  std::vector<uint8_t> comment;
  bool loops = false;
};

// Moves on to the next frame. NoImages when the file ends properly before one, FileReadError when it is cut short.
Status NextFrame(ByteReader& bytes, GifScreen& screen, GifFrame& frame, GifRemarks* remarks = nullptr) {
  frame = {};
  while (bytes.Left() > 0) {
    const uint8_t block = bytes.U8();
    if (block == kEndBlock) return Status::NoImages;
    if (block == kPictureBlock) {
      ParseFrame(bytes, screen, frame);
      return bytes.Ok() ? Status::Ok : Status::FileReadError;
    }
    if (block != kExtensionBlock) continue;
    const uint8_t label = bytes.U8();
    if (label == kGraphicControl) {
      ParseGraphicControl(bytes, frame);
    } else if (label == kComment && remarks != nullptr) {
      const auto text = TakeSubBlocks(bytes, limits.exifTextBytes);
      remarks->comment.insert(remarks->comment.end(), text.begin(), text.end());
    } else if (label == kApplication && remarks != nullptr) {
      const auto name = bytes.Take(bytes.U8());
      remarks->loops = remarks->loops || (name.size() == 11 && std::memcmp(name.data(), "NETSCAPE2.0", 11) == 0);
      if (!name.empty()) SkipSubBlocks(bytes);
    } else {
      SkipSubBlocks(bytes);
    }
  }
  return Status::FileReadError;
}

void TakeColors(const GifFrame& frame, Palette& palette) {
  if (frame.palette.bits == 0) {
    palette = GreyRamp();
    return;
  }
  palette.fill(0);
  std::copy(frame.palette.colors.begin(), frame.palette.colors.end(), palette.begin());
}

// The file row that comes as number `r` of an interlaced picture.
int32_t InterlacedRow(int32_t r, int32_t height) {
  struct Pass {
    int32_t first, step;
  };
  constexpr Pass kPasses[] = {{0, 8}, {4, 8}, {2, 4}, {1, 2}};
  for (const Pass& pass : kPasses) {
    const int32_t rows = height > pass.first ? (height - pass.first + pass.step - 1) / pass.step : 0;
    if (r < rows) return pass.first + r * pass.step;
    r -= rows;
  }
  return 0;
}

// Whether the screen and the frame leave a picture that can be shown with its own palette.
bool KeepsPalette(const GifScreen& screen, const GifFrame& frame, int32_t page) {
  return page == 0 && frame.transparent == kNoIndex && frame.Covers(screen);
}

// Facts of the frame that `picture.page` selects, as far as its header tells. The reader stays behind the first frame's.
Status DescribePicture(ByteReader& bytes, GifScreen& screen, GifFrame& frame, PictureRecord& picture) {
  RETURN_IF_BAD(ParseScreen(bytes, screen));
  RETURN_IF_BAD(NextFrame(bytes, screen, frame));
  if (screen.width < 1 || screen.height < 1 || frame.width < 1 || frame.height < 1) return Status::DamagedFile;
  const bool keepsPalette = KeepsPalette(screen, frame, picture.page);
  picture.typeName.AssignCut(screen.is89 ? "GIF 89a" : "GIF 87a");
  picture.width = screen.width;
  picture.height = screen.height;
  picture.bitsPerPixel = keepsPalette ? frame.Depth() : 24;
  picture.alphaFlags = static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (keepsPalette ? 0 : kHasAlpha));
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  if (keepsPalette) {
    TakeColors(frame, picture.palette);
  } else {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  }
  return Status::Ok;
}

// The indices of a frame in the order of the file. FileReadError before any memory is taken when the data cannot hold
// so many.
Status DecodeFrame(ByteReader& bytes, const GifFrame& frame, platform::MemoryBlock& pixels) {
  const uint64_t count = static_cast<uint64_t>(frame.width) * static_cast<uint64_t>(frame.height);
  if (count > limits.packedBlockBytes) return Status::MemoryAllocationError;
  bytes.Seek(frame.dataOffset);
  if (bytes.Left() < count / kMostPixelsPerByte) return Status::FileReadError;
  if (!pixels.Allocate(count, platform::Fill::Unset)) return Status::MemoryAllocationError;
  RETURN_IF_BAD(DecodeGifPixels(bytes, pixels.Bytes()));
  bytes.Seek(frame.dataOffset + 1);
  SkipSubBlocks(bytes);
  return Status::Ok;
}

void PackRow(const uint8_t* indices, int32_t width, int32_t bits, uint8_t* row) {
  const int32_t perByte = 8 / bits;
  const uint8_t mask = static_cast<uint8_t>((1 << bits) - 1);
  for (int32_t x = 0; x < width; x += perByte) {
    uint8_t value = 0;
    for (int32_t i = 0; i < perByte; ++i) {
      const uint8_t index = x + i < width ? indices[x + i] : 0;
      value = static_cast<uint8_t>(value << bits | (index <= mask ? index : 0));
    }
    *row++ = value;
  }
}

// A picture with its own palette.
Status ReadIndexed(ByteReader& bytes, const GifFrame& frame, PictureRecord& picture, PackedImage& image) {
  platform::MemoryBlock pixels;
  RETURN_IF_BAD(DecodeFrame(bytes, frame, pixels));
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  const int32_t rows = std::min(frame.height, picture.height);
  for (int32_t r = 0; r < frame.height; ++r) {
    const int32_t y = frame.interlaced ? InterlacedRow(r, frame.height) : r;
    if (y >= rows) continue;
    const uint8_t* source = pixels.Data() + static_cast<uint64_t>(r) * static_cast<uint64_t>(frame.width);
    if (image.Bits() == 8) {
      std::memcpy(image.Row(y).data(), source, static_cast<size_t>(picture.width));
    } else {
      PackRow(source, picture.width, image.Bits(), image.Row(y).data());
    }
    picture.ReportRow(r);
  }
  return Status::Ok;
}

// The screen on which frames are drawn: colours and an alpha plane of the same size.
struct Canvas {
  PackedImage image, alpha;
};

// Calls `visit(y, x, count)` for every row of the frame that lies on the screen.
template <typename Visit>
void ForVisibleRows(const GifFrame& frame, const Canvas& canvas, Visit visit) {
  const int32_t count = std::min(frame.width, canvas.image.Width() - frame.left);
  for (int32_t r = 0; r < frame.height && count > 0; ++r) {
    if (frame.top + r < canvas.image.Height()) visit(r, frame.top + r, count);
  }
}

Status DrawFrame(ByteReader& bytes, const GifFrame& frame, Canvas& canvas) {
  platform::MemoryBlock pixels;
  RETURN_IF_BAD(DecodeFrame(bytes, frame, pixels));
  Palette palette;
  TakeColors(frame, palette);
  std::vector<int32_t> order(static_cast<size_t>(frame.height));  // where row y of the frame stands in the data
  for (int32_t r = 0; r < frame.height; ++r) {
    order[static_cast<size_t>(frame.interlaced ? InterlacedRow(r, frame.height) : r)] = r;
  }
  ForVisibleRows(frame, canvas, [&](int32_t r, int32_t y, int32_t count) {
    const auto row = static_cast<uint64_t>(order[static_cast<size_t>(r)]);
    const uint8_t* source = pixels.Data() + row * static_cast<uint64_t>(frame.width);
    uint8_t* place = canvas.image.Row(y).data() + 3 * frame.left;
    uint8_t* opacity = canvas.alpha.Row(y).data() + frame.left;
    for (int32_t x = 0; x < count; ++x, place += 3) {
      if (source[x] == frame.transparent) continue;
      const uint8_t* color = &palette[size_t{3} * source[x]];
      place[0] = color[2];
      place[1] = color[1];
      place[2] = color[0];
      opacity[x] = 255;
    }
  });
  return Status::Ok;
}

// Clears the frame's place to transparent.
void ClearFrame(const GifFrame& frame, Canvas& canvas) {
  ForVisibleRows(frame, canvas, [&](int32_t, int32_t y, int32_t count) {
    std::memset(canvas.image.Row(y).data() + 3 * frame.left, 0, 3 * static_cast<size_t>(count));
    std::memset(canvas.alpha.Row(y).data() + frame.left, 0, static_cast<size_t>(count));
  });
}

Status NewCanvas(int32_t width, int32_t height, Canvas& canvas) {
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, canvas.image));
  return NewAlphaPlane(width, height, canvas.alpha);
}

Status CopyCanvas(const Canvas& from, Canvas& to) {
  RETURN_IF_BAD(NewCanvas(from.image.Width(), from.image.Height(), to));
  std::ranges::copy(from.image.Rows(), to.image.Rows().begin());
  std::ranges::copy(from.alpha.Rows(), to.alpha.Rows().begin());
  return Status::Ok;
}

// Draws the frames up to `picture.page`, each disposed of as it asks before the next one. NoImages when there are fewer.
Status ReadComposed(ByteReader& bytes, GifScreen& screen, GifFrame frame, PictureRecord& picture, Canvas& canvas) {
  RETURN_IF_BAD(NewCanvas(picture.width, picture.height, canvas));
  for (int32_t page = 0;; ++page) {
    Canvas before;
    if (page < picture.page && frame.disposal == kToPrevious) RETURN_IF_BAD(CopyCanvas(canvas, before));
    RETURN_IF_BAD(DrawFrame(bytes, frame, canvas));
    if (page == picture.page) return Status::Ok;
    if (frame.disposal == kToBackground) ClearFrame(frame, canvas);
    if (frame.disposal == kToPrevious) canvas = std::move(before);
    RETURN_IF_BAD(NextFrame(bytes, screen, frame));
    if (frame.width < 1 || frame.height < 1) return Status::DamagedFile;
  }
}

void WriteHeader(ByteWriter& out, const PictureRecord& picture, int32_t bits) {
  const auto flags = static_cast<uint8_t>(0x80 | (bits - 1) << 4 | (bits - 1));
  out.Text(settings.CreateGif89 != 0 ? "GIF89a" : "GIF87a");
  out.Le16(static_cast<uint16_t>(picture.image.Width()));
  out.Le16(static_cast<uint16_t>(picture.image.Height()));
  out.U8(flags);
  out.Zeros(2);
  out.Bytes(std::span(picture.palette).first(size_t{3} << bits));
}

void WriteComment(ByteWriter& out, std::span<const uint8_t> comment) {
  if (comment.empty()) return;
  out.U8(kExtensionBlock);
  out.U8(kComment);
  for (; !comment.empty(); comment = comment.subspan(std::min<size_t>(comment.size(), 255))) {
    const size_t size = std::min<size_t>(comment.size(), 255);
    out.U8(static_cast<uint8_t>(size));
    out.Bytes(comment.first(size));
  }
  out.U8(0);
}

void UnpackRow(std::span<const uint8_t> row, int32_t bits, std::span<uint8_t> indices) {
  const size_t perByte = static_cast<size_t>(8 / bits);
  const uint8_t mask = static_cast<uint8_t>((1 << bits) - 1);
  for (size_t x = 0; x < indices.size(); ++x) {
    const size_t shift = (perByte - 1 - x % perByte) * static_cast<size_t>(bits);
    indices[x] = static_cast<uint8_t>(row[x / perByte] >> shift & mask);
  }
}

void WritePixels(ByteWriter& out, const PictureRecord& picture) {
  const PackedImage& image = picture.image;
  const bool interlaced = settings.WriteGIFInterlaced != 0;
  out.U8(kPictureBlock);
  out.Zeros(4);
  out.Le16(static_cast<uint16_t>(image.Width()));
  out.Le16(static_cast<uint16_t>(image.Height()));
  out.U8(interlaced ? 0x40 : 0);
  GifPixelEncoder encoder(out, image.Bits());
  std::vector<uint8_t> indices(static_cast<size_t>(image.Width()));
  for (int32_t r = 0; r < image.Height() && !out.Failed(); ++r) {
    const auto row = image.Row(interlaced ? InterlacedRow(r, image.Height()) : r);
    if (image.Bits() == 8) {
      encoder.Add(row.first(indices.size()));
    } else {
      UnpackRow(row, image.Bits(), indices);
      encoder.Add(indices);
    }
    picture.ReportRow(r);
  }
  encoder.Finish();
}

}  // namespace

Status GifInfo(PictureRecord& picture, const char* fileName, uint32_t) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  ByteReader bytes(file.Bytes());
  GifScreen screen;
  GifFrame frame;
  return DescribePicture(bytes, screen, frame, picture);
}

Status GifRead(PictureRecord& picture, const char* fileName) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(fileName)) return Status::FileOpenError;
  ByteReader bytes(file.Bytes());
  GifScreen screen;
  GifFrame frame;
  RETURN_IF_BAD(DescribePicture(bytes, screen, frame, picture));
  Canvas made;
  if (picture.bitsPerPixel <= 8) {
    RETURN_IF_BAD(ReadIndexed(bytes, frame, picture, made.image));
  } else {
    RETURN_IF_BAD(ReadComposed(bytes, screen, frame, picture, made));
  }
  if (!file.Intact()) return Status::FileReadError;
  picture.image = std::move(made.image);
  picture.alpha = std::move(made.alpha);
  return Status::Ok;
}

Status GifWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() > 8) return Status::TooManyColors;
  if (image.Width() > UINT16_MAX || image.Height() > UINT16_MAX) return Status::UnsuitableImage;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHeader(out, picture, image.Bits());
  if (settings.CreateGif89 != 0) WriteComment(out, picture.comment);
  WritePixels(out, picture);
  out.U8(kEndBlock);
  return CommitOutput(out, options);
}

Status GifDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  ByteReader bytes(file.Bytes());
  GifScreen screen;
  RETURN_IF_BAD(ParseScreen(bytes, screen));
  GifRemarks remarks;
  GifFrame frame, first;
  int32_t frames = 0;
  uint64_t duration = 0;  // hundredths of a second
  for (; NextFrame(bytes, screen, frame, &remarks) == Status::Ok; ++frames) {
    if (frames == 0) first = frame;
    duration += frame.delay;
    SkipSubBlocks(bytes);
    file.DropBefore(bytes.Position());
  }
  picture.pageCount = std::max(frames, 1);
  DetailLines& lines = picture.detailLines;
  lines.AddFormat("      Version: %s", screen.is89 ? "89a" : "87a");
  lines.AddFormat("       Screen: %d x %d", screen.width, screen.height);
  lines.AddFormat("Global colors: %d", screen.palette.bits == 0 ? 0 : 1 << screen.palette.bits);
  lines.AddFormat("       Frames: %d", frames);
  if (frames > 1) {
    lines.AddFormat("     Duration: %.2f s", static_cast<double>(duration) / 100);
    lines.AddFormat("        Loops: %s", remarks.loops ? "yes" : "no");
  }
  lines.AddFormat("   Interlaced: %s", first.interlaced ? "yes" : "no");
  lines.AddFormat(" Transparency: %s", first.transparent != kNoIndex ? "yes" : "no");
  if (!remarks.comment.empty()) {
    lines.Add("      Comment: " + std::string(remarks.comment.begin(), remarks.comment.end()));
  }
  return Status::Ok;
}

}  // namespace fotomill
