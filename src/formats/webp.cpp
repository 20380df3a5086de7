// WebP, little-endian, pixels decoded and encoded by libwebp.
//
//   "RIFF", length, "WEBP", then chunks of name, length and data, padded to an even length:
//   "VP8 " lossy pixels, or "VP8L" lossless ones; or first of all
//   "VP8X" flags (1 byte: 2 animation, 4 XMP, 8 EXIF, 16 alpha, 32 ICC), 3 bytes 0, width - 1, height - 1 (3 bytes each)
//   "ICCP", "ANIM" background and loops, "ANMF" a frame, "ALPH" and "VP8 ", "EXIF", "XMP "
//   ANMF: x / 2, y / 2, width - 1, height - 1, duration (3 bytes each), flags, then the frame's ALPH, VP8 or VP8L chunk
//
// Everything becomes 24 bits, with an alpha plane where the file has alpha. Of an animation the first frame is shown in its
// place on the canvas, the rest of which is transparent. EXIF, XMP and ICC profile travel with the picture.
//
// The writer makes lossy files of quality WebPQualityFactor, or lossless ones with WebPLossless, which keep every value,
// also beneath transparent pixels.
// Source: RFC 9649 (2024).
#include "formats/webp.h"

#include <webp/decode.h>
#include <webp/encode.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string_view>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/limits.h"
#include "core/settings.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr uint8_t kXmpFlag = 4, kExifFlag = 8, kAlphaFlag = 16, kIccFlag = 32;
constexpr uint64_t kFileHead = 12, kFrameHead = 16;
constexpr std::string_view kExifHead("Exif\0\0", 6);  // some programs put it in front, as in JPEG

struct WebpFile {
  int32_t width = 0, height = 0;             // of the canvas
  int32_t left = 0, top = 0;                 // of the first frame on it
  int32_t frameWidth = 0, frameHeight = 0;
  int32_t frames = 0;                        // of an animation, else 0
  bool alpha = false;
  std::span<const uint8_t> pixels;           // what the library decodes: the whole file, or the first frame's chunks
  std::span<const uint8_t> icc, exif, xmp;
};

uint32_t Le24(ByteReader& bytes) {
  const uint32_t low = bytes.Le16();
  return low | static_cast<uint32_t>(bytes.U8()) << 16;
}

// What the library says of a stream of its own: chunks without the RIFF head, or a whole file.
Status StatusOf(VP8StatusCode code) {
  switch (code) {
    case VP8_STATUS_OK:
      return Status::Ok;
    case VP8_STATUS_OUT_OF_MEMORY:
      return Status::MemoryAllocationError;
    case VP8_STATUS_NOT_ENOUGH_DATA:
    case VP8_STATUS_SUSPENDED:
      return Status::FileReadError;
    case VP8_STATUS_UNSUPPORTED_FEATURE:
      return Status::UnsupportedFormat;
    default:
      return Status::DamagedFile;
  }
}

void TakeFrame(std::span<const uint8_t> chunk, WebpFile& file) {
  if (++file.frames > 1) return;
  ByteReader bytes(chunk);
  file.left = static_cast<int32_t>(2 * Le24(bytes));
  file.top = static_cast<int32_t>(2 * Le24(bytes));
  bytes.Skip(kFrameHead - 6);
  file.pixels = bytes.Take(bytes.Left());
}

// The chunks beside the pixels. A chunk that is cut short is taken as far as it goes: the library tells what is missing.
void WalkChunks(std::span<const uint8_t> data, WebpFile& file) {
  ByteReader bytes(data);
  bytes.Skip(kFileHead);
  while (bytes.Left() >= 8) {
    const auto name = bytes.Take(4);
    const uint64_t length = bytes.Le32();
    const auto chunk = bytes.Take(std::min<uint64_t>(length, bytes.Left()));
    const auto is = [&](const char* wanted) { return std::memcmp(name.data(), wanted, 4) == 0; };
    if (is("ANMF")) TakeFrame(chunk, file);
    if (is("ICCP")) file.icc = chunk;
    if (is("EXIF")) file.exif = chunk;
    if (is("XMP ")) file.xmp = chunk;
    bytes.Skip(std::min<uint64_t>(length % 2, bytes.Left()));
  }
}

