#include <algorithm>

#include "containers/bare_file.h"
#include "containers/gif_walk.h"
#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "containers/png_chunks.h"
#include "containers/riff_chunks.h"
#include "core/byte_reader.h"
#include "formats/png/png_raw_profile.h"
#include "formats/png/png_text.h"
#include "metadata/edit/picture_edit.h"
#include "metadata/edit/strip.h"
#include "metadata/exif/exif_walk.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr const char* kOrientationName = TrLater("orientation");
constexpr const char* kExifName = TrLater("EXIF");
constexpr const char* kGpsName = TrLater("GPS");
constexpr const char* kMakerNoteName = TrLater("maker notes");
constexpr const char* kThumbnailName = TrLater("thumbnail");
constexpr const char* kProfileName = TrLater("color profile");
constexpr const char* kXmpName = TrLater("XMP");
constexpr const char* kIptcName = TrLater("IPTC or Photoshop data");
constexpr const char* kCommentsName = TrLater("comments");
constexpr const char* kTimeName = TrLater("time");
constexpr const char* kOtherName = TrLater("other data");

class Found {
 public:
  void Add(const char* name) {
    if (std::ranges::find(names_, name) == names_.end()) names_.push_back(name);
  }
  void AddExif(const ExifDirectories& exif) {
    constexpr uint16_t kOrientation = 0x0112, kMakerNote = 0x927c;
    if (FindExifEntry(exif.first, kOrientation) != nullptr) Add(kOrientationName);
    const bool more = std::ranges::any_of(
        exif.first, [](const ExifEntry& entry) { return entry.tag != kOrientation; });
    if (more || !exif.exif.empty()) Add(kExifName);
    if (!exif.gps.empty()) Add(kGpsName);
    if (FindExifEntry(exif.exif, kMakerNote) != nullptr) Add(kMakerNoteName);
  }
  // For an EXIF block.
  void AddBlock(std::span<const uint8_t> block) {
    ExifFindings findings;
    if (WalkExif(block, nullptr, &findings) && findings.thumbnailOffset != 0) Add(kThumbnailName);
  }
  std::vector<const char*> Take() { return std::move(names_); }

 private:
  std::vector<const char*> names_;
};

// The end of the picture: after the first EOI outside of segments.
size_t EndOfJpeg(std::span<const uint8_t> file, size_t at) {
  while ((at = NextScanMarker(file, at)) < file.size()) {
    if (file[at + 1] == 0xD9) return at + 2;
    ByteReader bytes(file.subspan(at + 2));
    at += 2 + std::max<size_t>(bytes.Be16(), 2);
  }
  return file.size();
}

void LookIntoJpeg(std::span<const uint8_t> file, Found& found) {
  JpegHead head;
  if (ParseJpegHead(file, head) != Status::Ok) return;
  for (const JpegSegment& segment : head.segments) {
    const uint8_t marker = segment.marker;
    const bool application = (marker >= 0xE0 && marker <= 0xEF) || marker == 0xFE;
    if (!application || (marker == 0xE0 && segment.Starts(std::string_view("JFIF\0", 5))) ||
        (marker == 0xEE && segment.Starts("Adobe")))
      continue;
    if (marker == 0xE1 && segment.Starts("Exif")) {
      found.AddBlock(segment.data.subspan(std::min(kExifHead.size(), segment.data.size())));
    } else if (marker == 0xE1 && segment.Starts("http://ns.adobe.com/")) {
      found.Add(kXmpName);
    } else if (marker == 0xE2 && segment.Starts("ICC_PROFILE")) {
      found.Add(kProfileName);
    } else if (marker == 0xED) {
      found.Add(kIptcName);
    } else {
      found.Add(marker == 0xFE ? kCommentsName : kOtherName);
    }
  }
  if (EndOfJpeg(file, head.scan) < file.size()) found.Add(kOtherName);
}

const char* NameOfText(std::string_view keyword) {
  if (keyword == "XML:com.adobe.xmp") return kXmpName;
  switch (PngRawProfileOf(keyword)) {
    case PngRawProfile::Exif: return kExifName;
    case PngRawProfile::Xmp: return kXmpName;
    case PngRawProfile::Iptc: return kIptcName;
    case PngRawProfile::Other: return kOtherName;
    case PngRawProfile::None: break;
  }
  return kCommentsName;
}

