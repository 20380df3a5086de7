#include "metadata/edit/strip.h"

#include <algorithm>
#include <cstring>

#include "containers/bare_file.h"
#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "metadata/edit/exif_transfer.h"
#include "metadata/edit/picture_edit.h"
#include "metadata/tags/tag_blocks.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint16_t kOrientation = 0x0112, kArtist = 0x013b, kCopyright = 0x8298,
                   kMakerNote = 0x927c;

constexpr KeptName kNames[] = {
    {"orientation", kKeepOrientation},
    {"profile", kKeepProfile},
    {"copyright", kKeepCopyright},
    {"exif", kKeepExif},
    {"gps", kKeepGps},
    {"xmp", kKeepXmp},
    {"iptc", kKeepIptc},
    {"comments", kKeepComments},
};

bool IsKept(const ExifEntry& entry, ExifPlace place, uint32_t kept) {
  if (place == ExifPlace::Gps) return (kept & kKeepGps) != 0;
  if (entry.tag == kMakerNote) return false;
  if (entry.tag == kOrientation) return (kept & kKeepOrientation) != 0;
  const bool owner = entry.tag == kArtist || entry.tag == kCopyright;
  return (kept & kKeepExif) != 0 || (owner && (kept & kKeepCopyright) != 0);
}

// The entries to keep in the new file.
ExifChanges KeptEntries(std::span<const uint8_t> file, MetadataForm form, uint32_t kept) {
  // in PNG files, EXIF may also be in a text
  const ExifDirectories exif =
      form == MetadataForm::Png ? FindTagBlocks(file).exif : GatherPictureExif(file);
  return TakenEntries(exif, [&](const ExifEntry& entry, ExifPlace place) {
    // in TIFF and HD Photo, MakeBareTiff keeps the orientation
    const bool own =
        entry.tag == kOrientation && (form == MetadataForm::Tiff || form == MetadataForm::HdPhoto);
    return !own && IsKept(entry, place, kept);
  });
}

std::vector<uint8_t> XmpOf(std::span<const uint8_t> file, MetadataForm form) {
  MetadataViews views;
  if (form == MetadataForm::Png) {
    const TagBlocks blocks = FindTagBlocks(file);
    return {blocks.xmp.begin(), blocks.xmp.end()};
  }
  if (OperationsOf(form).find(file, views) != Status::Ok) return {};
  return {views.xmp.begin(), views.xmp.end()};
}

// An EXIF block with these entries.
std::vector<uint8_t> BlockOf(const ExifChanges& changes) {
  ExifDirectories directories;
  for (const DirectoryChange& change : changes) {
    auto& directory = change.place == ExifPlace::First  ? directories.first
                      : change.place == ExifPlace::Exif ? directories.exif
                                                        : directories.gps;
    directory.push_back(*change.entry);
  }
  return MakeExifBlock(directories);
}

Status StripDirectories(std::span<const uint8_t> file, MetadataForm form,
                        const BareOptions& options, uint32_t kept, FilePieces& made,
                        std::string& reason) {
  std::vector<uint8_t> bare;
  const Status status = MakeBareTiff(file, options, bare);
  if (status == Status::UnsuitableImage)
    reason = Tr("A camera raw picture cannot be decoded without its metadata.");
  RETURN_IF_BAD(status);
  const auto view = made.Own(std::move(bare));
  DirectoryEdit edit;
  RETURN_IF_BAD(EditDirectories(view, KeptEntries(file, form, kept), edit, reason));
  AddEdited(view, std::move(edit), made);
  return Status::Ok;
}

Status MakeBare(std::span<const uint8_t> file, MetadataForm form, const BareOptions& options,
                std::vector<uint8_t>& bare) {
  switch (form) {
    case MetadataForm::Png: return MakeBarePng(file, options, bare);
    case MetadataForm::Gif: return MakeBareGif(file, options, bare);
    case MetadataForm::Psd: return MakeBarePsd(file, options, bare);
    default: return MakeBareWebp(file, options, bare);
  }
}

}  // namespace

std::span<const KeptName> KeptNames() { return kNames; }

Status StripPicture(std::span<const uint8_t> file, uint32_t kept, FilePieces& made,
                    std::string& reason) {
  made.Clear();
  const MetadataForm form = MetadataFormOf(file);
  BareOptions options{.profile = (kept & kKeepProfile) != 0,
                      .orientation = (kept & kKeepOrientation) != 0,
                      .texts = (kept & kKeepComments) != 0,
                      .iptc = (kept & kKeepIptc) != 0,
                      .xmp = (kept & kKeepXmp) != 0};
  if (form == MetadataForm::None) {
    reason = Tr(kNotStripped);
    return Status::UnsupportedFormat;
  }
  if (form == MetadataForm::Tiff || form == MetadataForm::HdPhoto)
    return StripDirectories(file, form, options, kept, made, reason);
  const std::vector<uint8_t> exif = BlockOf(KeptEntries(file, form, kept));
  const std::vector<uint8_t> xmp = options.xmp ? XmpOf(file, form) : std::vector<uint8_t>();
  if (form == MetadataForm::Jpeg) {
    options.newExif = exif;
    options.newXmp = xmp;
    return MakeBareJpeg(file, options, made);
  }
  std::vector<uint8_t> bare;
  RETURN_IF_BAD(MakeBare(file, form, options, bare));
  FilePieces pieces;
  const auto view = pieces.Own(std::move(bare));
  RETURN_IF_BAD(OperationsOf(form).rewrite(view, {exif, xmp}, made, reason));
  made.Append(std::move(pieces));  // `made` refers to them
  return Status::Ok;
}

}  // namespace fotomill
