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
#include "metadata/xmp/xmp_edit.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint16_t kOrientation = 0x0112, kArtist = 0x013b, kCopyright = 0x8298,
                   kMakerNote = 0x927c, kXmpTag = 700;

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
  return TakenEntries(GatherPictureExif(file), [&](const ExifEntry& entry, ExifPlace place) {
    // in TIFF and HD Photo, MakeBareTiff keeps the orientation
    const bool own = entry.tag == kOrientation && form != MetadataForm::Jpeg &&
                     form != MetadataForm::Png && form != MetadataForm::Webp;
    return !own && IsKept(entry, place, kept);
  });
}

std::vector<uint8_t> XmpOf(std::span<const uint8_t> file, MetadataForm form) {
  MetadataViews views;
  const Status status = form == MetadataForm::Jpeg  ? FindJpegMetadata(file, views)
                        : form == MetadataForm::Png ? FindPngMetadata(file, views)
                                                    : FindWebpMetadata(file, views);
  if (status != Status::Ok) return {};
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

void BlankPlaces(std::span<const uint8_t> file, std::span<const uint8_t> packet,
                 std::vector<DirectoryEdit::Patch>& patches) {
  std::vector<uint8_t> blanked(packet.begin(), packet.end());
  if (BlankXmpPlaces(blanked))
    patches.push_back({static_cast<uint64_t>(packet.data() - file.data()), std::move(blanked)});
}

// Finds GPS directories and XMP positions in all JPEG streams from `from` on. Patch offsets are
// relative to `file`.
Status ErasePlacesBehind(std::span<const uint8_t> file, uint64_t from,
                         std::vector<DirectoryEdit::Patch>& patches, std::string& reason) {
  const DirectoryChange change{.place = ExifPlace::Gps, .all = true};
  for (uint64_t at = from; at + 10 < file.size();) {
    const void* found = std::memchr(&file[at], 0xFF, file.size() - at - 10);
    if (found == nullptr) break;
    at = static_cast<uint64_t>(static_cast<const uint8_t*>(found) - file.data());
    ByteReader bytes(file.subspan(at + 1));
    const bool application = bytes.U8() == 0xE1;
    const uint16_t length = bytes.Be16();
    ++at;
    if (!application || length < 22) continue;
    const auto offset = [&](std::span<const uint8_t> part) {
      return static_cast<uint64_t>(part.data() - file.data());
    };
    if (bytes.Match("http://ns.adobe.com/")) {
      const auto packet = bytes.Peek(std::min<uint64_t>(length - 22u, bytes.Left()));
      BlankPlaces(file, packet, patches);
      if (!packet.empty()) at = offset(packet) + packet.size();
      continue;
    }
    if (!bytes.Match(kExifHead)) continue;
    const auto block = bytes.Peek(length - 8u);
    DirectoryEdit edit;
    // not an EXIF block after all
    if (EditDirectories(block, {&change, 1}, edit, reason) != Status::Ok) continue;
    if (!edit.tail.empty()) {
      reason = Tr("The place shares its bytes with other values.");
      return Status::UnsuitableImage;
    }
    for (auto& patch : edit.patches)
      patches.push_back({offset(block) + patch.at, std::move(patch.bytes)});
    at = offset(block) + block.size();
  }
  reason.clear();
  return Status::Ok;
}

Status StripJpegPlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason) {
  JpegHead head;
  RETURN_IF_BAD(ParseJpegHead(file, head));
  DirectoryEdit edit;
  const DirectoryChange change{.place = ExifPlace::Gps, .all = true};
  for (const JpegSegment& segment : head.segments) {
    if (segment.marker != 0xE1) continue;
    if (!segment.Starts("Exif")) {
      BlankPlaces(file, segment.data, edit.patches);
    } else if (segment.data.size() > kExifHead.size()) {
      const auto block = segment.data.subspan(kExifHead.size());
      DirectoryEdit own;
      RETURN_IF_BAD(EditDirectories(block, {&change, 1}, own, reason));
      if (!own.tail.empty()) {
        reason = Tr("The place shares its bytes with other values.");
        return Status::UnsuitableImage;
      }
      const auto base = static_cast<uint64_t>(block.data() - file.data());
      for (auto& patch : own.patches)
        edit.patches.push_back({base + patch.at, std::move(patch.bytes)});
    }
  }
  RETURN_IF_BAD(ErasePlacesBehind(file, head.scan, edit.patches, reason));
  AddEdited(file, std::move(edit), made);
  return Status::Ok;
}

