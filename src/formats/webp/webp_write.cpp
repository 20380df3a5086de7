// The WebP writer: still pictures, and animations whose frames are the part of the canvas that
// differs from the previous frame, stored without blending.
#include <webp/encode.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string_view>
#include <utility>
#include <vector>

#include "containers/riff_chunks.h"
#include "core/byte_writer.h"
#include "formats/webp/webp.h"
#include "picture/animation.h"
#include "processing/changed_area.h"

namespace fotomill {

namespace {

constexpr uint8_t kAnimationFlag = 2, kXmpFlag = 4, kExifFlag = 8, kAlphaFlag = 16, kIccFlag = 32;
constexpr uint8_t kReplace = 2;  // frame flag: no blending
constexpr int32_t kLongestDelay = (1 << 24) - 1;
constexpr size_t kExtendedSize = 18;  // of the chunk VP8X

struct PictureDeleter {
  void operator()(WebPPicture* picture) const { WebPPictureFree(picture); }
};

// The pixels of a row as blue, green, red, alpha.
void FillRow(const PictureRecord& picture, int32_t y, uint32_t* target) {
  const PackedImage& image = picture.image;
  const uint8_t* row = image.Row(y).data();
  const bool color = image.Bits() == 24;
  const auto table = image.ColorTable();
  for (int32_t x = 0; x < image.Width(); ++x, ++target) {
    const uint8_t* pixel = color ? row + 3 * static_cast<size_t>(x)
                                 : &table[4 * static_cast<size_t>(image.PixelAt(x, y))];
    const uint32_t alpha =
        picture.alpha.Empty() ? 255 : picture.alpha.Row(y)[static_cast<size_t>(x)];
    *target = alpha << 24 | static_cast<uint32_t>(pixel[2] << 16 | pixel[1] << 8 | pixel[0]);
  }
}

// Maximum encoder memory per pixel, measured with noise, the worst case.
constexpr uint64_t kLosslessBytes = 32, kLossyBytes = 17, kLossyLeastBytes = 8;

// Rejects pictures that need too much memory. Lossy encoding has a slower mode that needs less.
Status ChooseMemory(const PictureRecord& picture, WebPConfig& config) {
  const uint64_t pixels =
      static_cast<uint64_t>(picture.image.Width()) * static_cast<uint64_t>(picture.image.Height());
  const uint64_t held = picture.image.Bytes().size() + picture.alpha.Bytes().size();
  if (config.lossless != 0) return CheckFileMemory(held + kLosslessBytes * pixels);
  config.low_memory = CheckFileMemory(held + kLossyBytes * pixels) == Status::Ok ? 0 : 1;
  return CheckFileMemory(held + kLossyLeastBytes * pixels);
}

Status Encode(const PictureRecord& picture, bool lossless, int32_t factor,
              WebPMemoryWriter& encoded) {
  WebPConfig config;
  WebPPicture source;
  const auto quality = static_cast<float>(std::clamp<int32_t>(factor, 0, 100));
  if (WebPConfigPreset(&config, WEBP_PRESET_DEFAULT, quality) == 0 || WebPPictureInit(&source) == 0)
    return Status::ResourceError;
  config.lossless = lossless ? 1 : 0;
  config.exact = lossless ? 1 : 0;
  RETURN_IF_BAD(ChooseMemory(picture, config));
  source.use_argb = 1;
  source.width = picture.image.Width();
  source.height = picture.image.Height();
  source.writer = WebPMemoryWrite;
  source.custom_ptr = &encoded;
  source.user_data = const_cast<PictureRecord*>(&picture);
  source.progress_hook = [](int, const WebPPicture* asked) {
    return static_cast<const PictureRecord*>(asked->user_data)->stop.Asked() ? 0 : 1;
  };
  if (WebPPictureAlloc(&source) == 0) return Status::MemoryAllocationError;
  const std::unique_ptr<WebPPicture, PictureDeleter> owner(&source);
  for (int32_t y = 0; y < source.height; ++y) {
    FillRow(picture, y, source.argb + static_cast<ptrdiff_t>(source.argb_stride) * y);
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  if (WebPEncode(&config, &source) != 0) return Status::Ok;
  if (source.error_code == VP8_ENC_ERROR_USER_ABORT) return Status::FunctionCancelled;
  const bool memory = source.error_code == VP8_ENC_ERROR_OUT_OF_MEMORY ||
                      source.error_code == VP8_ENC_ERROR_BITSTREAM_OUT_OF_MEMORY;
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

// The pixel chunks of an encoded picture.
std::span<const uint8_t> PixelChunks(std::span<const uint8_t> encoded) {
  const auto chunks = encoded.subspan(std::min<size_t>(kRiffHead, encoded.size()));
  const bool extended =
      chunks.size() >= kExtendedSize && std::memcmp(chunks.data(), "VP8X", 4) == 0;
  return extended ? chunks.subspan(kExtendedSize) : chunks;
}

// Writes the encoder's file, adding metadata chunks if there are any.
void WriteFile(ByteWriter& out, const PictureRecord& picture, const PictureMetadata& metadata,
               std::span<const uint8_t> encoded) {
  const auto chunks = PixelChunks(encoded);
  const uint64_t length = 4 + 18 + chunks.size() + ChunkBytes(metadata.icc.size()) +
                          ChunkBytes(metadata.exif.size()) + ChunkBytes(metadata.xmp.size());
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

void Put24(ByteWriter& out, int32_t value) {
  out.Le16(static_cast<uint16_t>(value));
  out.U8(static_cast<uint8_t>(value >> 16));
}

class WebpSequence final : public SequenceWriter {
 public:
  WebpSequence(const SequenceFacts& facts, const WriteOptions& options)
      : facts_(facts), options_(options) {}
  Status Create(const std::string& path) {
    return out_.Create(path) ? Status::Ok : Status::ErrorCreatingFile;
  }

  Status Add(PictureRecord& picture, int32_t delayMs) override {
    if (screen_.image.Empty()) Begin(picture);
    Rectangle area;
    RETURN_IF_BAD(CutToChange(picture, 2, screen_, area));  // offsets are stored divided by two
    RETURN_IF_BAD(WriteFrame(picture, area, std::clamp(delayMs, 0, kLongestDelay)));
    return out_.Failed() ? Status::ErrorWritingFile : Status::Ok;
  }

  Status Finish() override {
    if (screen_.image.Empty()) return Status::EmptyImage;
    WriteChunk(out_, "EXIF", metadata_.exif);
    WriteChunk(out_, "XMP ", metadata_.xmp);
    if (out_.Position() - 8 > UINT32_MAX) return Status::UnsuitableImage;
    out_.PatchLe32(4, static_cast<uint32_t>(out_.Position() - 8));
    return CommitOutput(out_, options_);
  }

 private:
  void Begin(const PictureRecord& picture) {
    if (options_.KeepsMetadata()) metadata_ = picture.metadata;
    metadata_.icc = picture.metadata.icc;
    out_.Text("RIFF");
    out_.Le32(0);  // the size, patched later
    out_.Text("WEBPVP8X");
    out_.Le32(10);
    out_.Le32(kAnimationFlag | kAlphaFlag | (metadata_.icc.empty() ? 0u : kIccFlag) |
              (metadata_.exif.empty() ? 0u : kExifFlag) | (metadata_.xmp.empty() ? 0u : kXmpFlag));
    Put24(out_, picture.image.Width() - 1);
    Put24(out_, picture.image.Height() - 1);
    WriteChunk(out_, "ICCP", metadata_.icc);
    out_.Text("ANIM");
    out_.Le32(6);
    out_.Le32(0);  // transparent background
    out_.Le16(static_cast<uint16_t>(std::clamp(facts_.rounds, 0, int32_t{UINT16_MAX})));
  }

  Status WriteFrame(const PictureRecord& picture, const Rectangle& area, int32_t delay) {
    EncodedFile encoded;
    const bool lossless = options_.lossless || options_.encode.webpLossless;
    RETURN_IF_BAD(Encode(picture, lossless, options_.encode.webpQuality, encoded.writer));
    const auto chunks = PixelChunks({encoded.writer.mem, encoded.writer.size});
    out_.Text("ANMF");
    out_.Le32(static_cast<uint32_t>(16 + chunks.size()));
    for (const int32_t value : {area.x / 2, area.y / 2, area.width - 1, area.height - 1, delay})
      Put24(out_, value);
    out_.U8(kReplace);
    out_.Bytes(chunks);
    return Status::Ok;
  }

  const SequenceFacts facts_;
  const WriteOptions options_;
  ByteWriter out_;
  PictureMetadata metadata_;  // of the first picture
  Canvas screen_;             // after the frames written so far
};

}  // namespace

Status WebpWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;
  const bool lossless = options.lossless || options.encode.webpLossless;
  EncodedFile encoded, other;
  const int32_t quality = options.encode.webpQuality;
  RETURN_IF_BAD(Encode(picture, lossless, quality, encoded.writer));
  if (!options.lossless && options.encode.webpMixed) {
    const Status status = Encode(picture, !lossless, quality, other.writer);
    if (status != Status::Ok && status != Status::MemoryAllocationError) return status;
  }
  const bool useOther = other.writer.size > 0 && other.writer.size < encoded.writer.size;
  const WebPMemoryWriter& chosen = useOther ? other.writer : encoded.writer;
  const std::span<const uint8_t> bytes(chosen.mem, chosen.size);
  // the profile is always kept
  PictureMetadata kept;
  if (options.KeepsMetadata()) kept = picture.metadata;
  kept.icc = picture.metadata.icc;
  if (!kept.Empty() && bytes.size() > kRiffHead) {
    WriteFile(out, picture, kept, bytes);
  } else {
    out.Bytes(bytes);
  }
  return CommitOutput(out, options);
}

Status WebpSequenceBegin(const std::string& path, const SequenceFacts& facts,
                         const WriteOptions& options, SequencePointer& sequence) {
  auto made = std::make_unique<WebpSequence>(facts, options);
  RETURN_IF_BAD(made->Create(path));
  sequence = std::move(made);
  return Status::Ok;
}

}  // namespace fotomill
