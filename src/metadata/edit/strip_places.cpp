// Removes positions and place names in place: all bytes keep their offsets, except in text chunks
// of PNG files and where blocks are rewritten.
#include <algorithm>
#include <cstring>
#include <map>

#include "containers/directory_edit.h"
#include "containers/jpeg_extended_xmp.h"
#include "containers/jpeg_segments.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "core/limits.h"
#include "core/md5.h"
#include "core/text.h"
#include "formats/png/png_raw_profile.h"
#include "formats/png/png_text.h"
#include "metadata/edit/picture_edit.h"
#include "metadata/edit/strip.h"
#include "metadata/iptc/iptc_records.h"
#include "metadata/xmp/xmp_edit.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using Patches = std::vector<DirectoryEdit::Patch>;

Status RefuseShared(std::string& reason) {
  reason = Tr("The place shares its bytes with other values.");
  return Status::UnsuitableImage;
}

// Bytes that may be split over parts of a file; edited as one and put back.
class SplitBytes {
 public:
  void Add(std::span<const uint8_t> part) {
    parts_.push_back(part);
    bytes_.insert(bytes_.end(), part.begin(), part.end());
  }
  std::vector<uint8_t>& Bytes() { return bytes_; }
  // Adds patches for the parts that were changed.
  void PutBack(std::span<const uint8_t> file, Patches& patches) const {
    size_t at = 0;
    for (const auto& part : parts_) {
      const auto now = std::span(bytes_).subspan(at, part.size());
      if (!std::ranges::equal(now, part))
        patches.push_back(
            {static_cast<uint64_t>(part.data() - file.data()), {now.begin(), now.end()}});
      at += part.size();
    }
  }

 private:
  std::vector<std::span<const uint8_t>> parts_;
  std::vector<uint8_t> bytes_;
};

// Removes the GPS directory of an EXIF block, which may grow in some formats.
Status BlankExif(std::vector<uint8_t>& block, bool mayGrow, std::string& reason) {
  const DirectoryChange change{.place = ExifPlace::Gps, .all = true};
  DirectoryEdit edit;
  RETURN_IF_BAD(EditDirectories(block, {&change, 1}, edit, reason));
  if (!edit.tail.empty() && !mayGrow) return RefuseShared(reason);
  block = EditedBlock(block, std::move(edit));
  return Status::Ok;
}

// The file with patches in any order. DamagedFile if values of a damaged file lie in each other.
Status AddPatched(std::span<const uint8_t> file, DirectoryEdit edit, FilePieces& made,
                  std::string& reason) {
  std::ranges::sort(edit.patches, {}, &DirectoryEdit::Patch::at);
  const auto overlap = [](const DirectoryEdit::Patch& a, const DirectoryEdit::Patch& b) {
    return a.at + a.bytes.size() > b.at;
  };
  if (std::ranges::adjacent_find(edit.patches, overlap) != edit.patches.end()) {
    reason = Tr("The place shares its bytes with other values.");
    return Status::DamagedFile;
  }
  AddEdited(file, std::move(edit), made);
  return Status::Ok;
}

Status BlankXmp(std::span<uint8_t> packet, std::string& reason) {
  if (!IsBlankableXmp(packet)) {
    reason = Tr("Its XMP is not in UTF-8; it may tell the place.");
    return Status::UnsuitableImage;
  }
  (void)BlankXmpPlaces(packet);
  return Status::Ok;
}

// A resource within a block that may be changed.
std::span<uint8_t> ResourceIn(std::span<uint8_t> block, uint16_t number) {
  const auto data = FindPhotoshopResource(block, number);
  if (data.empty()) return {};
  return block.subspan(static_cast<size_t>(data.data() - block.data()), data.size());
}

// The digest follows if it was right: else programs would prefer IPTC from now on.
void BlankIptc(std::span<uint8_t> iptc, std::span<uint8_t> digest) {
  const bool right = std::ranges::equal(digest, IptcDigest(iptc));
  if (BlankIptcPlaces(iptc) && right) std::ranges::copy(IptcDigest(iptc), digest.begin());
}
void BlankResources(std::span<uint8_t> block) {
  BlankIptc(ResourceIn(block, kIptcResource), ResourceIn(block, kIptcDigestResource));
}

// --- JPEG ---

