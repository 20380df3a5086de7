// Source: Metadata Working Group, "Guidelines for Handling Image Metadata 2.0" (2010), chapters 3
// and 5.
#include "metadata/tags/picture_tags.h"

#include <algorithm>
#include <charconv>
#include <cmath>

#include "core/text.h"
#include "core/utf8.h"
#include "metadata/exif/exif_value.h"
#include "metadata/exif/foreign_metadata.h"
#include "metadata/tags/sidecar.h"
#include "metadata/tags/tag_blocks.h"
#include "metadata/tags/tag_words.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr std::string_view kBlanks(" \t\r\n\0", 5);

std::string Trimmed(std::string_view text) {
  text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
  return std::string(text.substr(0, text.find_last_not_of(kBlanks) + 1));
}

std::string ExifText(const ExifDirectory& directory, uint16_t tag) {
  const ExifEntry* entry = FindExifEntry(directory, tag);
  return entry == nullptr ? std::string() : Trimmed(ExifEntryText(*entry));
}

uint16_t ExifShort(const ExifDirectories& exif, uint16_t tag) {
  constexpr uint16_t kShort = 3;
  const ExifEntry* entry = FindExifEntry(exif.first, tag);
  if (entry == nullptr || entry->type != kShort || entry->value.size() < 2) return 0;
  return static_cast<uint16_t>(exif.bigEndian ? entry->value[0] << 8 | entry->value[1]
                                              : entry->value[1] << 8 | entry->value[0]);
}

std::string Joined(const std::vector<std::string>& texts) {
  std::string joined;
  for (const std::string& text : texts) joined.append(joined.empty() ? "" : "; ").append(text);
  return joined;
}

// Maker and model; many models repeat the maker.
std::string CameraName(const std::string& maker, const std::string& model) {
  const std::string_view first = std::string_view(maker).substr(0, maker.find(' '));
  const bool repeats = EqualIgnoringCase(std::string_view(model).substr(0, first.size()), first);
  if (model.empty() || maker.empty() || repeats) return model.empty() ? maker : model;
  return maker + " " + model;
}

// The user comment of the Exif directory if it is plain text.
std::string UserComment(const ExifDirectories& exif) {
  constexpr uint16_t kUserComment = 0x9286;
  constexpr size_t kCode = 8;
  const ExifEntry* entry = FindExifEntry(exif.exif, kUserComment);
  if (entry == nullptr || entry->value.size() <= kCode) return {};
  const std::string_view value(
      static_cast<const char*>(static_cast<const void*>(entry->value.data())), entry->value.size());
  if (!value.starts_with("ASCII")) return {};
  return Trimmed(value.substr(kCode, value.find('\0', kCode) - kCode));
}

int64_t ExifDate(const ExifDirectories& exif) {
  constexpr uint16_t kDateTimeOriginal = 0x9003;
  return XmpDateNumber(ExifText(exif.exif, kDateTimeOriginal));
}

void Overlay(std::string& text, std::string_view newer) {
  if (std::string trimmed = Trimmed(newer); !trimmed.empty()) text = std::move(trimmed);
}

// The texts that XMP and IPTC have in common, over what is already there.
template <class Tags>
void OverlayTexts(const Tags& newer, PictureTags& tags) {
  Overlay(tags.title, newer.title);
  Overlay(tags.description, newer.description);
  Overlay(tags.creator, Joined(newer.creators));
  Overlay(tags.copyright, newer.copyright);
  Overlay(tags.sublocation, newer.sublocation);
  Overlay(tags.city, newer.city);
  Overlay(tags.state, newer.state);
  Overlay(tags.country, newer.country);
  Overlay(tags.countryCode, newer.countryCode);
}

// What a packet says, over what is already there.
void OverlayXmp(const XmpTags& xmp, PictureTags& tags) {
  OverlayTexts(xmp, tags);
  Overlay(tags.label, LabelOf(xmp));
  Overlay(tags.camera, CameraName(Trimmed(xmp.make), Trimmed(xmp.model)));
  if (const auto rating = RatingOf(xmp)) tags.rating = *rating;
  if (const auto keywords = KeywordsOf(xmp); !keywords.empty()) tags.keywords = keywords;
  for (const std::string* date : {&xmp.taken, &xmp.dateCreated, &xmp.created}) {
    if (const int64_t number = XmpDateNumber(*date); number != 0) {
      tags.taken = number;
      break;
    }
  }
}

