// Source: Metadata Working Group, "Guidelines for Handling Image Metadata 2.0" (2010), chapter 3:
// a program that changes a tag changes it in all places that have it.
#include "metadata/tags/tag_edit.h"

#include <algorithm>
#include <unordered_set>
#include <utility>

#include "containers/directory_edit.h"
#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "containers/png_chunks.h"
#include "core/utf8.h"
#include "formats/png/png_raw_profile.h"
#include "formats/png/png_text.h"
#include "metadata/edit/exif_input.h"
#include "metadata/exif/exif_value.h"
#include "metadata/tags/tag_blocks.h"
#include "metadata/tags/tag_words.h"
#include "metadata/tags/xmp_changes.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint16_t kXmpTag = 700, kIptcTag = 33723, kPhotoshopTag = 34377;
constexpr uint16_t kByte = 1, kShort = 3, kUndefined = 7;

bool ChangesKeywords(const TagChanges& changes) {
  return changes.keywords || !changes.addedKeywords.empty() || !changes.removedKeywords.empty();
}

// Camera raw files, whose data refer to each other in ways that only their makers know.
bool IsCameraRaw(std::span<const uint8_t> file) {
  constexpr uint16_t kPhotometric = 262, kDngVersion = 50706;
  constexpr uint8_t kColorFilters[] = {0x23, 0x80}, kLinearRaw[] = {0x4C, 0x88};
  if (file.size() > 10 && file[8] == 'C' && file[9] == 'R') return true;
  if (!FindDirectoryValues(file, kDngVersion).empty()) return true;
  for (const DirectoryValue& value : FindDirectoryValues(file, kPhotometric)) {
    if (value.bytes.size() < 2) continue;
    const uint8_t low = value.bytes[file[0] == 'M' ? 1 : 0],
                  high = value.bytes[file[0] == 'M' ? 0 : 1];
    for (const auto& raw : {kColorFilters, kLinearRaw}) {
      if (low == raw[0] && high == raw[1]) return true;
    }
  }
  return false;
}

class Editor {
 public:
  Editor(std::span<const uint8_t> file, const TagChanges& changes, FilePieces& made,
         std::string& reason)
      : file_(file),
        changes_(changes),
        made_(made),
        reason_(reason),
        blocks_(FindTagBlocks(file)),
        current_(TagsOfFile(file)) {}

  Status Run(bool& changed) {
    if (blocks_.form == MetadataForm::None) {
      reason_ = Tr("The format has no place for XMP.");
      return Status::UnsupportedFormat;
    }
    const bool directories =
        blocks_.form == MetadataForm::Tiff || blocks_.form == MetadataForm::HdPhoto;
    if (directories && IsCameraRaw(file_)) return Refuse(Tr("Camera raw files are not changed."));
    if (blocks_.xmpDamaged) return Refuse(Tr("Its XMP is damaged."));
    RETURN_IF_BAD(MakeXmp());
    RETURN_IF_BAD(MakeIptc());
    const ExifChanges exif = MakeExif();
    changed = xmp_.has_value() || iptc_.has_value() || !exif.empty();
    if (!changed) return Status::Ok;
    return directories ? EditFile(exif) : EditBlocks(exif);
  }

 private:
  Status Refuse(std::string reason) {
    reason_ = std::move(reason);
    return Status::UnsuitableImage;
  }

  Status MakeXmp() {
    const std::vector<XmpChange> wanted = XmpChangesFor(blocks_.xmpTags, current_, changes_);
    if (wanted.empty()) return Status::Ok;
    if (TouchesExtension(wanted))
      return Refuse(Tr("Its XMP is split, and these tags are in the second part."));
    std::vector<uint8_t> made;
    if (EditXmp(blocks_.xmp, wanted, made) != Status::Ok)
      return Refuse(Tr("Its XMP cannot be changed safely."));
    if (!std::ranges::equal(made, blocks_.xmp)) xmp_ = std::move(made);
    return Status::Ok;
  }

