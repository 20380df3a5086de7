// WebP, little-endian, pixels decoded and encoded by libwebp.
//
//   "RIFF", size, "WEBP", then chunks of name, size and data, padded to an even size:
//   "VP8 " lossy pixels, or "VP8L" lossless ones; or first of all
//   "VP8X" flags (1 byte: 2 animation, 4 XMP, 8 EXIF, 16 alpha, 32 ICC), 3 bytes 0, width - 1,
//          height - 1 (3 bytes each)
//   "ICCP", "ANIM" background and loops, "ANMF" a frame, "ALPH" and "VP8 ", "EXIF", "XMP "
//   ANMF:  x / 2, y / 2, width - 1, height - 1, duration (3 bytes each), flags, then the frame's
//          ALPH, VP8 or VP8L chunk
//
// Everything becomes 24 bits, with an alpha plane if the file has alpha. Frames of an animation are
// pages, each composed with the preceding ones on the canvas. EXIF, XMP and ICC profile are kept.
//
// The writer creates lossy files with quality WebPQualityFactor, or with WebPLossless lossless
// ones, which keep every value, even below transparent pixels. With WebPAllowMixed it tries both
// and keeps the smaller one. Source: RFC 9649 (2024).
#include "formats/webp/webp.h"

#include <webp/decode.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string_view>
#include <vector>

#include "containers/jpeg_segments.h"
#include "containers/riff_chunks.h"
#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "formats/metadata_blocks.h"
#include "picture/partial.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr uint8_t kXmpFlag = 4, kExifFlag = 8, kAlphaFlag = 16, kIccFlag = 32;
// frame flags: disposal and blending
constexpr uint8_t kClearAfterwards = 1, kReplace = 2;
constexpr size_t kMostFrames = 1 << 16;
constexpr int kLossy = 1, kLossless = 2;  // WebPBitstreamFeatures::format

struct WebpFrame {
  int32_t left = 0, top = 0;  // on the canvas
  int32_t width = 0, height = 0;
  int32_t duration = 0;  // milliseconds
  uint8_t flags = 0;
  // input of the library: the whole file, or the frame's chunks
  std::span<const uint8_t> pixels;
};

struct WebpFile {
  int32_t width = 0, height = 0;  // of the canvas
  bool alpha = false;
  int format = 0;                 // from the library, 0 for an animation
  uint16_t loops = 0;             // number of times an animation plays, 0 for endless
  std::vector<WebpFrame> frames;  // one for a still picture
  std::span<const uint8_t> icc, exif, xmp;
};

uint32_t Le24(ByteReader& bytes) {
  const uint32_t low = bytes.Le16();
  return low | static_cast<uint32_t>(bytes.U8()) << 16;
}

// The status for a library error on a stream: chunks without the RIFF header, or a whole file.
Status StatusOf(VP8StatusCode code) {
  switch (code) {
    case VP8_STATUS_OK: return Status::Ok;
    case VP8_STATUS_OUT_OF_MEMORY: return Status::MemoryAllocationError;
    case VP8_STATUS_NOT_ENOUGH_DATA:
    case VP8_STATUS_SUSPENDED: return Status::FileReadError;
    case VP8_STATUS_UNSUPPORTED_FEATURE: return Status::UnsupportedFormat;
    default: return Status::DamagedFile;
  }
}

void TakeFrame(std::span<const uint8_t> chunk, WebpFile& file) {
  ByteReader bytes(chunk);
  WebpFrame frame;
  frame.left = static_cast<int32_t>(2 * Le24(bytes));
  frame.top = static_cast<int32_t>(2 * Le24(bytes));
  bytes.Skip(6);
  frame.duration = static_cast<int32_t>(Le24(bytes));
  frame.flags = bytes.U8();
  frame.pixels = bytes.Take(bytes.Left());
  if (file.frames.size() < kMostFrames) file.frames.push_back(frame);
}

// Collects the chunks other than pixels. A truncated chunk is used as far as it goes: the library
// reports what is missing.
void WalkChunks(std::span<const uint8_t> data, WebpFile& file) {
  RiffWalk walk(data);
  for (RiffPlace place; walk.Next(place);) {
    const auto chunk = data.subspan(place.data, place.size);
    if (place.name == "ANIM" && chunk.size() >= 6)
      file.loops = static_cast<uint16_t>(chunk[4] | chunk[5] << 8);
    if (place.name == "ANMF") TakeFrame(chunk, file);
    if (place.name == "ICCP") file.icc = chunk;
    if (place.name == "EXIF") file.exif = chunk;
    if (place.name == "XMP ") file.xmp = chunk;
  }
}

