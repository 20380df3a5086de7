#include "metadata/exif/exif_walk.h"

#include <algorithm>
#include <charconv>
#include <string>
#include <vector>

#include "core/limits.h"

namespace fotomill {

namespace {

constexpr size_t kLineExtra = 6;  // four spaces, a tab and the line end

// A short prefix and a number, without allocation.
class NumberedText {
 public:
  std::string_view Make(std::string_view before, uint32_t number, std::string_view after = {}) {
    char* end = std::copy(before.begin(), before.end(), characters_);
    end = std::to_chars(end, characters_ + sizeof characters_, number).ptr;
    end = std::copy(after.begin(), after.end(), end);
    return {characters_, static_cast<size_t>(end - characters_)};
  }

 private:
  char characters_[32];
};

class Walk {
 public:
  Walk(std::span<const uint8_t> block, ExifSink* sink, int32_t only)
      : block_(block), numbers_(OpenExifBytes(block)), sink_(sink), only_(only) {
    visited_.reserve(8);
  }

  bool Run(ExifFindings& findings) {
    if (numbers_.U16(2) != kExifMagic) return false;
    uint32_t offset = numbers_.U32(4);
    for (int32_t number = 0; !ended_; ++number) {
      const std::string_view label = NextLabel(number, offset, findings);
      if (label.empty() || !FirstVisit(offset)) break;
      const uint32_t count = numbers_.U16(offset);
      if (count < 1) break;
      listing_ = sink_ != nullptr && (only_ == kAllExifDirectories || only_ == number);
      if (listing_) sink_->Directory(number, label);
      offset = WalkDirectory(offset, count, findings);
    }
    findings.cutShort = ended_;
    return true;
  }

 private:
  // The label of the directory at `offset`. At the end of the chain, sets `offset` to the EXIF,
  // then the GPS directory; empty when done.
  std::string_view NextLabel(int32_t number, uint32_t& offset, const ExifFindings& findings) {
    if (offset != 0) return label_.Make("IFD ", static_cast<uint32_t>(number));
    if (findings.exifOffset != 0 && !exifWalked_) {
      exifWalked_ = true;
      offset = findings.exifOffset;
      return "EXIF";
    }
    if (findings.gpsOffset != 0 && !gpsWalked_) {
      gpsWalked_ = true;
      offset = findings.gpsOffset;
      return "GPS";
    }
    return {};
  }

  bool FirstVisit(uint32_t offset) {
    if (std::find(visited_.begin(), visited_.end(), offset) != visited_.end()) return false;
    ended_ = visited_.size() >= limits.exifDirectories;
    if (ended_) return false;
    visited_.push_back(offset);
    return true;
  }

  // Returns the offset of the next directory.
  uint32_t WalkDirectory(uint64_t offset, uint32_t count, ExifFindings& findings) {
    const uint64_t first = offset + kExifCountSize, end = first + count * kExifEntrySize;
    for (uint64_t entry = first; entry < std::min(end, numbers_.Size()) && !ended_;
         entry += kExifEntrySize) {
      if (entries_++ >= limits.exifEntries) {
        ended_ = true;
        break;
      }
      const ExifField field = ReadExifField(numbers_, entry);
      const ExifValue value = ReadExifValue(block_, numbers_, field);
      NotePointer(value, entry, findings);
      if (listing_) ListValue(value);
    }
    return numbers_.U32(end);
  }

  void NotePointer(const ExifValue& value, uint64_t entry, ExifFindings& findings) const {
    if (value.tag != kExifPointerTag && value.tag != kGpsPointerTag &&
        value.tag != kThumbnailOffsetTag && value.tag != kThumbnailSizeTag) {
      return;
    }
    // The 4-byte field itself, whatever type and count say; for a single SHORT, half of it.
    const bool half = value.type == kExifShort && value.count == 1;
    const uint32_t number = half ? value.bytes.U16(0) : numbers_.U32(entry + 8);
    switch (value.tag) {
      case kExifPointerTag:
        if (findings.exifOffset == 0) findings.exifOffset = number;
        break;
      case kGpsPointerTag:
        if (findings.gpsOffset == 0) findings.gpsOffset = number;
        break;
      case kThumbnailOffsetTag: findings.thumbnailOffset = number; break;
      default: findings.thumbnailSize = number;
    }
  }

  void ListValue(const ExifValue& value) {
    const ExifTag* row = FindExifTag(value.tag);
    const auto text = ExifValueText(value, row, buffer_);
    if (!text) return;
    const std::string_view name =
        row != nullptr ? row->name : unknown_.Make("Unknown (", value.tag, ")");
    textSize_ += name.size() + text->size() + kLineExtra;
    if (textSize_ > limits.exifTextBytes) {
      ended_ = true;
      return;
    }
    sink_->Line({value, name, *text});
  }

  std::span<const uint8_t> block_;
  ExifBytes numbers_;
  ExifSink* sink_;
  int32_t only_;
  std::vector<uint32_t> visited_;
  NumberedText label_, unknown_;
  std::string buffer_;     // of the current value
  uint64_t textSize_ = 0;  // of all lines so far
  uint32_t entries_ = 0;   // so far, of all directories
  bool listing_ = false;   // the current directory is listed
  bool exifWalked_ = false, gpsWalked_ = false;
  bool ended_ = false;  // a limit was reached
};

}  // namespace

bool WalkExif(std::span<const uint8_t> block, ExifSink* sink, ExifFindings* findings,
              int32_t only) {
  ExifFindings found;
  const bool valid = Walk(block, sink, only).Run(found);
  if (findings != nullptr) *findings = found;
  return valid;
}

std::span<const uint8_t> ExifThumbnail(std::span<const uint8_t> block,
                                       const ExifFindings& findings) {
  const uint64_t offset = findings.thumbnailOffset, size = findings.thumbnailSize;
  if (offset == 0 || offset > block.size() || size > block.size() - offset) return {};
  return block.subspan(offset, size);
}

}  // namespace fotomill