  // Whether the second packet has one of the properties.
  bool TouchesExtension(std::vector<XmpChange> wanted) const {
    if (blocks_.extension.empty()) return false;
    for (XmpChange& change : wanted) change.values.clear();
    std::vector<uint8_t> without;
    return EditXmp(blocks_.extension, wanted, without) != Status::Ok ||
           !std::ranges::equal(without, blocks_.extension);
  }

  Status MakeIptc() {
    if (blocks_.iptc.empty()) return Status::Ok;
    IptcChanges wanted;
    if (ChangesKeywords(changes_)) wanted.keywords = ChangedKeywords(current_.keywords, changes_);
    if (changes_.description) wanted.description = *changes_.description;
    if (!wanted.keywords && !wanted.description) return Status::Ok;
    std::vector<uint8_t> made;
    if (EditIptc(blocks_.iptc, wanted, made) != Status::Ok)
      return Refuse(Tr("Its IPTC data are damaged."));
    // the old data may be padded with zeros
    const size_t size = std::min(made.size(), blocks_.iptc.size());
    const bool same = std::ranges::equal(made, blocks_.iptc.first(size)) &&
                      std::ranges::count(blocks_.iptc.subspan(size), uint8_t{0}) ==
                          static_cast<ptrdiff_t>(blocks_.iptc.size() - size);
    if (!same) iptc_ = std::move(made);
    return Status::Ok;
  }

  // Entries with the same tags.
  ExifChanges MakeExif() const {
    constexpr uint16_t kDescription = 0x010e, kRating = 0x4746, kPercent = 0x4749;
    ExifChanges made;
    const auto change = [&](uint16_t tag, std::optional<ExifEntry> entry) {
      const ExifEntry* old = FindExifEntry(blocks_.exif.first, tag);
      if (old == nullptr) return;
      std::vector<uint8_t> before = old->value;
      if (blocks_.exif.bigEndian) SwapExifNumbers(old->type, before);
      if (!entry || entry->value != before)
        made.push_back({ExifPlace::First, tag, std::move(entry)});
    };
    const auto number = [](uint16_t tag, int32_t value) {
      return ExifEntry{tag, kShort, 1, {static_cast<uint8_t>(value), 0}};
    };
    if (changes_.rating) {
      change(kRating, number(kRating, std::max(*changes_.rating, 0)));
      change(kPercent, number(kPercent, MicrosoftRating(*changes_.rating)));
    }
    const ExifEntry* old = FindExifEntry(blocks_.exif.first, kDescription);
    const bool blank =
        old == nullptr || ExifEntryText(*old).find_first_not_of(" \t\r\n") == std::string::npos;
    if (changes_.description && !blank && ExifEntryText(*old) != *changes_.description) {
      change(kDescription, changes_.description->empty()
                               ? std::nullopt
                               : std::optional(ExifTextEntry(kDescription, *changes_.description)));
    }
    return made;
  }

  // Photoshop's resources with the new IPTC data. The digest follows only if it was right: else
  // programs would take the other tags from XMP, which may be older.
  std::vector<uint8_t> NewResources(std::span<const uint8_t> resources) const {
    std::vector<NewResource> items = {{kIptcResource, *iptc_}};
    const std::vector<uint8_t> digest = IptcDigest(*iptc_);
    if (!blocks_.IptcIsNewer()) items.push_back({kIptcDigestResource, digest});
    return ReplacePhotoshopResources(resources, items);
  }

