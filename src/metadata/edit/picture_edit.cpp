#include "metadata/edit/picture_edit.h"

#include <algorithm>

#include "containers/png_chunks.h"
#include "containers/riff_chunks.h"
#include "core/byte_reader.h"
#include "formats/hdphoto/hdp_file.h"
#include "metadata/edit/exif_input.h"
#include "metadata/exif/exif_tags.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint16_t kOrientation = 0x0112, kExifVersionTag = 0x9000, kGpsVersionTag = 0x0000;

bool Starts(std::span<const uint8_t> file, std::string_view text) {
  return ByteReader(file).Match(text);
}

// A new directory needs the version of the standard.
void AddVersions(const ExifDirectories& old, ExifChanges& changes) {
  const auto adds = [&](ExifPlace place, uint16_t version) {
    return std::ranges::any_of(changes,
                               [&](const DirectoryChange& change) {
                                 return change.place == place && change.entry.has_value();
                               }) &&
           std::ranges::none_of(changes, [&](const DirectoryChange& change) {
             return change.place == place && change.tag == version;
           });
  };
  if (old.exif.empty() && adds(ExifPlace::Exif, kExifVersionTag)) {
    changes.push_back({ExifPlace::Exif, kExifVersionTag,
                       ExifEntry{kExifVersionTag, kExifUndefined, 4, {'0', '2', '3', '0'}}});
  }
  if (old.gps.empty() && adds(ExifPlace::Gps, kGpsVersionTag)) {
    changes.push_back(
        {ExifPlace::Gps, kGpsVersionTag, ExifEntry{kGpsVersionTag, kExifByte, 4, {2, 3, 0, 0}}});
  }
}

// HD Photo has a separate tag for the orientation.
void UseHdpOrientation(ExifChanges& changes) {
  for (DirectoryChange& change : changes) {
    if (change.place != ExifPlace::First || change.tag != kOrientation) continue;
    change.tag = kHdpOrientation;
    if (!change.entry || change.entry->value.empty()) continue;
    const auto turn = static_cast<uint8_t>(HdpTurn(change.entry->value[0]));
    change.entry = ExifEntry{kHdpOrientation, kHdpLong, 1, {turn, 0, 0, 0}};
  }
}

// A block with only the added entries.
std::vector<uint8_t> FreshBlock(const ExifChanges& changes) {
  ExifDirectories directories;
  for (const DirectoryChange& change : changes) {
    if (!change.entry) continue;
    (change.place == ExifPlace::First  ? directories.first
     : change.place == ExifPlace::Exif ? directories.exif
                                       : directories.gps)
        .push_back(*change.entry);
  }
  return MakeExifBlock(directories);
}

// Whether the only directory of a block is empty.
bool IsEmptyBlock(std::span<const uint8_t> block) {
  const bool big = Starts(block, "MM");
  ByteReader bytes(block);
  bytes.Skip(4);
  bytes.Seek(big ? bytes.Be32() : bytes.Le32());
  return bytes.Le16() == 0 && bytes.Le32() == 0 && bytes.Ok();
}

Status EditFile(std::span<const uint8_t> file, ExifChanges changes, FilePieces& made, bool& changed,
                std::string& reason) {
  if (MetadataFormOf(file) == MetadataForm::HdPhoto) UseHdpOrientation(changes);
  DirectoryEdit edit;
  RETURN_IF_BAD(EditDirectories(file, changes, edit, reason));
  changed = !edit.Empty();
  if (changed) AddEdited(file, std::move(edit), made);
  return Status::Ok;
}

Status EditBlock(std::span<const uint8_t> file, const FormOperations& operations,
                 const ExifChanges& changes, FilePieces& made, bool& changed, std::string& reason) {
  MetadataViews views;
  RETURN_IF_BAD(operations.find(file, views));
  MetadataBlocks blocks;
  if (views.exif.empty()) {
    blocks.exif = FreshBlock(changes);
    changed = !blocks.exif->empty();
  } else {
    DirectoryEdit edit;
    RETURN_IF_BAD(EditDirectories(views.exif, changes, edit, reason));
    changed = !edit.Empty();
    if (!changed) return Status::Ok;
    blocks.exif = EditedBlock(views.exif, std::move(edit));
    if (IsEmptyBlock(*blocks.exif)) blocks.exif->clear();
  }
  return changed ? operations.rewrite(file, blocks, made, reason) : Status::Ok;
}

}  // namespace

