// Source: ITU-T T.81 (1992), annex B; CIPA DC-008-2012, section 4.7; XMP specification part 3,
// section 1.1.3; CIPA DC-007-2009, section 5.2.
#include <algorithm>
#include <cstring>

#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint8_t kApp0 = 0xE0, kApp1 = 0xE1, kApp2 = 0xE2, kApp13 = 0xED;
constexpr std::string_view kMpf("MPF\0", 4), kExifName("Exif", 4);

// As lenient as readers: the two bytes after the name are ignored.
bool IsExif(const JpegSegment& segment) {
  return segment.marker == kApp1 && segment.data.size() >= kExifHead.size() &&
         segment.Starts(kExifName);
}
bool IsXmp(const JpegSegment& segment) {
  return segment.marker == kApp1 && segment.Starts(kXmpHead);
}
bool IsPhotoshop(const JpegSegment& segment) {
  return segment.marker == kApp13 && segment.Starts(kPhotoshopHead);
}

std::vector<uint8_t> Segment(uint8_t marker, std::span<const uint8_t> head,
                             std::span<const uint8_t> block) {
  const size_t length = 2 + head.size() + block.size();
  std::vector<uint8_t> bytes(2 + length);
  bytes[0] = 0xFF;
  bytes[1] = marker;
  bytes[2] = static_cast<uint8_t>(length >> 8);
  bytes[3] = static_cast<uint8_t>(length);
  std::ranges::copy(block, std::ranges::copy(head, bytes.begin() + 4).out);
  return bytes;
}

std::span<const uint8_t> BytesOf(std::string_view text) {
  return {static_cast<const uint8_t*>(static_cast<const void*>(text.data())), text.size()};
}

// One kind of block to be written.
struct Wanted {
  const std::optional<std::vector<uint8_t>>& block;
  std::string_view head;
  size_t most;
  bool (*is)(const JpegSegment& segment);
  bool there = false, done = false;
};

class JpegRewrite {
 public:
  JpegRewrite(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
              std::string& reason)
      : file_(file),
        made_(made),
        reason_(reason),
        wanted_{{blocks.exif, kExifHead, kMostExif, IsExif},
                {blocks.xmp, kXmpHead, kMostXmp, IsXmp},
                {blocks.iptc, kPhotoshopHead, kMostSegment - kPhotoshopHead.size(), IsPhotoshop}} {}

  Status Run() {
    JpegHead head;
    RETURN_IF_BAD(ParseJpegHead(file_, head));
    for (Wanted& wanted : wanted_) {
      const auto count = std::ranges::count_if(head.segments, wanted.is);
      wanted.there = count > 0;
      if (!wanted.block) continue;
      if (wanted.block->size() > wanted.most)
        return Refuse(Tr("The new block would be too large for a JPEG file."));
      splitExif_ = splitExif_ || (count > 1 && &wanted == &wanted_[0]);
    }
    made_.Clear();
    made_.Keep(file_.first(2));
    for (const JpegSegment& segment : head.segments) RETURN_IF_BAD(Add(segment));
    AddNew(false);
    made_.Keep(file_.subspan(head.scan));
    return Status::Ok;
  }

 private:
  Status Refuse(std::string reason) {
    reason_ = std::move(reason);
    return Status::UnsuitableImage;
  }

  Status Add(const JpegSegment& segment) {
    const bool mpf = segment.marker == kApp2 && segment.Starts(kMpf);
    // New ones follow JFIF, XMP also EXIF, whose place in the file then stays; they precede
    // everything else.
    if (segment.marker != kApp0)
      AddNew(wanted_[0].there && (!exifSeen_ || IsExif(segment)) && !mpf);
    exifSeen_ = exifSeen_ || IsExif(segment);
    mpfSeen_ = mpfSeen_ || mpf;
    for (Wanted& wanted : wanted_) {
      if (wanted.block && wanted.is(segment)) return Replace(segment, wanted);
    }
    made_.Keep(segment.whole);
    return Status::Ok;
  }

  Status Replace(const JpegSegment& segment, Wanted& wanted) {
    const bool goes = wanted.block->empty();
    const size_t headSize = wanted.head.size();
    const bool sameSize = !goes && segment.data.size() == headSize + wanted.block->size();
    const bool exif = wanted.is == IsExif;
    if (exif && splitExif_ && !sameSize && !goes && !wanted.done)
      return Refuse(Tr("The EXIF block is too large for one segment."));
    if (mpfSeen_ && !sameSize && (goes || !wanted.done))
      return Refuse(Tr("The file has an index of further pictures in front of its metadata."));
    if (goes) return Status::Ok;
    // Later segments, which may hold what does not fit into the first, are kept.
    if (wanted.done) {
      made_.Keep(segment.whole);
      return Status::Ok;
    }
    wanted.done = true;
    const size_t prefix = static_cast<size_t>(segment.data.data() - segment.whole.data());
    if (sameSize) {  // also keep fill bytes before the marker
      made_.Keep(segment.whole.first(prefix + headSize));
      made_.Add(*wanted.block);
    } else {
      made_.Keep(segment.whole.first(prefix - 4));
      made_.Add(Segment(segment.marker, segment.data.first(headSize), *wanted.block));
    }
    return Status::Ok;
  }

  // `exifFollows`: not what belongs after it.
  void AddNew(bool exifFollows) {
    for (Wanted& wanted : wanted_) {
      if (exifFollows && wanted.is != IsExif) continue;
      const bool none = !wanted.block || wanted.block->empty() || wanted.is == IsPhotoshop;
      if (wanted.done || wanted.there || none) continue;
      made_.Add(Segment(kApp1, BytesOf(wanted.head), *wanted.block));
      wanted.done = true;
    }
  }

  const std::span<const uint8_t> file_;
  FilePieces& made_;
  std::string& reason_;
  Wanted wanted_[3];
  bool splitExif_ = false, exifSeen_ = false;
  bool mpfSeen_ = false;  // an index with offsets relative to itself
};

}  // namespace

Status FindJpegMetadata(std::span<const uint8_t> file, MetadataViews& views) {
  JpegHead head;
  views = {};
  RETURN_IF_BAD(ParseJpegHead(file, head));
  for (const JpegSegment& segment : head.segments) {
    if (views.exif.empty() && IsExif(segment)) views.exif = segment.data.subspan(kExifHead.size());
    if (views.xmp.empty() && IsXmp(segment)) views.xmp = segment.data.subspan(kXmpHead.size());
  }
  return Status::Ok;
}

Status RewriteJpeg(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                   std::string& reason) {
  return JpegRewrite(file, blocks, made, reason).Run();
}

}  // namespace fotomill
