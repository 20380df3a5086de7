#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Applications: an XMP packet, and a color profile.
inline constexpr std::string_view kGifXmp = "XMP DataXMP", kGifProfile = "ICCRGBG1012";
// Extensions that belong to the picture: texts drawn on it, timing, and how often it is repeated.
bool IsGifPictureExtension(uint8_t label, std::string_view application);
inline constexpr uint8_t kGifCommentLabel = 0xFE, kGifApplicationLabel = 0xFF;

// A block of a GIF file.
struct GifBlock {
  enum class Kind : uint8_t { Image, Extension } kind = Kind::Image;
  uint8_t label = 0;                  // of an extension
  std::string_view application = {};  // of an application extension, 11 characters
  std::span<const uint8_t> whole;     // all its bytes
  std::span<const uint8_t> data;      // of an extension: after label and application, to the end
};

// Iterates over the blocks of a GIF file, between the global palette and the trailer.
class GifWalk {
 public:
  explicit GifWalk(std::span<const uint8_t> file);
  // The next block; false at the trailer, or if the file is damaged or truncated.
  bool Next(GifBlock& block);
  // Where the first block begins; then, where the next one does.
  uint64_t Position() const { return next_; }
  // Ok once Next found the trailer, which ends at Position() + 1. DamagedFile, FileReadError.
  Status Outcome() const { return outcome_; }

 private:
  bool SkipParts(uint64_t& at) const;

  const std::span<const uint8_t> file_;
  uint64_t next_ = 0;
  Status outcome_ = Status::FileReadError;
};

// The packet in an XMP extension; empty if its end is not the usual one.
std::span<const uint8_t> GifXmpPacket(const GifBlock& block);
// The extension for a packet, which must have no zero bytes.
std::vector<uint8_t> MakeGifXmp(std::span<const uint8_t> packet);

}  // namespace fotomill