// Gets the size of an animation's frame from the library, and checks that it is on the canvas.
Status MeasureFrame(WebpFile& file, WebpFrame& frame) {
  WebPBitstreamFeatures features;
  RETURN_IF_BAD(StatusOf(WebPGetFeatures(frame.pixels.data(), frame.pixels.size(), &features)));
  const bool inside = int64_t{frame.left} + features.width <= file.width &&
                      int64_t{frame.top} + features.height <= file.height;
  if (!inside || features.has_animation != 0) return Status::DamagedFile;
  frame.width = features.width;  // last: a frame with a size can be drawn
  frame.height = features.height;
  file.alpha = file.alpha || features.has_alpha != 0;
  return Status::Ok;
}

Status ParseFile(std::span<const uint8_t> data, WebpFile& file) {
  if (data.size() < kRiffHead) return Status::FileReadError;
  if (!IsRiff(data, "WEBP")) return Status::DamagedFile;
  WebPBitstreamFeatures features;
  RETURN_IF_BAD(StatusOf(WebPGetFeatures(data.data(), data.size(), &features)));
  file.width = features.width;
  file.height = features.height;
  file.alpha = features.has_alpha != 0;
  file.format = features.format;
  WalkChunks(data, file);
  if (features.has_animation == 0) {
    file.frames.assign(
        1, {.width = file.width, .height = file.height, .flags = kReplace, .pixels = data});
    return Status::Ok;
  }
  if (file.frames.empty()) return Status::FileReadError;
  // Areas not covered by frames are transparent; checking the first one is sufficient.
  RETURN_IF_BAD(MeasureFrame(file, file.frames[0]));
  file.alpha =
      file.alpha || file.frames[0].width < file.width || file.frames[0].height < file.height;
  return Status::Ok;
}