Status ParseFile(std::span<const uint8_t> data, WebpFile& file) {
  if (data.size() < kFileHead) return Status::FileReadError;
  if (std::memcmp(data.data(), "RIFF", 4) != 0 || std::memcmp(data.data() + 8, "WEBP", 4) != 0) return Status::DamagedFile;
  WebPBitstreamFeatures features;
  RETURN_IF_BAD(StatusOf(WebPGetFeatures(data.data(), data.size(), &features)));
  file.width = file.frameWidth = features.width;
  file.height = file.frameHeight = features.height;
  file.alpha = features.has_alpha != 0;
  file.pixels = data;
  WalkChunks(data, file);
  if (features.has_animation == 0) {
    file.pixels = data;
    file.left = file.top = file.frames = 0;
    return Status::Ok;
  }
  if (file.frames == 0) return Status::FileReadError;
  RETURN_IF_BAD(StatusOf(WebPGetFeatures(file.pixels.data(), file.pixels.size(), &features)));
  file.frameWidth = features.width;
  file.frameHeight = features.height;
  const bool inside = int64_t{file.left} + features.width <= file.width && int64_t{file.top} + features.height <= file.height;
  if (!inside || features.has_animation != 0) return Status::DamagedFile;
  file.alpha = file.alpha || features.has_alpha != 0 || file.frameWidth < file.width || file.frameHeight < file.height;
  return Status::Ok;
}

void Assign(std::vector<uint8_t>& block, std::span<const uint8_t> data) {
  block.clear();
  if (data.size() <= limits.metadataBytes) block.assign(data.begin(), data.end());
}

void Describe(const WebpFile& file, PictureRecord& picture) {
  picture.typeName.AssignCut(file.frames > 1 ? "Animated WebP" : "WebP");
  picture.width = file.width;
  picture.height = file.height;
  picture.bitsPerPixel = 24;
  picture.alphaFlags = static_cast<uint8_t>((picture.alphaFlags & ~kHasAlpha) | (file.alpha ? kHasAlpha : 0));
  picture.imageBytes = EstimateImageBytes(file.width, file.height, 24);
  MakeDefaultPalette(&picture.palette, nullptr, kDisplayPalette);
  picture.metadata = {};
  const bool headed = file.exif.size() >= kExifHead.size() && std::memcmp(file.exif.data(), kExifHead.data(), kExifHead.size()) == 0;
  Assign(picture.metadata.exif, headed ? file.exif.subspan(kExifHead.size()) : file.exif);
  Assign(picture.metadata.xmp, file.xmp);
  Assign(picture.metadata.icc, file.icc);
}

struct WebpTarget {
  PackedImage image, alpha;
};

// With alpha, the frame is decoded to four bytes a pixel and put in its place.
Status ReadWithAlpha(const WebpFile& file, const PictureRecord& picture, WebpTarget& target) {
  const size_t stride = 4 * static_cast<size_t>(file.frameWidth);
  platform::MemoryBlock frame;
  if (!frame.Allocate(stride * static_cast<size_t>(file.frameHeight), platform::Fill::Unset)) return Status::MemoryAllocationError;
  WebPDecoderConfig config;
  if (WebPInitDecoderConfig(&config) == 0) return Status::MemoryAllocationError;
  config.output.colorspace = MODE_BGRA;
  config.output.is_external_memory = 1;
  config.output.u.RGBA = {frame.Data(), static_cast<int>(stride), frame.Size()};
  RETURN_IF_BAD(StatusOf(WebPDecode(file.pixels.data(), file.pixels.size(), &config)));
  for (int32_t y = 0; y < file.frameHeight; ++y) {
    const uint8_t* source = frame.Data() + stride * static_cast<size_t>(y);
    uint8_t* color = target.image.Row(file.top + y).data() + 3 * static_cast<size_t>(file.left);
    uint8_t* alpha = target.alpha.Row(file.top + y).data() + file.left;
    for (int32_t x = 0; x < file.frameWidth; ++x, source += 4, color += 3) {
      std::memcpy(color, source, 3);
      alpha[x] = source[3];
    }
    picture.ReportRow(file.top + y);
  }
  return Status::Ok;
}

