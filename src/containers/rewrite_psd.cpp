// Photoshop files, big-endian:
//
//   offset size  field
//        0    4  "8BPS"
//        4    2  version: 1, or 2 for large documents
//        6   20  reserved, channels, height, width, depth, color mode
//       26    4  size of the color mode data, which follow
//                4  size of the resources, which follow
//                   layers and pixels
//
// Nothing refers to offsets in the file, so the resources may change their size.
// Source: Adobe, "Photoshop File Formats Specification" (2019).
#include <algorithm>
#include <utility>

#include "containers/bare_file.h"
#include "containers/metadata_rewrite.h"
#include "containers/photoshop_resources.h"
#include "core/byte_reader.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeader = 26;
constexpr uint16_t kUntaggedResource = 1041;  // there is no profile on purpose

// Resources that belong to the picture, by their numbers: resolution, channels, display, halftones,
// transparency, layers and their state, guides, color tables, pixel aspect ratio, frames, paths.
constexpr struct {
  uint16_t first, last;
} kPicture[] = {{1003, 1003}, {1005, 1007}, {1009, 1020}, {1022, 1026}, {1029, 1030}, {1032, 1032},
                {1037, 1038}, {1042, 1047}, {1049, 1049}, {1053, 1053}, {1057, 1057}, {1062, 1062},
                {1064, 1070}, {1072, 1073}, {1075, 1075}, {1077, 1077}, {2000, 2997}, {2999, 2999}};

struct Parts {
  std::span<const uint8_t> head;       // up to the size of the resources
  std::span<const uint8_t> resources;  // without their size
  std::span<const uint8_t> rest;
};

Status Split(std::span<const uint8_t> file, Parts& parts) {
  ByteReader bytes(file);
  if (!bytes.Match("8BPS")) return Status::DamagedFile;
  const uint16_t version = bytes.Be16();
  if (version != 1 && version != 2) return Status::DamagedFile;
  bytes.Seek(kHeader);
  bytes.Skip(bytes.Be32());
  if (!bytes.Ok()) return Status::FileReadError;
  parts.head = file.first(bytes.Position());
  parts.resources = bytes.Take(bytes.Be32());
  if (!bytes.Ok()) return Status::FileReadError;
  parts.rest = bytes.Take(bytes.Left());
  return Status::Ok;
}

// Whether all of the resources can be read; zeros may follow them.
bool AreWhole(std::span<const uint8_t> block, const std::vector<PhotoshopResource>& resources,
              bool complete) {
  if (complete) return true;
  uint64_t end = 0;
  for (const PhotoshopResource& resource : resources) end += resource.whole.size();
  return std::ranges::all_of(block.subspan(end), [](uint8_t byte) { return byte == 0; });
}

void PutBig(std::vector<uint8_t>& bytes, uint64_t number, int count) {
  for (int i = count - 1; i >= 0; --i) bytes.push_back(static_cast<uint8_t>(number >> 8 * i));
}

void AddResource(std::vector<uint8_t>& block, uint16_t number, std::span<const uint8_t> data) {
  constexpr std::string_view kSignature = "8BIM";
  if (block.size() % 2 != 0) block.push_back(0);  // the last one may lack padding
  block.insert(block.end(), kSignature.begin(), kSignature.end());
  PutBig(block, number, 2);
  PutBig(block, 0, 2);  // without a name
  PutBig(block, data.size(), 4);
  block.insert(block.end(), data.begin(), data.end());
  if (data.size() % 2 != 0) block.push_back(0);
}

// The resources with one of them replaced, removed (no data) or added at the end.
Status Put(std::vector<uint8_t>& block, uint16_t number, std::span<const uint8_t> data) {
  bool complete = false;
  const std::vector<PhotoshopResource> old = PhotoshopResources(block, complete);
  if (!AreWhole(block, old, complete)) return Status::DamagedFile;
  const auto found = std::ranges::find(old, number, &PhotoshopResource::number);
  if (found == old.end() && data.empty()) return Status::Ok;
  std::vector<uint8_t> made;
  if (found != old.end() && !data.empty()) {
    const NewResource item{number, data};
    made = ReplacePhotoshopResources(block, {&item, 1});
  } else {
    for (const PhotoshopResource& one : old) {
      if (one.number != number) made.insert(made.end(), one.whole.begin(), one.whole.end());
    }
    if (!data.empty()) AddResource(made, number, data);
  }
  block = std::move(made);
  return Status::Ok;
}

Status Join(const Parts& parts, std::vector<uint8_t> resources, FilePieces& made,
            std::string& reason) {
  if (resources.size() > UINT32_MAX) {
    reason = Tr("A file of this kind cannot be larger than 4 GB.");
    return Status::UnsuitableImage;
  }
  std::vector<uint8_t> size;
  PutBig(size, resources.size(), 4);
  made.Clear();
  made.Keep(parts.head);
  made.Add(std::move(size));
  made.Add(std::move(resources));
  made.Keep(parts.rest);
  return Status::Ok;
}

bool IsKept(uint16_t number, const BareOptions& options) {
  if (number == kProfileResource || number == kUntaggedResource) return options.profile;
  if (number == kIptcResource || number == kIptcDigestResource) return options.iptc;
  return std::ranges::any_of(
      kPicture, [&](const auto& range) { return number >= range.first && number <= range.last; });
}

}  // namespace

std::span<const uint8_t> PsdResources(std::span<const uint8_t> file) {
  Parts parts;
  return Split(file, parts) == Status::Ok ? parts.resources : std::span<const uint8_t>();
}

bool IsPsdPictureResource(uint16_t number) { return IsKept(number, {.profile = false}); }

Status FindPsdMetadata(std::span<const uint8_t> file, MetadataViews& views) {
  views = {};
  Parts parts;
  RETURN_IF_BAD(Split(file, parts));
  views.exif = FindPhotoshopResource(parts.resources, kExifResource);
  views.xmp = FindPhotoshopResource(parts.resources, kXmpResource);
  return Status::Ok;
}

Status RewritePsd(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string& reason) {
  Parts parts;
  RETURN_IF_BAD(Split(file, parts));
  std::vector<uint8_t> resources(parts.resources.begin(), parts.resources.end());
  if (blocks.iptc) resources = *blocks.iptc;
  if (blocks.exif) RETURN_IF_BAD(Put(resources, kExifResource, *blocks.exif));
  if (blocks.xmp) RETURN_IF_BAD(Put(resources, kXmpResource, *blocks.xmp));
  return Join(parts, std::move(resources), made, reason);
}

Status MakeBarePsd(std::span<const uint8_t> file, const BareOptions& options,
                   std::vector<uint8_t>& bare) {
  Parts parts;
  RETURN_IF_BAD(Split(file, parts));
  bool complete = false;
  const std::vector<PhotoshopResource> old = PhotoshopResources(parts.resources, complete);
  if (!AreWhole(parts.resources, old, complete)) return Status::DamagedFile;
  std::vector<uint8_t> resources;
  for (const PhotoshopResource& one : old) {
    if (IsKept(one.number, options))
      resources.insert(resources.end(), one.whole.begin(), one.whole.end());
  }
  FilePieces made;
  std::string reason;
  RETURN_IF_BAD(Join(parts, std::move(resources), made, reason));
  bare = made.Joined();
  return Status::Ok;
}

}  // namespace fotomill
