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
//   0x2C  picture: left, top, width, height (2 bytes each), flags (0x80 local palette and its size,
//         0x40 interlaced), the local palette, LZW data
//   0x21  extension: label, then sub-blocks of 1 to 255 bytes and an empty one. 0xF9 graphic
//         control: flags (bits 2-4 disposal, bit 0 transparency), delay in 1/100 s (2 bytes),
//         transparent index; 0xFE comment; 0xFF application
//   0x3B  end
//
// Interlaced rows come in four passes: every 8th from 0, every 8th from 4, every 4th from 2, every
// 2nd from 1.
//
// The reader composes frames on the logical screen. A first frame that covers the screen and has no
// transparent index keeps its palette at 1 to 8 bits; everything else becomes 24 bits with an alpha
// plane, with the uncovered screen transparent, as in browsers. Frames are clipped to the screen.
// Files without a palette are read as grays. Garbage between blocks is skipped. A missing end code
// is accepted, missing pixels are not (status 3).
//
// The writer creates one frame, gif_sequence.cpp several; 89a with the picture's comment if
// CreateGif89 is on, interlaced rows with WriteGIFInterlaced. Source: CompuServe, "Graphics
// Interchange Format, Version 89a" (1990); T. Welch, "A Technique for High-Performance Data
// Compression", IEEE Computer 17 (1984).
#include "formats/gif/gif.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "formats/gif/gif_blocks.h"
#include "formats/gif/gif_frames.h"
#include "formats/gif/gif_lzw.h"
#include "picture/partial.h"
#include "platform/file_view.h"

namespace fotomill {

using namespace gif;

namespace {

// Whether the frame can be shown with its own palette.
bool KeepsPalette(const GifScreen& screen, const GifFrame& frame, int32_t page) {
  return page == 0 && frame.transparent == kNoIndex && frame.Covers(screen);
}

// Header fields of frame `page`. The reader is left after the header of the first one.
Status DescribePicture(ByteReader& bytes, int32_t page, GifScreen& screen, GifFrame& frame,
                       PictureRecord& picture) {
  RETURN_IF_BAD(ParseScreen(bytes, screen));
  GifRemarks remarks;
  RETURN_IF_BAD(NextFrame(bytes, screen, frame, &remarks));
  picture.comment = std::move(remarks.comment);
  if (screen.width < 1 || screen.height < 1 || frame.width < 1 || frame.height < 1)
    return Status::DamagedFile;
  const bool keepsPalette = KeepsPalette(screen, frame, page);
  picture.typeName.AssignCut(screen.is89 ? "GIF 89a" : "GIF 87a");
  picture.width = screen.width;
  picture.height = screen.height;
  picture.bitsPerPixel = keepsPalette ? frame.Depth() : 24;
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (keepsPalette ? 0 : kHasAlpha));
  picture.imageBytes = EstimateImageBytes(picture.width, picture.height, picture.bitsPerPixel);
  if (keepsPalette) {
    TakeColors(frame, picture.palette);
  } else {
    MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  }
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

// Reads a picture with its own palette.
Status ReadIndexed(ByteReader& bytes, const GifFrame& frame, const ReadRequest& request,
                   PictureRecord& picture, PackedImage& image) {
  platform::MemoryBlock pixels;
  uint64_t done = 0;
  const Status status = DecodeFrame(bytes, frame, pixels, request.partial ? &done : nullptr);
  const uint64_t whole = done / static_cast<uint64_t>(frame.width);
  RETURN_IF_BAD(TakePart(picture, request.partial, status, static_cast<int64_t>(whole)));
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, picture.bitsPerPixel, image));
  const int32_t rows = std::min(frame.height, picture.height);
  for (int32_t r = 0; r < frame.height; ++r) {
    const int32_t y = frame.interlaced ? InterlacedRow(r, frame.height) : r;
    if (y >= rows) continue;
    const uint8_t* source =
        pixels.Data() + static_cast<uint64_t>(r) * static_cast<uint64_t>(frame.width);
    if (image.Bits() == 8) {
      std::memcpy(image.Row(y).data(), source, static_cast<size_t>(picture.width));
    } else {
      PackRow(source, picture.width, image.Bits(), image.Row(y).data());
    }
    RETURN_IF_BAD(picture.ReportRow(r));
  }
  return Status::Ok;
}

// Composes the frames up to the requested one. NoImages if there are fewer.
Status ReadComposed(ByteReader& bytes, GifScreen& screen, GifFrame frame,
                    const ReadRequest& request, PictureRecord& picture, Canvas& canvas) {
  GifDrawing drawing;
  RETURN_IF_BAD(drawing.Begin(screen, canvas));
  for (int32_t page = 0;; ++page) {
    if (page == request.page && request.partial) {
      int32_t rows = 0;
      const Status status = drawing.Draw(bytes, frame, canvas, &rows);
      return TakePart(picture, request.partial, status, rows);
    }
    RETURN_IF_BAD(drawing.Draw(bytes, frame, canvas));
    if (page == request.page) return Status::Ok;
    RETURN_IF_BAD(NextFrame(bytes, screen, frame));
  }
}

void WriteHeader(ByteWriter& out, const PictureRecord& picture, bool version89) {
  const int32_t bits = picture.image.Bits();
  const auto flags = static_cast<uint8_t>(0x80 | (bits - 1) << 4 | (bits - 1));
  out.Text(version89 ? "GIF89a" : "GIF87a");
  out.Le16(static_cast<uint16_t>(picture.image.Width()));
  out.Le16(static_cast<uint16_t>(picture.image.Height()));
  out.U8(flags);
  out.Zeros(2);
  out.Bytes(std::span(picture.palette).first(size_t{3} << bits));
}

void UnpackRow(std::span<const uint8_t> row, int32_t bits, std::span<uint8_t> indices) {
  const size_t perByte = static_cast<size_t>(8 / bits);
  const uint8_t mask = static_cast<uint8_t>((1 << bits) - 1);
  for (size_t x = 0; x < indices.size(); ++x) {
    const size_t shift = (perByte - 1 - x % perByte) * static_cast<size_t>(bits);
    indices[x] = static_cast<uint8_t>(row[x / perByte] >> shift & mask);
  }
}

Status WritePixels(ByteWriter& out, const PictureRecord& picture, bool interlaced) {
  const PackedImage& image = picture.image;
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
    RETURN_IF_BAD(picture.ReportRow(r));
  }
  encoder.Finish();
  return Status::Ok;
}

}  // namespace

Status GifInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  ByteReader bytes(file.Bytes());
  GifScreen screen;
  GifFrame frame;
  RETURN_IF_BAD(DescribePicture(bytes, request.page, screen, frame, picture));
  picture.pageCount = CountGifFrames(bytes, screen);
  return Status::Ok;
}

Status GifRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  ByteReader bytes(file.Bytes());
  GifScreen screen;
  GifFrame frame;
  RETURN_IF_BAD(DescribePicture(bytes, request.page, screen, frame, picture));
  Canvas made;
  if (picture.bitsPerPixel <= 8) {
    RETURN_IF_BAD(ReadIndexed(bytes, frame, request, picture, made.image));
  } else {
    RETURN_IF_BAD(ReadComposed(bytes, screen, frame, request, picture, made));
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
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  WriteHeader(out, picture, options.encode.gif89);
  const bool comment = options.encode.gif89 && options.KeepsMetadata();
  if (comment) WriteGifComment(out, picture.comment);
  if (!comment) picture.lostMetadata |= kLostComment;
  RETURN_IF_BAD(WritePixels(out, picture, options.encode.gifInterlaced));
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
    SkipFrame(bytes);
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