FormOperations OperationsOf(MetadataForm form) {
  switch (form) {
    case MetadataForm::Jpeg: return {FindJpegMetadata, RewriteJpeg};
    case MetadataForm::Png: return {FindPngMetadata, RewritePng};
    case MetadataForm::Webp: return {FindWebpMetadata, RewriteWebp};
    case MetadataForm::Gif: return {FindGifMetadata, RewriteGif};
    case MetadataForm::Psd: return {FindPsdMetadata, RewritePsd};
    default: return {};
  }
}

bool HasEditableExif(MetadataForm form) {
  return form != MetadataForm::None && form != MetadataForm::Gif && form != MetadataForm::Psd;
}

MetadataForm MetadataFormOf(std::span<const uint8_t> file) {
  if (Starts(file, "\xFF\xD8")) return MetadataForm::Jpeg;
  if (Starts(file, kPngSignature)) return MetadataForm::Png;
  if (IsRiff(file, "WEBP")) return MetadataForm::Webp;
  if (Starts(file, "II\xBC\x01")) return MetadataForm::HdPhoto;
  if (Starts(file, "GIF87a") || Starts(file, "GIF89a")) return MetadataForm::Gif;
  if (Starts(file, "8BPS")) return MetadataForm::Psd;
  for (const std::string_view head : {std::string_view("II*\0", 4), std::string_view("MM\0*", 4),
                                      std::string_view("II+\0", 4), std::string_view("MM\0+", 4)}) {
    if (Starts(file, head)) return MetadataForm::Tiff;
  }
  return MetadataForm::None;
}

ExifDirectories GatherPictureExif(std::span<const uint8_t> file) {
  const MetadataForm form = MetadataFormOf(file);
  if (form == MetadataForm::Tiff || form == MetadataForm::HdPhoto) {
    ByteReader bytes(file);
    const bool big = Starts(file, "MM");
    bytes.Skip(2);
    const bool wide = (big ? bytes.Be16() : bytes.Le16()) == 43;
    if (wide) bytes.Skip(4);
    const uint64_t first =
        wide ? (big ? bytes.Be64() : bytes.Le64()) : (big ? bytes.Be32() : bytes.Le32());
    return GatherExif(file, {big, wide}, first);
  }
  MetadataViews views;
  const FormOperations operations = OperationsOf(form);
  if (operations.find == nullptr || operations.find(file, views) != Status::Ok) return {};
  return ParseExifBlock(views.exif);
}

std::string ExifEntryText(const ExifEntry& entry) {
  if (entry.type != kExifAscii) return {};
  std::string text(entry.value.begin(), std::ranges::find(entry.value, uint8_t{0}));
  while (text.ends_with(' ')) text.pop_back();
  return text;
}

const ExifEntry* FindExifEntry(const ExifDirectory& directory, uint16_t tag) {
  const auto found = std::ranges::find(directory, tag, &ExifEntry::tag);
  return found == directory.end() ? nullptr : &*found;
}

Status EditPictureExif(std::span<const uint8_t> file, const ExifChanger& changer, FilePieces& made,
                       bool& changed, std::string& reason) {
  changed = false;
  made.Clear();
  reason.clear();
  const MetadataForm form = MetadataFormOf(file);
  if (!HasEditableExif(form)) {
    reason = Tr("EXIF can be changed in JPEG, TIFF, PNG, WebP and HD Photo files.");
    return Status::UnsupportedFormat;
  }
  const ExifDirectories old = GatherPictureExif(file);
  ExifChanges changes = changer(old, reason);
  if (!reason.empty()) return Status::InformationError;
  AddVersions(old, changes);
  const FormOperations operations = OperationsOf(form);
  return operations.find == nullptr ? EditFile(file, std::move(changes), made, changed, reason)
                                    : EditBlock(file, operations, changes, made, changed, reason);
}

}  // namespace fotomill
