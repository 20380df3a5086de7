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

// A picture without a row in the registry.
inline constexpr int32_t kNoFormat = -1;

// Bits of PictureRecord::alphaFlags.
// the picture has alpha; set by `info` for sources deeper than 24 bits
inline constexpr uint8_t kHasAlpha = 1;
inline constexpr uint8_t kFlattenOnBackground = 2;  // flatten onto the record's own background

// Bits of PictureRecord::lostMetadata. A maker note is lost where EXIF is laid out anew: what it
// points to in its own way is not found any more.
inline constexpr uint8_t kLostExif = 1, kLostXmp = 2, kLostIcc = 4, kLostComment = 8,
                         kLostMakerNote = 16, kLostGrayIcc = 32;  // a profile of grays

// Bits of PictureRecord::unread: what the file holds and no record can.
inline constexpr uint8_t kUnreadDepth = 1;  // samples of more than 8 bits
inline constexpr uint8_t kUnreadInks = 2;   // other colors than red, green, blue; further channels
inline constexpr uint8_t kUnreadIptc = 4;   // captions and keywords of news agencies
inline constexpr uint8_t kUnreadTexts = 8;  // comments beyond the first one
inline constexpr uint8_t kUnreadLayers = 16;  // layers that were merged

// How a JPEG file quantized its colors; formats/jpeg/jpeg_coding.h.
struct JpegCoding;

// Technical facts of a file for "Get info": lines of at most 36 characters.
class DetailLines {
 public:
  static constexpr size_t kMostCharacters = 36;
  // Adds a line, cut to 36 characters.
  void Add(std::string_view line) { lines_.emplace_back(line); }
  // Adds a line made by a printf format, cut the same way.
  [[gnu::format(printf, 2, 3)]] void AddFormat(const char* format, ...);
  void Clear() { lines_.clear(); }
  size_t Count() const { return lines_.size(); }
  std::string_view Line(size_t index) const { return lines_[index].view(); }

 private:
  std::vector<FixedText<kMostCharacters>> lines_;
};

// What travels with a picture beside its pixels, each block as its standard lays it out; empty when
// there is none.
struct PictureMetadata {
  // a TIFF structure from its byte order on, without any "Exif\0\0" in front
  std::vector<uint8_t> exif;
  std::vector<uint8_t> xmp;   // an XMP packet
  std::vector<uint8_t> icc;   // an ICC profile
  double dpiX = 0, dpiY = 0;  // pixels per inch, 0 when the file does not say
  // No block; the resolution does not count.
  bool Empty() const { return exif.empty() && xmp.empty() && icc.empty(); }
};

// The one in-memory form of a picture. `info` fills the facts, `read` the pixels; a writer or a
// viewer consumes both. The record owns everything in it. On any failure of `read`, `image` and
// `alpha` stay empty.
struct PictureRecord {
  PathText fileName;               // the file being read or written
  PathText workName;               // while writing: the name that `fileName` held before
  FixedText<64> typeName;          // the variant that `info` found, such as "OS/2 bitmap"
  int32_t width = 0;               // pixels
  int32_t height = 0;              // rows
  int32_t bitsPerPixel = 0;        // 1 to 8, or 24
  platform::MemoryBlock metafile;  // the picture of a rendered format
  platform::MemoryBlock extraBlock;
  uint8_t metafileKind = 0;        // 128 or more: `metafile` is an enhanced one
  // what alpha is flattened onto unless the record has its own background
  Color defaultColour = 0xffffff;
  uint64_t fileSize = 0;           // bytes, measured by `info`
  uint64_t imageBytes = 0;         // estimate of the pixel data
  Palette palette{};
  void* window = nullptr;            // the face's window for which the record was made; not owned
  PackedImage image;                 // empty until `read` succeeds
  int32_t formatIndex = kNoFormat;   // row of the registry
  void* context = nullptr;           // the job that asked for the picture; not owned
  std::array<uint8_t, 256> remap{};  // color translation, the identity at first
  DetailLines detailLines;
  platform::MemoryBlock auxBlock;
  platform::MemoryBlock extraBlock2;
  PackedImage alpha;       // empty when the picture has none
  Color background = 0;    // the record's own background
  uint8_t alphaFlags = 0;  // kHasAlpha, kFlattenOnBackground

  PictureMetadata metadata;
  uint8_t lostMetadata = 0;            // kLost bits: what the last `write` could not keep
  uint8_t unread = 0;                  // kUnread bits, by `info`
  std::vector<uint8_t> comment;        // the file's comment text, UTF-8
  // a fault in the file that the decoder passed over; empty when there was none
  FixedText<80> warning;
  // what the decoder remarks about a file that is whole; empty if nothing
  FixedText<80> note;
  int32_t pageCount = 1;               // pages or frames in the file
  int32_t page = 0;                    // which of them this is, from 0
  // by `info`: the file holds what a new one would not, deeper samples or further inks
  bool simplified = false;
  // Ok, or why `image` shows only a part of the picture; only where the request took one
  Status shortfall = Status::Ok;
  std::shared_ptr<const JpegCoding> jpegCoding;  // of pictures from JPEG files; else null
  int32_t hotSpotX = 0, hotSpotY = 0;  // of a cursor, pixels from the left and the top
  int32_t reduction =
      1;  // of a picture decoded smaller than it is: how many pixels along each edge one of `image`
          // stands for; the last column and row may stand for fewer
  ProgressSink* progress = nullptr;    // of the operation in work; not owned, may be null

  StopToken stop;                      // of the operation in work

  // Tells how many rows are done. FunctionCancelled (4) when the operation is to end: codecs return
  // it.
  Status ReportRow(int32_t done) const { return ReportRow(done, height); }
  Status ReportRow(int32_t done, int32_t total) const {
    if (progress != nullptr) progress->Step(done, total);
    return stop.Asked() ? Status::FunctionCancelled : Status::Ok;
  }
};

using PicturePointer = std::unique_ptr<PictureRecord>;  // owns the record and all that is in it

// A new record with its defaults set: format -1, identity `remap`. Null without memory.
PicturePointer NewPictureRecord(Color defaultColour = 0xffffff, void* window = nullptr,
                                void* context = nullptr);

// The usual estimate of a picture's pixel data: ((width + 7) / 8) x bits x height.
constexpr uint64_t EstimateImageBytes(int32_t width, int32_t height, int32_t bitsPerPixel) {
  return (static_cast<uint64_t>(width) + 7) / 8 * static_cast<uint64_t>(bitsPerPixel) *
         static_cast<uint64_t>(height);
}

// Begins and ends the progress of one operation on a picture.
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