// The packet of an XMP segment, of either kind; empty for others.
std::span<const uint8_t> PacketOf(std::span<const uint8_t> data) {
  ByteReader bytes(data);
  if (bytes.Match(kXmpHead)) return bytes.Take(bytes.Left());
  if (!bytes.Match(kExtendedXmpHead)) return {};
  bytes.Skip(kExtendedXmpFields);
  return bytes.Take(bytes.Left());
}

// Finds GPS directories and XMP positions in all JPEG streams from `from` on. Patch offsets are
// relative to `file`.
Status ErasePlacesBehind(std::span<const uint8_t> file, uint64_t from, Patches& patches,
                         std::string& reason) {
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
    const auto data = bytes.Peek(length - 2u);
    const auto offset = [&](std::span<const uint8_t> part) {
      return static_cast<uint64_t>(part.data() - file.data());
    };
    if (const auto packet = PacketOf(data); !packet.empty()) {
      SplitBytes blanked;
      blanked.Add(packet);
      if (IsBlankableXmp(packet)) (void)BlankXmpPlaces(blanked.Bytes());
      blanked.PutBack(file, patches);
      at = offset(packet) + packet.size();
      continue;
    }
    if (!bytes.Match(kExifHead)) continue;
    const auto block = bytes.Peek(length - 8u);
    DirectoryEdit edit;
    // not an EXIF block after all
    if (EditDirectories(block, {&change, 1}, edit, reason) != Status::Ok) continue;
    if (!edit.tail.empty()) return RefuseShared(reason);
    for (auto& patch : edit.patches)
      patches.push_back({offset(block) + patch.at, std::move(patch.bytes)});
    at = offset(block) + block.size();
  }
  reason.clear();
  return Status::Ok;
}

class JpegPlaces {
 public:
  JpegPlaces(std::span<const uint8_t> file, std::string& reason) : file_(file), reason_(reason) {}

  Status Run(FilePieces& made) {
    JpegHead head;
    RETURN_IF_BAD(ParseJpegHead(file_, head));
    Sort(head);
    for (SplitBytes& block : exif_) {
      RETURN_IF_BAD(BlankExif(block.Bytes(), false, reason_));
      block.PutBack(file_, edit_.patches);
    }
    RETURN_IF_BAD(Packets());
    BlankResources(resources_.Bytes());
    resources_.PutBack(file_, edit_.patches);
    RETURN_IF_BAD(ErasePlacesBehind(file_, head.scan, edit_.patches, reason_));
    return AddPatched(file_, std::move(edit_), made, reason_);
  }

 private:
  struct Extended {
    std::vector<ExtendedXmpPart> parts;
  };

  void Sort(const JpegHead& head) {
    for (const JpegSegment& segment : head.segments) {
      ByteReader bytes(segment.data);
      if (segment.marker == 0xED && bytes.Match(kPhotoshopHead)) {
        resources_.Add(bytes.Take(bytes.Left()));
      } else if (segment.marker == 0xE1 && segment.Starts(kXmpHead)) {
        packets_.push_back(PacketOf(segment.data));
      } else if (const ExtendedXmpPart part = ExtendedXmpPartOf(segment); !part.data.empty()) {
        extended_[part.digest].parts.push_back(part);
      } else if (segment.marker == 0xE1 && segment.Starts("Exif") &&
                 segment.data.size() > kExifHead.size()) {
        AddExif(segment.data.subspan(kExifHead.size()));
      }
    }
  }
  // A block that is too large for a segment continues in the next one, without a header.
  void AddExif(std::span<const uint8_t> block) {
    const bool starts = MetadataFormOf(block) == MetadataForm::Tiff;
    if (starts || exif_.empty()) exif_.emplace_back();
    exif_.back().Add(block);
  }

