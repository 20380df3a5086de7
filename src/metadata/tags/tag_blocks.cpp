// Sources: XMP specification part 3, sections 1.1.3 to 1.1.5, 3.1 and 3.2; TIFF tags 700 (XMP),
// 33723 (IPTC) and 34377 (Photoshop).
#include "metadata/tags/tag_blocks.h"

#include <algorithm>
#include <utility>

#include "containers/directory_edit.h"
#include "containers/jpeg_extended_xmp.h"
#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "core/limits.h"
#include "formats/png/png_raw_profile.h"
#include "formats/png/png_text.h"

namespace fotomill {

namespace {

constexpr uint8_t kApp13 = 0xED, kComment = 0xFE;
constexpr uint16_t kXmpTag = 700, kIptcTag = 33723, kPhotoshopTag = 34377;

class Finder {
 public:
  Finder(std::span<const uint8_t> file, TagBlocks& blocks) : file_(file), blocks_(blocks) {}

  void Jpeg() {
    JpegHead head;
    (void)ParseJpegHead(file_, head);  // segments before damage count
    blocks_.xmp = head.Xmp();
    blocks_.exifBlock = head.Exif();
    blocks_.exif = ParseExifBlock(blocks_.exifBlock);
    std::vector<std::span<const uint8_t>> resources;
    for (const JpegSegment& segment : head.segments) {
      if (segment.marker == kApp13 && segment.Starts(kPhotoshopHead))
        resources.push_back(segment.data.subspan(kPhotoshopHead.size()));
      if (segment.marker == kComment && blocks_.comment.empty()) TakeComment(segment.data);
    }
    if (!resources.empty()) {
      Photoshop(Joined(resources));
      blocks_.resources = resources.front();
    }
    ReadXmp();
    if (blocks_.xmpTags.extended.empty()) return;
    blocks_.extension = Own(JoinExtendedXmp(head, blocks_.xmpTags.extended));
    (void)ReadXmpTags(blocks_.extension, blocks_.xmpTags);
  }

  void Png() {
    constexpr int kMostTexts = 64;  // that are read, and maybe inflated
    int texts = 0;
    bool standardXmp = false;  // which wins over a profile
    PngChunks chunks(file_);
    for (PngChunk chunk; chunks.Next(chunk);) {
      if (chunk.type == "eXIf" && blocks_.exifBlock.empty()) {
        blocks_.exifBlock = chunk.data;
        blocks_.exif = ParseExifBlock(chunk.data);
      }
      if (chunk.type != "tEXt" && chunk.type != "zTXt" && chunk.type != "iTXt") continue;
      const std::string_view keyword = PngTextKeyword(chunk);
      const bool comment = keyword == "Comment" && blocks_.comment.empty();
      const bool xmp = keyword == "XML:com.adobe.xmp" && !standardXmp;
      const PngRawProfile profile = PngRawProfileOf(keyword);
      const bool wanted = (profile == PngRawProfile::Xmp && blocks_.xmp.empty()) ||
                          (profile == PngRawProfile::Iptc && blocks_.iptc.empty()) ||
                          (profile == PngRawProfile::Exif && blocks_.exif.Empty());
      if ((!comment && !xmp && !wanted) || texts++ >= kMostTexts) continue;
      if (comment) TakeComment(PngTextOf(chunk, limits.pngTextBytes));
      if (xmp) blocks_.xmp = Own(PngTextOf(chunk, limits.pngTextBytes));
      standardXmp = standardXmp || xmp;
      if (wanted) PngProfile(profile, keyword, Own(ReadPngRawProfile(chunk)));
    }
    ReadXmp();
  }

  // WebP, GIF and Photoshop.
  void Blocks() {
    MetadataViews views;
    if (OperationsOf(blocks_.form).find(file_, views) != Status::Ok) return;
    if (blocks_.form == MetadataForm::Psd) {
      blocks_.resources = PsdResources(file_);
      Photoshop(blocks_.resources);
    }
    blocks_.xmp = views.xmp;
    blocks_.exifBlock = views.exif;
    blocks_.exif = ParseExifBlock(views.exif);
    ReadXmp();
  }

  void Directories() {
    blocks_.exif = GatherPictureExif(file_);
    blocks_.xmp = FirstDirectoryValue(file_, kXmpTag).bytes;
    blocks_.iptc = FirstDirectoryValue(file_, kIptcTag).bytes;
    const auto resources = FirstDirectoryValue(file_, kPhotoshopTag).bytes;
    blocks_.iptcDigest = FindPhotoshopResource(resources, kIptcDigestResource);
    if (blocks_.iptc.empty()) Photoshop(resources);
    ReadXmp();
  }

 private:
  std::span<const uint8_t> Own(std::vector<uint8_t> bytes) {
    blocks_.made.push_back(std::move(bytes));
    return blocks_.made.back();
  }
  std::span<const uint8_t> Joined(const std::vector<std::span<const uint8_t>>& parts) {
    if (parts.size() == 1) return parts.front();
    std::vector<uint8_t> bytes;
    for (const auto& part : parts) bytes.insert(bytes.end(), part.begin(), part.end());
    return Own(std::move(bytes));
  }
  void TakeComment(std::span<const uint8_t> text) {
    while (!text.empty() && text.back() == 0) text = text.first(text.size() - 1);
    blocks_.comment.assign(text.begin(), text.end());
  }
  void Photoshop(std::span<const uint8_t> resources) {
    blocks_.iptc = FindPhotoshopResource(resources, kIptcResource);
    blocks_.iptcDigest = FindPhotoshopResource(resources, kIptcDigestResource);
  }
  void PngProfile(PngRawProfile kind, std::string_view keyword, std::span<const uint8_t> data) {
    if (kind == PngRawProfile::Xmp) blocks_.xmp = data;
    if (kind == PngRawProfile::Exif) {
      const bool headed = ByteReader(data).Match(kExifHead);
      blocks_.exif = ParseExifBlock(headed ? data.subspan(kExifHead.size()) : data);
    }
    if (kind != PngRawProfile::Iptc) return;
    Photoshop(data);  // usually with the resources around it
    if (!blocks_.iptc.empty()) blocks_.resources = data;
    if (blocks_.iptc.empty()) blocks_.iptc = data;
    blocks_.iptcKeyword = keyword;
  }
  void ReadXmp() {
    if (!blocks_.xmp.empty())
      blocks_.xmpDamaged = ReadXmpTags(blocks_.xmp, blocks_.xmpTags) != Status::Ok;
    blocks_.iptcTags = ReadIptcTags(blocks_.iptc);
  }

  std::span<const uint8_t> file_;
  TagBlocks& blocks_;
};

}  // namespace

bool TagBlocks::IptcIsNewer() const {
  return !iptc.empty() && !iptcDigest.empty() && !std::ranges::equal(iptcDigest, IptcDigest(iptc));
}

TagBlocks FindTagBlocks(std::span<const uint8_t> file) {
  TagBlocks blocks;
  blocks.form = MetadataFormOf(file);
  Finder finder(file, blocks);
  switch (blocks.form) {
    case MetadataForm::Jpeg: finder.Jpeg(); break;
    case MetadataForm::Png: finder.Png(); break;
    case MetadataForm::Webp:
    case MetadataForm::Gif:
    case MetadataForm::Psd: finder.Blocks(); break;
    case MetadataForm::Tiff:
    case MetadataForm::HdPhoto: finder.Directories(); break;
    case MetadataForm::None: break;
  }
  return blocks;
}

}  // namespace fotomill