// Without alpha the library fills the picture's own rows, which are stored bottom row first.
Status ReadOpaque(const WebpFile& file, const PictureRecord& picture, WebpTarget& target) {
  WebPDecoderConfig config;
  if (WebPInitDecoderConfig(&config) == 0) return Status::MemoryAllocationError;
  config.output.colorspace = MODE_BGR;
  config.output.is_external_memory = 1;
  config.options.flip = 1;
  config.output.u.RGBA = {target.image.Rows().data(), static_cast<int>(target.image.Stride()), target.image.Rows().size()};
  RETURN_IF_BAD(StatusOf(WebPDecode(file.pixels.data(), file.pixels.size(), &config)));
  for (int32_t y = 0; y < file.height; ++y) picture.ReportRow(y);
  return Status::Ok;
}

struct PictureDeleter {
  void operator()(WebPPicture* picture) const { WebPPictureFree(picture); }
};

// The colour of each pixel as blue, green, red, alpha.
void FillRow(const PictureRecord& picture, int32_t y, uint32_t* target) {
  const PackedImage& image = picture.image;
  const uint8_t* row = image.Row(y).data();
  const bool color = image.Bits() == 24;
  const auto table = image.ColorTable();
  for (int32_t x = 0; x < image.Width(); ++x, ++target) {
    const uint8_t* pixel = color ? row + 3 * static_cast<size_t>(x) : &table[4 * static_cast<size_t>(image.PixelAt(x, y))];
    const uint32_t alpha = picture.alpha.Empty() ? 255 : picture.alpha.Row(y)[static_cast<size_t>(x)];
    *target = alpha << 24 | static_cast<uint32_t>(pixel[2] << 16 | pixel[1] << 8 | pixel[0]);
  }
}

Status Encode(const PictureRecord& picture, WebPMemoryWriter& encoded) {
  WebPConfig config;
  WebPPicture source;
  const bool lossless = settings.WebPLossless != 0;
  const auto quality = static_cast<float>(std::clamp<int32_t>(settings.WebPQualityFactor, 0, 100));
  if (WebPConfigPreset(&config, WEBP_PRESET_DEFAULT, quality) == 0 || WebPPictureInit(&source) == 0) return Status::ResourceError;
  config.lossless = lossless ? 1 : 0;
  config.exact = lossless ? 1 : 0;
  source.use_argb = 1;
  source.width = picture.image.Width();
  source.height = picture.image.Height();
  source.writer = WebPMemoryWrite;
  source.custom_ptr = &encoded;
  if (WebPPictureAlloc(&source) == 0) return Status::MemoryAllocationError;
  const std::unique_ptr<WebPPicture, PictureDeleter> owner(&source);
  for (int32_t y = 0; y < source.height; ++y) {
    FillRow(picture, y, source.argb + static_cast<ptrdiff_t>(source.argb_stride) * y);
    picture.ReportRow(y);
  }
  if (WebPEncode(&config, &source) != 0) return Status::Ok;
  const bool memory = source.error_code == VP8_ENC_ERROR_OUT_OF_MEMORY || source.error_code == VP8_ENC_ERROR_BITSTREAM_OUT_OF_MEMORY;
  return memory ? Status::MemoryAllocationError : Status::ErrorWritingFile;
}

void WriteChunk(ByteWriter& out, std::string_view name, std::span<const uint8_t> data) {
  if (data.empty()) return;
  out.Text(name);
  out.Le32(static_cast<uint32_t>(data.size()));
  out.Bytes(data);
  out.Zeros(data.size() % 2);
}

uint64_t ChunkBytes(uint64_t data) { return data == 0 ? 0 : 8 + data + data % 2; }

