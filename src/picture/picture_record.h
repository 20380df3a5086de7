#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <string_view>
#include <vector>

#include "core/fixed_text.h"
#include "core/progress.h"
#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/packed_image.h"
#include "picture/palette.h"
#include "platform/memory.h"

namespace fotomill {

// A picture without a registry row.
inline constexpr int32_t kNoFormat = -1;

// Bits of PictureRecord::alphaFlags.
// the picture has alpha; set by `info` if the file has more than 24 bits per pixel
inline constexpr uint8_t kHasAlpha = 1;
inline constexpr uint8_t kFlattenOnBackground = 2;  // flatten onto the record's background

// Bits of PictureRecord::lostMetadata. Rewriting EXIF breaks a maker note, as its private offsets
// are no longer valid.
inline constexpr uint8_t kLostExif = 1, kLostXmp = 2, kLostIcc = 4, kLostComment = 8,
                         kLostMakerNote = 16, kLostGrayIcc = 32;  // a grayscale profile

// Bits of PictureRecord::unread: contents of the file that no record can hold.
inline constexpr uint8_t kUnreadDepth = 1;  // more than 8 bits per sample
inline constexpr uint8_t kUnreadInks = 2;   // colors other than RGB, or extra channels
inline constexpr uint8_t kUnreadIptc = 4;   // captions and keywords (IPTC)
inline constexpr uint8_t kUnreadTexts = 8;  // comments after the first
inline constexpr uint8_t kUnreadLayers = 16;  // layers that were merged

// Quantization and sampling of a JPEG file; formats/jpeg/jpeg_coding.h.
struct JpegCoding;

// Technical details for "Get info": lines of at most 36 characters.
class DetailLines {
 public:
  static constexpr size_t kMostCharacters = 36;
  // Adds a line, truncated to 36 characters.
  void Add(std::string_view line) { lines_.emplace_back(line); }
  // As Add, with a printf format.
  [[gnu::format(printf, 2, 3)]] void AddFormat(const char* format, ...);
  void Clear() { lines_.clear(); }
  size_t Count() const { return lines_.size(); }
  std::string_view Line(size_t index) const { return lines_[index].view(); }

 private:
  std::vector<FixedText<kMostCharacters>> lines_;
};

// Metadata of a picture, each block in its
// standard layout; empty if there is none.
struct PictureMetadata {
  // a TIFF structure starting at the byte order, without "Exif\0\0"
  std::vector<uint8_t> exif;
  std::vector<uint8_t> xmp;   // an XMP packet
  std::vector<uint8_t> icc;   // an ICC profile
  double dpiX = 0, dpiY = 0;  // pixels per inch, 0 if unknown
  // No block; ignores the resolution.
  bool Empty() const { return exif.empty() && xmp.empty() && icc.empty(); }
};

// The in-memory form of a picture. `info` fills the header fields, `read` the pixels; writers
// and viewers consume both. The record owns everything in it. If `read` fails, `image` and
// `alpha` stay empty.
struct PictureRecord {
  PathText fileName;               // the file being read or written
  PathText workName;               // while writing: the previous `fileName`
  FixedText<64> typeName;          // the variant found by `info`, such as "OS/2 bitmap"
  int32_t width = 0;               // pixels
  int32_t height = 0;              // rows
  int32_t bitsPerPixel = 0;        // 1 to 8, or 24
  platform::MemoryBlock metafile;  // data of a vector format
  platform::MemoryBlock extraBlock;
  uint8_t metafileKind = 0;        // 128 or more: `metafile` is an enhanced metafile
  // alpha is flattened onto this unless the record has its own background
  Color defaultColour = 0xffffff;
  uint64_t fileSize = 0;           // bytes, set by `info`
  uint64_t imageBytes = 0;         // estimate of the pixel data
  Palette palette{};
  void* window = nullptr;            // the window that requested the picture; not owned
  PackedImage image;                 // empty until `read` succeeds
  int32_t formatIndex = kNoFormat;   // row of the registry
  void* context = nullptr;           // the job that requested the picture; not owned
  std::array<uint8_t, 256> remap{};  // color translation table, initially the identity
  DetailLines detailLines;
  platform::MemoryBlock auxBlock;
  platform::MemoryBlock extraBlock2;
  PackedImage alpha;       // empty if the picture has none
  Color background = 0;    // the record's own background
  uint8_t alphaFlags = 0;  // kHasAlpha, kFlattenOnBackground

  PictureMetadata metadata;
  uint8_t lostMetadata = 0;            // kLost bits: metadata that the last `write` could not store
  uint8_t unread = 0;                  // kUnread bits, by `info`
  std::vector<uint8_t> comment;        // the file's comment text, UTF-8
  // an error in the file that the decoder tolerated; empty if none
  FixedText<80> warning;
  // a remark by the decoder about a valid file; empty if none
  FixedText<80> note;
  int32_t pageCount = 1;               // pages or frames in the file
  int32_t page = 0;                    // the selected one, from 0
  // by `info`: data that would be lost on rewriting, such as more than 8 bits or extra channels
  bool simplified = false;
  // Ok, or why `image` is incomplete; only if the request allowed a partial picture
  Status shortfall = Status::Ok;
  std::shared_ptr<const JpegCoding> jpegCoding;  // of pictures from JPEG files, else null
  int32_t hotSpotX = 0, hotSpotY = 0;  // of a cursor, in pixels from the top left
  int32_t reduction =
      1;  // scale of a picture decoded at reduced size: pixels per pixel of `image` along each
          // edge; the last column and row may cover fewer
  ProgressSink* progress = nullptr;    // of the current operation; not owned, may be null

  StopToken stop;                      // of the current operation

  // Reports the rows done so far. FunctionCancelled (4) if the operation is to be canceled; codecs
  // return it.
  Status ReportRow(int32_t done) const { return ReportRow(done, height); }
  Status ReportRow(int32_t done, int32_t total) const {
    if (progress != nullptr) progress->Step(done, total);
    return stop.Asked() ? Status::FunctionCancelled : Status::Ok;
  }
};

using PicturePointer = std::unique_ptr<PictureRecord>;  // owns the record and its contents

// A new record with default values: format -1, identity `remap`. Null if memory runs out.
PicturePointer NewPictureRecord(Color defaultColour = 0xffffff, void* window = nullptr,
                                void* context = nullptr);

// The usual estimate of the pixel data size: ((width + 7) / 8) x bits x height.
constexpr uint64_t EstimateImageBytes(int32_t width, int32_t height, int32_t bitsPerPixel) {
  return (static_cast<uint64_t>(width) + 7) / 8 * static_cast<uint64_t>(bitsPerPixel) *
         static_cast<uint64_t>(height);
}

// Begins and ends progress reporting for one operation on a picture.
class ProgressScope {
 public:
  // The picture must outlive it.
  explicit ProgressScope(const PictureRecord& picture) : sink_(picture.progress) {
    if (sink_ != nullptr) sink_->Begin();
  }
  ~ProgressScope() {
    if (sink_ != nullptr) sink_->End();
  }
  ProgressScope(const ProgressScope&) = delete;
  ProgressScope& operator=(const ProgressScope&) = delete;

 private:
  ProgressSink* sink_;
};

}  // namespace fotomill
