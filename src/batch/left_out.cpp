#include "batch/left_out.h"

#include <algorithm>

#include "containers/exif_directories.h"

namespace fotomill {

namespace {

constexpr uint16_t kMakerNote = 0x927C;

// Data not supported by readers, by bit.
struct Unread {
  uint8_t bit;
  bool metadata;
  const char* name;
};
constexpr Unread kUnread[] = {
    {kUnreadDepth, false, TrLater("more than 8 bits per sample")},
    {kUnreadInks, false, TrLater("inks or extra channels")},
    {kUnreadLayers, false, TrLater("layers")},
    {kUnreadIptc, true, TrLater("IPTC")},
    {kUnreadTexts, true, TrLater("other texts")},
};

bool HasMakerNote(const PictureRecord& picture) {
  const ExifDirectories directories = ParseExifBlock(picture.metadata.exif);
  return std::ranges::any_of(directories.exif,
                             [](const ExifEntry& entry) { return entry.tag == kMakerNote; });
}

// A list of names, in English and translated.
class Names {
 public:
  void Add(const RecordedText& name) {
    if (!names_.empty()) {
      names_.english += ", ";
      names_.shown += ", ";
    }
    names_.english += name.english;
    names_.shown += name.shown;
  }
  RecordedText Sentence() const {
    if (names_.empty()) return {};
    return {"Left out: " + names_.english + ".", Tr("Left out: %1.", names_.shown)};
  }

 private:
  RecordedText names_;
};

void AddPages(const LeftOutFacts& facts, Names& names) {
  if (facts.pages < 1) return;
  const auto count = static_cast<uint64_t>(facts.pages);
  const std::string number = std::to_string(count);
  const char* const kind = facts.frames ? " more frame" : " more page";
  const std::string shown = facts.frames ? TrCount("one more frame", "%1 more frames", count)
                                         : TrCount("one more page", "%1 more pages", count);
  names.Add({(count == 1 ? "one" : number) + kind + (count == 1 ? "" : "s"), shown});
}

}  // namespace

RecordedText LeftOut(const PictureRecord& picture, const LeftOutFacts& facts) {
  Names names;
  AddPages(facts, names);
  for (const Unread& row : kUnread) {
    const bool wanted = facts.metadataWanted || !row.metadata;
    if ((picture.unread & row.bit) != 0 && wanted) names.Add(TrRecorded(row.name));
  }
  if (facts.transparency) names.Add(TrRecorded("transparency"));
  const PictureMetadata& metadata = picture.metadata;
  const auto lost = [&](uint8_t bit) { return (picture.lostMetadata & bit) != 0; };
  if (lost(kLostIcc) && !metadata.icc.empty()) names.Add(TrRecorded("color profile"));
  if (!facts.metadataWanted) return names.Sentence();
  if (!metadata.exif.empty()) {
    if (lost(kLostExif)) {
      names.Add(TrRecorded("EXIF"));
    } else if (lost(kLostMakerNote) && HasMakerNote(picture)) {
      names.Add(TrRecorded("maker note"));
    }
  }
  if (lost(kLostXmp) && !metadata.xmp.empty()) names.Add(TrRecorded("XMP"));
  if (lost(kLostComment) && !picture.comment.empty()) names.Add(TrRecorded("comment"));
  return names.Sentence();
}

}  // namespace fotomill