void Describe(const WebpFile& file, PictureRecord& picture) {
  picture.typeName.AssignCut(file.frames.size() > 1     ? "Animated WebP"
                             : file.format == kLossless ? "WebP, lossless"
                             : file.format == kLossy    ? "WebP, lossy"
                                                        : "WebP");
  picture.pageCount = static_cast<int32_t>(file.frames.size());
  picture.width = file.width;
  picture.height = file.height;
  picture.bitsPerPixel = 24;
  picture.alphaFlags =
      static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (file.alpha ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(file.width, file.height, 24);
  MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  picture.metadata = {};
  // some programs include the JPEG signature
  const bool headed = ByteReader(file.exif).Match(kExifHead);
  TakeBlock(headed ? file.exif.subspan(kExifHead.size()) : file.exif, picture.metadata.exif);
  TakeBlock(file.xmp, picture.metadata.xmp);
  TakeBlock(file.icc, picture.metadata.icc);
}

// Draws a row of a frame onto the canvas, replacing or blending.
void PutRow(const uint8_t* source, int32_t width, bool replace, uint8_t* color, uint8_t* alpha) {
  for (int32_t x = 0; x < width; ++x, source += 4, color += 3, ++alpha) {
    const uint32_t over = source[3], under = *alpha * (255 - over) / 255;
    if (replace || over == 255 || over + under == 0) {
      std::memcpy(color, source, 3);
      *alpha = source[3];
    } else if (over > 0) {
      for (size_t i = 0; i < 3; ++i) {
        color[i] = static_cast<uint8_t>((source[i] * over + color[i] * under + (over + under) / 2) /
                                        (over + under));
      }
      *alpha = static_cast<uint8_t>(over + under);
    }
  }
}

void ClearFrame(const WebpFrame& frame, Canvas& target) {
  for (int32_t y = frame.top; y < frame.top + frame.height; ++y) {
    std::fill_n(target.image.Row(y).data() + 3 * static_cast<size_t>(frame.left),
                3 * static_cast<size_t>(frame.width), uint8_t{0});
    std::fill_n(target.alpha.Row(y).data() + frame.left, frame.width, uint8_t{0});
  }
}

// Memory that the library needs to decode a frame: lossless pixels and alpha as a whole, others row
// by row.
uint64_t DecoderBytes(const WebpFrame& frame) {
  WebPBitstreamFeatures features;
  if (WebPGetFeatures(frame.pixels.data(), frame.pixels.size(), &features) != VP8_STATUS_OK)
    return 0;
  const uint64_t pixels =
      static_cast<uint64_t>(features.width) * static_cast<uint64_t>(features.height);
  if (features.format == kLossless) return 4 * pixels;
  return features.has_alpha != 0 ? 5 * pixels : 0;
}

// With alpha, a frame is decoded to four bytes per pixel and then drawn.
Status ReadFrame(const WebpFrame& frame, Canvas& target) {
  const size_t stride = 4 * static_cast<size_t>(frame.width);
  RETURN_IF_BAD(CheckFileMemory(target.image.Bytes().size() + target.alpha.Bytes().size() + stride * static_cast<size_t>(frame.height) +
                                DecoderBytes(frame)));
  platform::MemoryBlock decoded;
  if (!decoded.Allocate(stride * static_cast<size_t>(frame.height), platform::Fill::Unset))
    return Status::MemoryAllocationError;
  WebPDecoderConfig config;
  if (WebPInitDecoderConfig(&config) == 0) return Status::MemoryAllocationError;
  config.output.colorspace = MODE_BGRA;
  config.output.is_external_memory = 1;
  config.output.u.RGBA = {decoded.Data(), static_cast<int>(stride), decoded.Size()};
  RETURN_IF_BAD(StatusOf(WebPDecode(frame.pixels.data(), frame.pixels.size(), &config)));
  for (int32_t y = 0; y < frame.height; ++y) {
    PutRow(decoded.Data() + stride * static_cast<size_t>(y), frame.width,
           (frame.flags & kReplace) != 0,
           target.image.Row(frame.top + y).data() + 3 * static_cast<size_t>(frame.left),
           target.alpha.Row(frame.top + y).data() + frame.left);
  }
  return Status::Ok;
}

// Draws a frame on the canvas of the previous ones.
Status DrawFrame(WebpFile& file, size_t index, Canvas& target) {
  WebpFrame& frame = file.frames[index];
  if (frame.width == 0) RETURN_IF_BAD(MeasureFrame(file, frame));
  if (index > 0 && (file.frames[index - 1].flags & kClearAfterwards) != 0)
    ClearFrame(file.frames[index - 1], target);
  return ReadFrame(frame, target);
}

// The canvas after drawing `frames` frames.
Status ReadWithAlpha(WebpFile& file, int32_t frames, const PictureRecord& picture, Canvas& target) {
  for (int32_t i = 0; i < frames; ++i) {
    RETURN_IF_BAD(DrawFrame(file, static_cast<size_t>(i), target));
    RETURN_IF_BAD(picture.ReportRow(i, frames));
  }
  return Status::Ok;
}

// An animation without an alpha flag may still have alpha, but usually has not.
void DropOpaqueAlpha(Canvas& target) {
  for (int32_t y = 0; y < target.alpha.Height(); ++y) {
    const uint8_t* row = target.alpha.Row(y).data();
    if (std::any_of(row, row + target.alpha.Width(), [](uint8_t alpha) { return alpha != 255; }))
      return;
  }
  target.alpha.Free();
}

// Without alpha, decodes directly into the picture's rows, which are stored bottom-up.
Status ReadOpaque(const WebpFile& file, const PictureRecord& picture, Canvas& target) {
  RETURN_IF_BAD(CheckFileMemory(target.image.Bytes().size() + DecoderBytes(file.frames[0])));
  WebPDecoderConfig config;
  if (WebPInitDecoderConfig(&config) == 0) return Status::MemoryAllocationError;
  config.output.colorspace = MODE_BGR;
  config.output.is_external_memory = 1;
  config.options.flip = 1;
  config.output.u.RGBA = {target.image.Rows().data(), static_cast<int>(target.image.Stride()),
                          target.image.Rows().size()};
  RETURN_IF_BAD(StatusOf(WebPDecode(file.frames[0].pixels.data(), file.frames[0].pixels.size(), &config)));
  for (int32_t y = 0; y < file.height; ++y) RETURN_IF_BAD(picture.ReportRow(y));
  return Status::Ok;
}

struct IncrementalDeleter {
  void operator()(WebPIDecoder* decoder) const { WebPIDelete(decoder); }
};

// Decodes the rows of a truncated still picture directly into the canvas. `rows`: how many.
Status ReadPart(const WebpFile& file, Canvas& target, int32_t& rows) {
  const WebpFrame& frame = file.frames[0];
  const size_t stride = 4 * static_cast<size_t>(frame.width);
  const size_t size = stride * static_cast<size_t>(frame.height);
  RETURN_IF_BAD(CheckFileMemory(target.image.Bytes().size() + target.alpha.Bytes().size() + size +
                                DecoderBytes(frame)));
  platform::MemoryBlock decoded;
  if (!decoded.Allocate(size)) return Status::MemoryAllocationError;
  const std::unique_ptr<WebPIDecoder, IncrementalDeleter> decoder(
      WebPINewRGB(MODE_BGRA, decoded.Data(), size, static_cast<int>(stride)));
  if (decoder == nullptr) return Status::MemoryAllocationError;
  const VP8StatusCode code = WebPIUpdate(decoder.get(), frame.pixels.data(), frame.pixels.size());
  if (code == VP8_STATUS_OUT_OF_MEMORY) return Status::MemoryAllocationError;
  int last = 0;
  if (WebPIDecGetRGB(decoder.get(), &last, nullptr, nullptr, nullptr) == nullptr) last = 0;
  rows = last;
  for (int32_t y = 0; y < rows; ++y) {
    const uint8_t* source = decoded.Data() + stride * static_cast<size_t>(y);
    uint8_t* colors = target.image.Row(y).data();
    uint8_t* alpha = target.alpha.Empty() ? nullptr : target.alpha.Row(y).data();
    for (int32_t x = 0; x < frame.width; ++x, source += 4, colors += 3) {
      std::memcpy(colors, source, 3);
      if (alpha != nullptr) alpha[x] = source[3];
    }
  }
  return StatusOf(code);
}

class WebpAnimation final : public Animation {
 public:
  Status Open(const std::string& fileName) {
    if (!view_.Open(fileName)) return Status::FileOpenError;
    RETURN_IF_BAD(ParseFile(view_.Bytes(), file_));
    for (const WebpFrame& frame : file_.frames) delays_.push_back(frame.duration);
    rounds_ = file_.loops;
    return CheckPackedSize(file_.width, file_.height, 24);
  }

 private:
  Status Compose(size_t frame) override {
    if (frame == 0) RETURN_IF_BAD(NewCanvas(file_.width, file_.height, canvas_));
    RETURN_IF_BAD(DrawFrame(file_, frame, canvas_));
    return view_.Intact() ? Status::Ok : Status::FileReadError;
  }

  platform::FileView view_;
  WebpFile file_;  // views into the file
};

}  // namespace