// The encoder's file, with the chunks of metadata around its pixels where there are any.
void WriteFile(ByteWriter& out, const PictureRecord& picture, std::span<const uint8_t> encoded) {
  const PictureMetadata& metadata = picture.metadata;
  const auto pixels = encoded.subspan(kFileHead);
  const bool extended = pixels.size() >= 18 && std::memcmp(pixels.data(), "VP8X", 4) == 0;  // lossy with alpha
  const auto chunks = extended ? pixels.subspan(18) : pixels;
  const uint64_t length = 4 + 18 + chunks.size() + ChunkBytes(metadata.icc.size()) + ChunkBytes(metadata.exif.size()) +
                          ChunkBytes(metadata.xmp.size());
  const auto side = [](int32_t value) { return static_cast<uint32_t>(value - 1); };
  out.Text("RIFF");
  out.Le32(static_cast<uint32_t>(length));
  out.Text("WEBPVP8X");
  out.Le32(10);
  out.Le32((metadata.icc.empty() ? 0u : kIccFlag) | (metadata.exif.empty() ? 0u : kExifFlag) |
           (metadata.xmp.empty() ? 0u : kXmpFlag) | (picture.alpha.Empty() ? 0u : kAlphaFlag));
  for (const uint32_t value : {side(picture.image.Width()), side(picture.image.Height())}) {
    out.Le16(static_cast<uint16_t>(value));
    out.U8(static_cast<uint8_t>(value >> 16));
  }
  WriteChunk(out, "ICCP", metadata.icc);
  out.Bytes(chunks);
  WriteChunk(out, "EXIF", metadata.exif);
  WriteChunk(out, "XMP ", metadata.xmp);
}

struct EncodedFile {
  EncodedFile() { WebPMemoryWriterInit(&writer); }
  ~EncodedFile() { WebPMemoryWriterClear(&writer); }
  EncodedFile(const EncodedFile&) = delete;
  EncodedFile& operator=(const EncodedFile&) = delete;
  WebPMemoryWriter writer;
};

}  // namespace

Status WebpInfo(PictureRecord& picture, const char* fileName, uint32_t) {
  picture.typeName.Clear();
  platform::FileView view;
  if (!view.Open(fileName)) return Status::FileOpenError;
  picture.fileSize = view.FileSize();
  WebpFile file;
  RETURN_IF_BAD(ParseFile(view.Bytes(), file));
  Describe(file, picture);
  return Status::Ok;
}

Status WebpRead(PictureRecord& picture, const char* fileName) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView view;
  if (!view.Open(fileName)) return Status::FileOpenError;
  WebpFile file;
  RETURN_IF_BAD(ParseFile(view.Bytes(), file));
  Describe(file, picture);
  WebpTarget target;
  RETURN_IF_BAD(NewPackedImage(file.width, file.height, &picture.palette, 24, target.image));
  if (file.alpha) RETURN_IF_BAD(NewAlphaPlane(file.width, file.height, target.alpha));
  RETURN_IF_BAD(file.alpha ? ReadWithAlpha(file, picture, target) : ReadOpaque(file, picture, target));
  if (!view.Intact()) return Status::FileReadError;
  picture.image = std::move(target.image);
  picture.alpha = std::move(target.alpha);
  return Status::Ok;
}

Status WebpWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  if (picture.image.Width() > WEBP_MAX_DIMENSION || picture.image.Height() > WEBP_MAX_DIMENSION) return Status::UnsuitableImage;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  EncodedFile encoded;
  RETURN_IF_BAD(Encode(picture, encoded.writer));
  const std::span<const uint8_t> bytes(encoded.writer.mem, encoded.writer.size);
  const bool keep = options.keepMetadata && settings.PreserveEXIF != 0 && !picture.metadata.Empty();
  if (keep && bytes.size() > kFileHead) {
    WriteFile(out, picture, bytes);
  } else {
    out.Bytes(bytes);
  }
  return CommitOutput(out, options);
}

}  // namespace fotomill