void LookIntoPng(std::span<const uint8_t> file, Found& found) {
  // chunks starting with an uppercase letter belong to the picture; so do these
  constexpr std::string_view kPicture[] = {"tRNS", "cHRM", "gAMA", "sBIT", "sRGB", "cICP",
                                           "mDCv", "mDCV", "cLLi", "cLLI", "bKGD", "hIST",
                                           "pHYs", "sPLT", "oFFs", "acTL", "fcTL", "fdAT"};
  PngChunks chunks(file);
  for (PngChunk chunk; chunks.Next(chunk);) {
    const std::string_view type = chunk.type;
    if (type[0] < 'a' || std::ranges::find(kPicture, type) != std::end(kPicture)) continue;
    const bool text = type == "tEXt" || type == "zTXt" || type == "iTXt";
    if (type == "eXIf") {
      found.AddBlock(chunk.data);
    } else if (text) {
      found.Add(NameOfText(PngTextKeyword(chunk)));
    } else {
      found.Add(type == "iCCP" ? kProfileName : type == "tIME" ? kTimeName : kOtherName);
    }
  }
}

void LookIntoWebp(std::span<const uint8_t> file, Found& found) {
  constexpr std::string_view kPicture[] = {"VP8X", "ANIM", "ANMF", "ALPH", "VP8 ", "VP8L"};
  RiffWalk walk(file);
  for (RiffPlace chunk; walk.Next(chunk);) {
    if (std::ranges::find(kPicture, chunk.name) != std::end(kPicture)) continue;
    if (chunk.name == "EXIF") {
      found.AddBlock(file.subspan(chunk.data, chunk.size));
    } else {
      found.Add(chunk.name == "ICCP" ? kProfileName : chunk.name == "XMP " ? kXmpName : kOtherName);
    }
  }
}

void LookIntoGif(std::span<const uint8_t> file, Found& found) {
  GifWalk walk(file);
  for (GifBlock block; walk.Next(block);) {
    if (block.kind == GifBlock::Kind::Image ||
        IsGifPictureExtension(block.label, block.application))
      continue;
    found.Add(block.label == kGifCommentLabel       ? kCommentsName
              : block.application == kGifXmp        ? kXmpName
              : block.application == kGifProfile    ? kProfileName
                                                    : kOtherName);
  }
  if (walk.Outcome() == Status::Ok && walk.Position() + 1 < file.size()) found.Add(kOtherName);
}

void LookIntoPsd(std::span<const uint8_t> file, Found& found) {
  constexpr struct {
    uint16_t number;
    const char* name;
  } kNames[] = {{kExifResource, kExifName},    {kXmpResource, kXmpName},
                {kIptcResource, kIptcName},    {kIptcDigestResource, kIptcName},
                {kProfileResource, kProfileName}, {1033, kThumbnailName},
                {1036, kThumbnailName}};
  constexpr uint16_t kUntagged = 1041;
  bool complete = false;
  for (const PhotoshopResource& one : PhotoshopResources(PsdResources(file), complete)) {
    const auto named = std::ranges::find(kNames, one.number, [](const auto& row) {
      return row.number;
    });
    if (named != std::end(kNames)) {
      found.Add(named->name);
    } else if (one.number != kUntagged && !IsPsdPictureResource(one.number)) {
      found.Add(kOtherName);
    }
  }
}

void LookIntoDirectory(std::span<const uint8_t> file, Found& found) {
  constexpr struct {
    uint16_t tag;
    const char* name;
  } kTags[] = {{700, kXmpName},       {33723, kIptcName},         {34377, kIptcName},
               {34675, kProfileName}, {0xBC02, kOrientationName}, {0x8769, kExifName},
               {0x8825, kGpsName}};
  for (const auto& tag : kTags) {
    if (!FindDirectoryValues(file, tag.tag).empty()) found.Add(tag.name);
  }
}

}  // namespace

std::vector<const char*> MetadataLeft(std::span<const uint8_t> file) {
  Found found;
  found.AddExif(GatherPictureExif(file));
  switch (MetadataFormOf(file)) {
    case MetadataForm::Jpeg: LookIntoJpeg(file, found); break;
    case MetadataForm::Png: LookIntoPng(file, found); break;
    case MetadataForm::Webp: LookIntoWebp(file, found); break;
    case MetadataForm::Gif: LookIntoGif(file, found); break;
    case MetadataForm::Psd: LookIntoPsd(file, found); break;
    case MetadataForm::Tiff:
    case MetadataForm::HdPhoto: LookIntoDirectory(file, found); break;
    case MetadataForm::None: break;
  }
  return found.Take();
}

}  // namespace fotomill