  Status EditBlocks(const ExifChanges& exif) {
    MetadataBlocks blocks;
    blocks.xmp = xmp_;
    if (!exif.empty() && !blocks_.exifBlock.empty()) {
      DirectoryEdit edit;
      RETURN_IF_BAD(EditDirectories(blocks_.exifBlock, exif, edit, reason_));
      if (!edit.Empty()) blocks.exif = EditedBlock(blocks_.exifBlock, std::move(edit));
    }
    if (iptc_) {
      if (blocks_.form != MetadataForm::Png) {
        if (FindPhotoshopResource(blocks_.resources, kIptcResource).empty())
          return Refuse(Tr("Its IPTC data are split over several segments."));
        blocks.iptc = NewResources(blocks_.resources);
      } else {
        const std::vector<uint8_t> data =
            blocks_.resources.empty() ? *iptc_ : NewResources(blocks_.resources);
        blocks.iptc = MakePngRawProfile(blocks_.iptcKeyword, data);
        if (blocks.iptc->empty()) return Status::MemoryAllocationError;
      }
    }
    return OperationsOf(blocks_.form).rewrite(file_, blocks, made_, reason_);
  }

  Status EditFile(ExifChanges entries) {
    const auto set = [&](uint16_t tag, uint16_t type, std::vector<uint8_t> value) {
      const auto count = static_cast<uint32_t>(value.size());
      entries.push_back({ExifPlace::First, tag, ExifEntry{tag, type, count, std::move(value)}});
    };
    if (xmp_) set(kXmpTag, kByte, *xmp_);
    if (iptc_) {
      if (!FirstDirectoryValue(file_, kIptcTag).bytes.empty()) set(kIptcTag, kUndefined, *iptc_);
      const auto resources = FirstDirectoryValue(file_, kPhotoshopTag);
      std::vector<uint8_t> made = NewResources(resources.bytes);
      if (!std::ranges::equal(made, resources.bytes))
        set(kPhotoshopTag, resources.type == kByte ? kByte : kUndefined, std::move(made));
    }
    DirectoryEdit edit;
    RETURN_IF_BAD(EditDirectories(file_, entries, edit, reason_));
    AddEdited(file_, std::move(edit), made_);
    return Status::Ok;
  }

  const std::span<const uint8_t> file_;
  const TagChanges& changes_;
  FilePieces& made_;
  std::string& reason_;
  const TagBlocks blocks_;
  const PictureTags current_;
  std::optional<std::vector<uint8_t>> xmp_, iptc_;  // the new ones, if they change
};

}  // namespace

bool TagChanges::Empty() const {
  return !ChangesKeywords(*this) && !rating && !label && !description;
}

std::vector<std::string> ChangedKeywords(const std::vector<std::string>& old,
                                         const TagChanges& changes) {
  std::vector<std::string> keywords;
  std::unordered_set<std::string> there;
  const auto add = [&](const std::string& keyword) {
    if (!keyword.empty() && there.insert(keyword).second) keywords.push_back(keyword);
  };
  std::ranges::for_each(changes.keywords.value_or(old), add);
  std::ranges::for_each(changes.addedKeywords, add);
  std::erase_if(keywords, [&](const std::string& keyword) {
    return std::ranges::find(changes.removedKeywords, keyword) != changes.removedKeywords.end();
  });
  return keywords;
}

Status EditPictureTags(std::span<const uint8_t> file, const TagChanges& changes, FilePieces& made,
                       bool& changed, std::string& reason) {
  changed = false;
  made.Clear();
  reason.clear();
  return Editor(file, changes, made, reason).Run(changed);
}

Status EditSidecar(std::span<const uint8_t> sidecar, const PictureTags& current,
                   const TagChanges& changes, std::vector<uint8_t>& made, bool& changed) {
  XmpTags tags;
  changed = false;
  if (!sidecar.empty()) RETURN_IF_BAD(ReadXmpTags(sidecar, tags));
  const std::vector<XmpChange> wanted = XmpChangesFor(tags, current, changes);
  if (wanted.empty()) return Status::Ok;
  RETURN_IF_BAD(EditXmp(sidecar, wanted, made));
  changed = !std::ranges::equal(made, sidecar);
  return Status::Ok;
}

}  // namespace fotomill
