// The writer of animated PNGs. Each frame is the part of the canvas that differs from the previous
// frame, stored without blending; its chunks come from the writer of still pictures, by way of a
// temporary file. The first frame is also the still picture shown by other programs. For the chunk
// layouts see png_frames.cpp.
#include <libdeflate.h>

#include <algorithm>
#include <array>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "containers/png_chunks.h"
#include "core/byte_writer.h"
#include "formats/png/png.h"
#include "picture/animation.h"
#include "platform/file_view.h"
#include "platform/temporary_file.h"
#include "processing/changed_area.h"

namespace fotomill {

namespace {

constexpr int32_t kMostTicks = UINT16_MAX;  // maximum delay
constexpr int32_t kThousandths = 1000, kSeconds = 1;

class ChunkData {
 public:
  explicit ChunkData(std::string_view type) : bytes_(type.begin(), type.end()) {}
  void Put(uint32_t value, int bytes) {
    for (int shift = 8 * bytes - 8; shift >= 0; shift -= 8)
      bytes_.push_back(static_cast<uint8_t>(value >> shift));
  }
  void Put(std::span<const uint8_t> data) { bytes_.insert(bytes_.end(), data.begin(), data.end()); }
  void Write(ByteWriter& out) const {
    const uint32_t crc = libdeflate_crc32(0, bytes_.data(), bytes_.size());
    PutBe32(out, static_cast<uint32_t>(bytes_.size() - 4));
    out.Bytes(bytes_);
    PutBe32(out, crc);
  }

 private:
  static void PutBe32(ByteWriter& out, uint32_t value) {
    for (int shift = 24; shift >= 0; shift -= 8) out.U8(static_cast<uint8_t>(value >> shift));
  }
  std::vector<uint8_t> bytes_;  // type and data
};

class PngSequence final : public SequenceWriter {
 public:
  PngSequence(const SequenceFacts& facts, const WriteOptions& options)
      : facts_(facts), options_(options) {}
  Status Create(const std::string& path) {
    return out_.Create(path) ? Status::Ok : Status::ErrorCreatingFile;
  }

  Status Add(PictureRecord& picture, int32_t delayMs) override {
    // all frames must have the same pixel format
    const bool first = screen_.image.Empty();
    Rectangle area;
    RETURN_IF_BAD(CutToChange(picture, 1, screen_, area));
    RETURN_IF_BAD(WriteFrame(picture, area, delayMs, first));
    ++done_;
    return out_.Failed() ? Status::ErrorWritingFile : Status::Ok;
  }

  Status Finish() override {
    if (done_ != facts_.count) return Status::UnsuitableImage;
    ChunkData("IEND").Write(out_);
    return CommitOutput(out_, options_);
  }

 private:
  Status WriteFrame(PictureRecord& picture, const Rectangle& area, int32_t delayMs, bool first) {
    platform::TemporaryFile working;
    if (!working.Create(".png")) return Status::ErrorCreatingFile;
    const PathText name = picture.fileName;
    picture.fileName.AssignCut(working.Path());
    WriteOptions plain{.encode = options_.encode};
    plain.keepMetadata = first && options_.keepMetadata;
    const Status status = PngWrite(picture, plain);
    picture.fileName = name;
    RETURN_IF_BAD(status);
    platform::FileView file;
    if (!file.Open(working.Path())) return Status::FileOpenError;
    PngChunks chunks(file.Bytes());
    if (first) out_.Text(kPngSignature);
    bool controlled = false;  // the frame's control chunk was written
    for (PngChunk chunk; chunks.Next(chunk);) {
      const bool pixels = chunk.type == "IDAT";
      if (pixels && !std::exchange(controlled, true)) WriteControl(area, delayMs);
      if (pixels && !first) {
        ChunkData data("fdAT");
        data.Put(sequence_++, 4);
        data.Put(chunk.data);
        data.Write(out_);
      } else if (pixels || (first && chunk.type != "IEND")) {
        ChunkData data(chunk.type);
        data.Put(chunk.data);
        data.Write(out_);
        if (chunk.type == "IHDR") WriteAnimation();
      }
    }
    return Status::Ok;
  }

  void WriteAnimation() {
    ChunkData chunk("acTL");
    chunk.Put(static_cast<uint32_t>(facts_.count), 4);
    chunk.Put(static_cast<uint32_t>(std::max(facts_.rounds, 0)), 4);
    chunk.Write(out_);
  }

  void WriteControl(const Rectangle& area, int32_t delayMs) {
    const int32_t delay = std::max(delayMs, 0);
    const bool fits = delay <= kMostTicks;
    ChunkData chunk("fcTL");
    chunk.Put(sequence_++, 4);
    for (const int32_t value : {area.width, area.height, area.x, area.y})
      chunk.Put(static_cast<uint32_t>(value), 4);
    chunk.Put(static_cast<uint32_t>(fits ? delay : std::min(delay / 1000, kMostTicks)), 2);
    chunk.Put(static_cast<uint32_t>(fits ? kThousandths : kSeconds), 2);
    chunk.Put(0, 2);  // disposal: keep, blending: replace
    chunk.Write(out_);
  }

  const SequenceFacts facts_;
  const WriteOptions options_;
  ByteWriter out_;
  Canvas screen_;  // after the frames written so far
  size_t done_ = 0;
  uint32_t sequence_ = 0;  // number of the next sequenced chunk
};

}  // namespace

Status PngSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence) {
  auto made = std::make_unique<PngSequence>(facts, options);
  RETURN_IF_BAD(made->Create(path));
  sequence = std::move(made);
  return Status::Ok;
}

}  // namespace fotomill