  // The extended packets, then those that name their digests.
  Status Packets() {
    std::map<std::string, std::string> digests;  // old and new
    for (auto& [digest, extended] : extended_) {
      std::ranges::stable_sort(extended.parts, {}, &ExtendedXmpPart::offset);
      SplitBytes packet;
      for (const ExtendedXmpPart& part : extended.parts) packet.Add(part.data);
      const std::vector<uint8_t> before = packet.Bytes();
      RETURN_IF_BAD(BlankXmp(packet.Bytes(), reason_));
      if (packet.Bytes() == before) continue;
      packet.PutBack(file_, edit_.patches);
      const std::string made = UpperCase(Md5Text(packet.Bytes()));
      digests.emplace(digest, made);
      for (const ExtendedXmpPart& part : extended.parts) {
        const auto* place =
            static_cast<const uint8_t*>(static_cast<const void*>(part.digest.data()));
        edit_.patches.push_back(
            {static_cast<uint64_t>(place - file_.data()), {made.begin(), made.end()}});
      }
    }
    for (const auto& packet : packets_) {
      SplitBytes blanked;
      blanked.Add(packet);
      RETURN_IF_BAD(BlankXmp(blanked.Bytes(), reason_));
      for (const auto& [old, made] : digests) {
        auto rest = blanked.Bytes().begin();
        const auto end = blanked.Bytes().end();
        while ((rest = std::search(rest, end, old.begin(), old.end())) != end)
          rest = std::ranges::copy(made, rest).out;
      }
      blanked.PutBack(file_, edit_.patches);
    }
    return Status::Ok;
  }

  const std::span<const uint8_t> file_;
  std::string& reason_;
  DirectoryEdit edit_;
  std::vector<SplitBytes> exif_;
  SplitBytes resources_;
  std::vector<std::span<const uint8_t>> packets_;
  std::map<std::string_view, Extended> extended_;  // by digest
};

// --- PNG, WebP, GIF and Photoshop ---

// The data of an APP1 segment: EXIF, with or without its signature, or XMP.
Status BlankApp1(std::vector<uint8_t>& data, std::string& reason) {
  if (ByteReader(data).Match(kXmpHead))
    return BlankXmp(std::span(data).subspan(kXmpHead.size()), reason);
  const auto head =
      static_cast<ptrdiff_t>(ByteReader(data).Match(kExifHead) ? kExifHead.size() : 0);
  std::vector<uint8_t> block(data.begin() + head, data.end());
  RETURN_IF_BAD(BlankExif(block, true, reason));
  data.resize(static_cast<size_t>(head));
  data.insert(data.end(), block.begin(), block.end());
  return Status::Ok;
}

// The new chunk for a text with metadata; empty if nothing changes.
Status BlankPngText(const PngChunk& old, std::vector<uint8_t>& chunk, std::string& reason) {
  const std::string_view keyword = PngTextKeyword(old);
  const PngRawProfile profile = PngRawProfileOf(keyword);
  const bool standard = keyword == "XML:com.adobe.xmp";
  if (!standard && profile == PngRawProfile::None) return Status::Ok;
  const std::vector<uint8_t> before =
      standard ? PngTextOf(old, limits.pngTextBytes) : ReadPngRawProfile(old);
  std::vector<uint8_t> bytes = before;
  if (bytes.empty() && !old.data.empty()) {
    reason = Tr("The file has metadata in a text chunk, which may tell the place.");
    return Status::UnsuitableImage;
  }
  if (standard || profile == PngRawProfile::Xmp) {
    RETURN_IF_BAD(BlankXmp(bytes, reason));
  } else if (profile == PngRawProfile::Exif) {
    RETURN_IF_BAD(BlankApp1(bytes, reason));
  } else if (profile == PngRawProfile::Iptc) {
    BlankResources(bytes);
    (void)BlankIptcPlaces(bytes);  // without resources around it
  }
  if (bytes == before) return Status::Ok;
  chunk =
      standard ? MakePngXmpChunk(bytes) : MakePngChunk("zTXt", MakePngRawProfile(keyword, bytes));
  return Status::Ok;
}

Status StripPngPlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason) {
  PngWalk walk(file);
  uint64_t end = kPngSignature.size();
  made.Keep(file.first(end));
  for (PngPlace place; walk.Next(place);) {
    if (place.End() > file.size()) return Status::FileReadError;
    const PngChunk chunk{place.type, file.subspan(place.data, place.size)};
    std::vector<uint8_t> changed;
    if (chunk.type == "eXIf") {
      std::vector<uint8_t> block(chunk.data.begin(), chunk.data.end());
      RETURN_IF_BAD(BlankExif(block, true, reason));
      if (!std::ranges::equal(block, chunk.data)) changed = MakePngChunk("eXIf", block);
    } else if (chunk.type == "tEXt" || chunk.type == "zTXt" || chunk.type == "iTXt") {
      RETURN_IF_BAD(BlankPngText(chunk, changed, reason));
    }
    end = place.End();
    if (changed.empty()) {
      made.Keep(file.subspan(place.data - 8, end - place.data + 8));
    } else {
      made.Add(std::move(changed));
    }
  }
  made.Keep(file.subspan(end));
  return walk.Outcome();
}