void OverlayIptc(const IptcTags& iptc, PictureTags& tags) {
  OverlayTexts(iptc, tags);
  if (!iptc.keywords.empty()) tags.keywords = iptc.keywords;
}

void OverlayExif(const ExifDirectories& exif, PictureTags& tags) {
  constexpr uint16_t kDescription = 0x010e, kMaker = 0x010f, kModel = 0x0110, kArtist = 0x013b,
                     kCopyright = 0x8298, kRating = 0x4746;
  Overlay(tags.description, ExifText(exif.first, kDescription));
  Overlay(tags.creator, ExifText(exif.first, kArtist));
  Overlay(tags.copyright, ExifText(exif.first, kCopyright));
  Overlay(tags.camera, CameraName(ExifText(exif.first, kMaker), ExifText(exif.first, kModel)));
  if (tags.rating == 0) tags.rating = std::min<int32_t>(ExifShort(exif, kRating), 5);
  if (const int64_t date = ExifDate(exif); date != 0) tags.taken = date;
}

// What a plug-in finds in a file. Its EXIF block is laid out as a TIFF file.
PictureTags TagsOfForeign(const std::string& path, bool exif) {
  ForeignMetadata foreign;
  PictureTags tags;
  if (!ReadForeignMetadata(path, foreign)) return tags;
  XmpTags xmp;
  if (ReadXmpTags(foreign.xmp, xmp) == Status::Ok) OverlayXmp(xmp, tags);
  const TagBlocks blocks = FindTagBlocks(foreign.exif);
  if (exif) OverlayExif(blocks.exif, tags);
  if (exif) tags.comment = UserComment(blocks.exif);
  return tags;
}

// A text file with the comment.
void ReadCommentFile(const std::string& path, const TagSources& sources, PictureTags& tags) {
  constexpr uint64_t kMostBytes = 64 * 1024;  // longer texts are no comments
  if (sources.commentExtension.empty()) return;
  platform::FileView file;
  const std::string name = CommentFileName(path, sources.commentFolder, sources.commentExtension);
  if (!file.Open(name) || file.FileSize() > kMostBytes) return;
  const auto bytes = file.Bytes();
  const std::string text =
      Trimmed({static_cast<const char*>(static_cast<const void*>(bytes.data())), bytes.size()});
  if (!text.empty() && IsUtf8(text)) tags.comment = text;
}

}  // namespace

PictureTags TagsOfFile(std::span<const uint8_t> file, bool exif) {
  const TagBlocks blocks = FindTagBlocks(file);
  PictureTags tags;
  if (blocks.IptcIsNewer()) {
    OverlayXmp(blocks.xmpTags, tags);
    OverlayIptc(blocks.iptcTags, tags);
  } else {
    OverlayIptc(blocks.iptcTags, tags);
    OverlayXmp(blocks.xmpTags, tags);
  }
  if (exif) OverlayExif(blocks.exif, tags);
  if (exif) tags.comment = UserComment(blocks.exif);
  if (tags.comment.empty()) tags.comment = Trimmed(blocks.comment);
  return tags;
}

Status ReadPictureTags(const std::string& path, const TagSources& sources, PictureTags& tags) {
  tags = {};
  {
    platform::FileView file;
    if (!file.Open(path)) return Status::FileOpenError;
    tags = TagsOfFile(file.Bytes(), sources.exif);
  }
  if (tags == PictureTags()) tags = TagsOfForeign(path, sources.exif);
  if (const std::string name = FindSidecar(path); !name.empty()) {
    platform::FileView sidecar;
    XmpTags xmp;
    if (sidecar.Open(name) && ReadXmpTags(sidecar.Bytes(), xmp) == Status::Ok)
      OverlayXmp(xmp, tags);
  }
  ReadCommentFile(path, sources, tags);
  return Status::Ok;
}

}  // namespace fotomill