Status WebpInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView view;
  if (!view.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = view.FileSize();
  WebpFile file;
  RETURN_IF_BAD(ParseFile(view.Bytes(), file));
  Describe(file, picture);
  return Status::Ok;
}

Status WebpRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView view;
  if (!view.Open(request.fileName)) return Status::FileOpenError;
  WebpFile file;
  RETURN_IF_BAD(ParseFile(view.Bytes(), file));
  Describe(file, picture);
  if (request.page < 0 || request.page >= picture.pageCount) return Status::NoImages;
  const bool canvas = file.alpha || file.frames.size() > 1;
  Canvas target;
  // zeroed pages use no memory until the frame is drawn
  const uint64_t rows = PackedRowBytes(file.width, file.height, 24);
  RETURN_IF_BAD(CheckFileMemory(canvas ? rows + rows / 3 : rows));
  RETURN_IF_BAD(NewPackedImage(file.width, file.height, &picture.palette, 24, target.image));
  if (canvas) RETURN_IF_BAD(NewAlphaPlane(file.width, file.height, target.alpha));
  const Status status = canvas ? ReadWithAlpha(file, request.page + 1, picture, target)
                               : ReadOpaque(file, picture, target);
  if (request.partial && status != Status::Ok && file.frames.size() == 1) {
    int32_t shown = 0;
    const Status part = ReadPart(file, target, shown);
    RETURN_IF_BAD(TakePart(picture, request.partial, part == Status::Ok ? status : part, shown));
  } else {
    RETURN_IF_BAD(status);
  }
  if (!view.Intact()) return Status::FileReadError;
  if (canvas && !file.alpha) DropOpaqueAlpha(target);
  picture.image = std::move(target.image);
  picture.alpha = std::move(target.alpha);
  return Status::Ok;
}

Status WebpAnimate(const ReadRequest& request, AnimationPointer& animation) {
  auto opened = std::make_unique<WebpAnimation>();
  RETURN_IF_BAD(opened->Open(request.fileName));
  animation = std::move(opened);
  return Status::Ok;
}

}  // namespace fotomill