Status StripFilePlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason) {
  DirectoryEdit edit;
  const DirectoryChange change{.place = ExifPlace::Gps, .all = true};
  RETURN_IF_BAD(EditDirectories(file, {&change, 1}, edit, reason));
  if (!edit.tail.empty()) {
    reason = Tr("The place shares its bytes with other values.");
    return Status::UnsuitableImage;
  }
  std::vector<DirectoryValue> packets = FindDirectoryValues(file, kXmpTag);
  // pages may share one
  std::ranges::sort(packets, {}, [](const DirectoryValue& xmp) { return xmp.bytes.data(); });
  uint64_t end = 0;
  for (const DirectoryValue& xmp : packets) {
    const auto at = static_cast<uint64_t>(xmp.bytes.data() - file.data());
    if (xmp.bytes.empty() || at < end) continue;
    BlankPlaces(file, xmp.bytes, edit.patches);
    end = at + xmp.bytes.size();
  }
  std::ranges::sort(edit.patches, {}, &DirectoryEdit::Patch::at);
  AddEdited(file, std::move(edit), made);
  return Status::Ok;
}

// Whether a PNG file has EXIF or XMP in a compressed or hexadecimal text chunk.
bool HasRawProfile(std::span<const uint8_t> file) {
  PngChunks chunks(file);
  for (PngChunk chunk; chunks.Next(chunk);) {
    if (chunk.type != "tEXt" && chunk.type != "zTXt" && chunk.type != "iTXt") continue;
    ByteReader text(chunk.data);
    if (text.Match("Raw profile type ")) return true;
    if (text.Match(std::string_view("XML:com.adobe.xmp\0\1", 19))) return true;
  }
  return false;
}

Status StripBlockPlaces(std::span<const uint8_t> file, MetadataForm form, FilePieces& made,
                        std::string& reason) {
  const bool png = form == MetadataForm::Png;
  if (png && HasRawProfile(file)) {
    reason = Tr("The file has metadata in a text chunk, which may tell the place.");
    return Status::UnsuitableImage;
  }
  MetadataViews views;
  RETURN_IF_BAD(png ? FindPngMetadata(file, views) : FindWebpMetadata(file, views));
  MetadataBlocks blocks;
  if (!views.exif.empty()) {
    DirectoryEdit edit;
    const DirectoryChange change{.place = ExifPlace::Gps, .all = true};
    RETURN_IF_BAD(EditDirectories(views.exif, {&change, 1}, edit, reason));
    if (!edit.Empty()) blocks.exif = EditedBlock(views.exif, std::move(edit));
  }
  std::vector<uint8_t> packet(views.xmp.begin(), views.xmp.end());
  if (BlankXmpPlaces(packet)) blocks.xmp = std::move(packet);
  return png ? RewritePng(file, blocks, made, reason) : RewriteWebp(file, blocks, made, reason);
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
    reason = Tr("Metadata can be removed from JPEG, TIFF, PNG, WebP and HD Photo files.");
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
  const bool png = form == MetadataForm::Png;
  std::vector<uint8_t> bare;
  RETURN_IF_BAD(png ? MakeBarePng(file, options, bare) : MakeBareWebp(file, options, bare));
  FilePieces pieces;
  const auto view = pieces.Own(std::move(bare));
  const MetadataBlocks blocks{exif, xmp};
  RETURN_IF_BAD(png ? RewritePng(view, blocks, made, reason)
                    : RewriteWebp(view, blocks, made, reason));
  made.Append(std::move(pieces));  // `made` refers to them
  return Status::Ok;
}

Status StripPlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason) {
  made.Clear();
  switch (const MetadataForm form = MetadataFormOf(file)) {
    case MetadataForm::Jpeg: return StripJpegPlaces(file, made, reason);
    case MetadataForm::Png:
    case MetadataForm::Webp: return StripBlockPlaces(file, form, made, reason);
    case MetadataForm::Tiff:
    case MetadataForm::HdPhoto: return StripFilePlaces(file, made, reason);
    case MetadataForm::None: break;
  }
  reason = Tr("Metadata can be removed from JPEG, TIFF, PNG, WebP and HD Photo files.");
  return Status::UnsupportedFormat;
}

}  // namespace fotomill