// WebP, GIF and Photoshop.
Status StripBlockPlaces(std::span<const uint8_t> file, MetadataForm form, FilePieces& made,
                        std::string& reason) {
  MetadataViews views;
  RETURN_IF_BAD(OperationsOf(form).find(file, views));
  MetadataBlocks blocks;
  std::vector<uint8_t> exif(views.exif.begin(), views.exif.end());
  if (!exif.empty()) {
    RETURN_IF_BAD(BlankExif(exif, true, reason));
    if (!std::ranges::equal(exif, views.exif)) blocks.exif = std::move(exif);
  }
  std::vector<uint8_t> packet(views.xmp.begin(), views.xmp.end());
  RETURN_IF_BAD(BlankXmp(packet, reason));
  if (!std::ranges::equal(packet, views.xmp)) blocks.xmp = std::move(packet);
  if (form == MetadataForm::Psd) {
    const auto resources = PsdResources(file);
    blocks.iptc.emplace(resources.begin(), resources.end());
    BlankResources(*blocks.iptc);
  }
  return OperationsOf(form).rewrite(file, blocks, made, reason);
}

// --- TIFF and HD Photo ---

// The values of a tag in all directories, once each: pages may share them.
std::vector<SplitBytes> ValuesOf(std::span<const uint8_t> file, uint16_t tag) {
  std::vector<DirectoryValue> values = FindDirectoryValues(file, tag);
  std::ranges::sort(values, {}, [](const DirectoryValue& value) { return value.bytes.data(); });
  std::vector<SplitBytes> split;
  const uint8_t* end = nullptr;
  for (const DirectoryValue& value : values) {
    if (value.bytes.empty() || value.bytes.data() < end) continue;
    split.emplace_back().Add(value.bytes);
    end = value.bytes.data() + value.bytes.size();
  }
  return split;
}

Status StripFilePlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason) {
  constexpr uint16_t kXmpTag = 700, kIptcTag = 33723, kPhotoshopTag = 34377;
  DirectoryEdit edit;
  const DirectoryChange change{.place = ExifPlace::Gps, .all = true};
  RETURN_IF_BAD(EditDirectories(file, {&change, 1}, edit, reason));
  if (!edit.tail.empty()) return RefuseShared(reason);
  for (SplitBytes& packet : ValuesOf(file, kXmpTag)) {
    RETURN_IF_BAD(BlankXmp(packet.Bytes(), reason));
    packet.PutBack(file, edit.patches);
  }
  std::vector<SplitBytes> resources = ValuesOf(file, kPhotoshopTag);
  for (SplitBytes& iptc : ValuesOf(file, kIptcTag)) {
    const std::span<uint8_t> digest = resources.empty()
                                          ? std::span<uint8_t>()
                                          : ResourceIn(resources[0].Bytes(), kIptcDigestResource);
    BlankIptc(iptc.Bytes(), digest);
    iptc.PutBack(file, edit.patches);
  }
  for (SplitBytes& block : resources) {
    BlankResources(block.Bytes());
    block.PutBack(file, edit.patches);
  }
  return AddPatched(file, std::move(edit), made, reason);
}

}  // namespace

Status StripPlaces(std::span<const uint8_t> file, FilePieces& made, std::string& reason) {
  made.Clear();
  switch (MetadataFormOf(file)) {
    case MetadataForm::Jpeg: return JpegPlaces(file, reason).Run(made);
    case MetadataForm::Png: return StripPngPlaces(file, made, reason);
    case MetadataForm::Webp:
    case MetadataForm::Gif:
    case MetadataForm::Psd: return StripBlockPlaces(file, MetadataFormOf(file), made, reason);
    case MetadataForm::Tiff:
    case MetadataForm::HdPhoto: return StripFilePlaces(file, made, reason);
    case MetadataForm::None: break;
  }
  reason = Tr(kNotStripped);
  return Status::UnsupportedFormat;
}

}  // namespace fotomill
