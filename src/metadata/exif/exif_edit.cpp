#include "metadata/exif/exif_edit.h"

#include <algorithm>
#include <optional>

#include "core/limits.h"
#include "metadata/exif/exif_bytes.h"

namespace fotomill {

namespace {

constexpr uint16_t kImageWidth = 0x0100, kImageHeight = 0x0101;
constexpr uint16_t kOrientation = 0x0112;
constexpr uint16_t kStripOffsets = 0x0111, kStripSizes = 0x0117;
constexpr uint16_t kValidWidth = 0xA002, kValidHeight = 0xA003;

// The directory for a new thumbnail: the mandatory entries, at 72 pixels per inch.
struct ThumbnailField {
  uint16_t tag, type;
  uint32_t number;
};
constexpr ThumbnailField kThumbnailFields[] = {
    {0x0103, kExifShort, 6},     // JPEG compression
    {0x011A, kExifRational, 0},  // both resolutions share one value after the directory
    {0x011B, kExifRational, 0},
    {0x0128, kExifShort, 2},  // inches
    {kThumbnailOffsetTag, kExifLong, 0},
    {kThumbnailSizeTag, kExifLong, 0},
};
constexpr uint64_t kResolutionSize = 8;

// A block with an empty first directory.
constexpr uint8_t kEmptyBlock[] = {'I', 'I', kExifMagic, 0, kExifHeaderSize, 0, 0, 0, 0, 0,
                                   0,   0,   0,          0};

struct Range {
  uint64_t begin, end;
};

// A directory, limited to the entries inside the block.
struct Directory {
  uint64_t offset = 0;
  uint32_t count = 0;
  bool linked = false;  // the link to the next directory is inside the block as well
  uint64_t EntryOffset(uint32_t index) const {
    return offset + kExifCountSize + index * kExifEntrySize;
  }
  uint64_t LinkOffset() const { return EntryOffset(count); }
  Range Whole() const { return {offset, LinkOffset() + (linked ? kExifLinkSize : 0)}; }
};

std::optional<Directory> DirectoryAt(const ExifBytes& block, uint64_t offset) {
  if (offset < kExifHeaderSize || offset + kExifCountSize > block.Size()) return {};
  Directory directory{offset, block.U16(offset)};
  const uint64_t room = block.Size() - offset - kExifCountSize;
  directory.linked = directory.count * kExifEntrySize + kExifLinkSize <= room;
  directory.count =
      static_cast<uint32_t>(std::min<uint64_t>(directory.count, room / kExifEntrySize));
  if (directory.count == 0) return {};
  return directory;
}

std::optional<Directory> FirstDirectory(const ExifBytes& block) {
  if (block.U16(2) != kExifMagic) return {};
  return DirectoryAt(block, block.U32(4));
}

std::optional<ExifField> FindField(const ExifBytes& block, const Directory& directory,
                                   uint16_t tag) {
  for (uint32_t i = 0; i < directory.count; ++i) {
    const ExifField field = ReadExifField(block, directory.EntryOffset(i));
    if (field.tag == tag) return field;
  }
  return {};
}

// The first value of an integer field.
uint32_t FieldNumber(const ExifBytes& block, const ExifField& field) {
  if (field.type == kExifShort) return block.U16(field.valueOffset);
  return field.type == kExifLong ? block.U32(field.valueOffset) : block.U8(field.valueOffset);
}

// The directory that an entry of `directory` points to.
std::optional<Directory> SubDirectory(const ExifBytes& block, const Directory& directory,
                                      uint16_t pointerTag) {
  const auto pointer = FindField(block, directory, pointerTag);
  return pointer ? DirectoryAt(block, FieldNumber(block, *pointer)) : std::nullopt;
}

void Put16(std::span<uint8_t> block, bool bigEndian, uint64_t offset, uint16_t number) {
  block[offset] = static_cast<uint8_t>(bigEndian ? number >> 8 : number);
  block[offset + 1] = static_cast<uint8_t>(bigEndian ? number : number >> 8);
}

void Put32(std::span<uint8_t> block, bool bigEndian, uint64_t offset, uint32_t number) {
  const auto upper = static_cast<uint16_t>(number >> 16), lower = static_cast<uint16_t>(number);
  Put16(block, bigEndian, offset, bigEndian ? upper : lower);
  Put16(block, bigEndian, offset + 2, bigEndian ? lower : upper);
}

// Overwrites an entry, except for its tag, with one inline number.
void PutField(std::span<uint8_t> block, bool bigEndian, uint64_t entryOffset, uint16_t type,
              uint32_t number) {
  Put16(block, bigEndian, entryOffset + 2, type);
  Put32(block, bigEndian, entryOffset + 4, 1);
  Put32(block, bigEndian, entryOffset + 8, type == kExifShort && bigEndian ? number << 16 : number);
}

void SetField(std::span<uint8_t> bytes, const ExifBytes& block, const Directory& directory,
              uint16_t tag, int32_t number) {
  const auto field = FindField(block, directory, tag);
  if (number <= 0 || !field) return;
  const bool asLong = number > 0xffff || (field->type == kExifLong && field->count == 1);
  PutField(bytes, block.BigEndian(), field->entryOffset, asLong ? kExifLong : kExifShort,
           static_cast<uint32_t>(number));
}

// Moves the first directory to the end of the block and inserts an empty SHORT in tag order.
void AddField(std::vector<uint8_t>& block, const Directory& first, uint16_t tag) {
  const bool bigEndian = OpenExifBytes(block).BigEndian();
  const uint64_t offset = block.size() + block.size() % 2;
  const Directory moved{offset, first.count + 1, true};
  block.resize(moved.Whole().end);
  const ExifBytes numbers(block, bigEndian);
  uint32_t before = 0;
  while (before < first.count && numbers.U16(first.EntryOffset(before)) < tag) ++before;
  const auto copy = [&](uint64_t from, uint64_t size, uint64_t to) {
    std::copy_n(block.begin() + static_cast<std::ptrdiff_t>(from), size,
                block.begin() + static_cast<std::ptrdiff_t>(to));
  };
  copy(first.EntryOffset(0), before * kExifEntrySize, moved.EntryOffset(0));
  copy(first.EntryOffset(before), (first.count - before) * kExifEntrySize,
       moved.EntryOffset(before + 1));
  if (first.linked) copy(first.LinkOffset(), kExifLinkSize, moved.LinkOffset());
  Put16(block, bigEndian, moved.offset, static_cast<uint16_t>(moved.count));
  Put16(block, bigEndian, moved.EntryOffset(before), tag);
  PutField(block, bigEndian, moved.EntryOffset(before), kExifShort, 0);
  Put32(block, bigEndian, 4, static_cast<uint32_t>(offset));
}

// Adds the bytes of a directory and of the values stored outside its entries.
void AddRanges(const ExifBytes& block, const Directory& directory, std::vector<Range>& ranges) {
  ranges.push_back(directory.Whole());
  for (uint32_t i = 0; i < directory.count; ++i) {
    const ExifField field = ReadExifField(block, directory.EntryOffset(i));
    if (field.valueOffset >= block.Size()) continue;
    ranges.push_back(
        {field.valueOffset, std::min(field.valueOffset + field.ValueSize(), block.Size())});
  }
}

// Adds what a thumbnail directory points to: a JPEG stream, or the strips of an uncompressed
// picture.
void AddThumbnailRanges(const ExifBytes& block, const Directory& directory,
                        std::vector<Range>& ranges) {
  constexpr uint16_t kPairs[][2] = {{kThumbnailOffsetTag, kThumbnailSizeTag},
                                    {kStripOffsets, kStripSizes}};
  for (const auto& [offsetTag, sizeTag] : kPairs) {
    const auto offsetField = FindField(block, directory, offsetTag),
               sizeField = FindField(block, directory, sizeTag);
    if (!offsetField || !sizeField) continue;
    const uint64_t offset = FieldNumber(block, *offsetField);
    if (offset >= block.Size()) continue;
    ranges.push_back({offset, std::min(offset + FieldNumber(block, *sizeField), block.Size())});
  }
}

// All ranges to keep without the thumbnail: header, first, EXIF, GPS and interoperability
// directories.
std::vector<Range> KeptRanges(const ExifBytes& block, const Directory& first) {
  constexpr uint16_t kInteroperabilityPointer = 0xA005;
  std::vector<Range> kept = {{0, kExifHeaderSize}};
  AddRanges(block, first, kept);
  if (const auto gps = SubDirectory(block, first, kGpsPointerTag)) AddRanges(block, *gps, kept);
  if (const auto exif = SubDirectory(block, first, kExifPointerTag)) {
    AddRanges(block, *exif, kept);
    if (const auto other = SubDirectory(block, *exif, kInteroperabilityPointer))
      AddRanges(block, *other, kept);
  }
  return kept;
}

// All ranges to drop: the directories chained after the first.
std::vector<Range> DroppedRanges(const ExifBytes& block, const Directory& first) {
  std::vector<Range> dropped;
  uint32_t entries = 0;
  auto directory = DirectoryAt(block, block.U32(first.LinkOffset()));
  while (directory) {
    entries += directory->count;
    if (entries > limits.exifEntries) break;  // probably a loop
    AddRanges(block, *directory, dropped);
    AddThumbnailRanges(block, *directory, dropped);
    if (!directory->linked) break;
    directory = DirectoryAt(block, block.U32(directory->LinkOffset()));
  }
  return dropped;
}

// Sorts ranges and merges those that touch or overlap.
void JoinRanges(std::vector<Range>& ranges) {
  std::ranges::sort(ranges, {}, &Range::begin);
  size_t count = 0;
  for (const Range& range : ranges) {
    if (count > 0 && range.begin <= ranges[count - 1].end) {
      ranges[count - 1].end = std::max(ranges[count - 1].end, range.end);
    } else {
      ranges[count++] = range;
    }
  }
  ranges.resize(count);
}

// The parts of `from` not covered by `without`; both must be joined.
std::vector<Range> Difference(const std::vector<Range>& from, const std::vector<Range>& without) {
  std::vector<Range> result;
  auto hole = without.begin();
  for (Range rest : from) {
    while (hole != without.end() && hole->end <= rest.begin) ++hole;
    for (auto next = hole; next != without.end() && next->begin < rest.end; ++next) {
      if (next->begin > rest.begin) result.push_back({rest.begin, next->begin});
      rest.begin = std::max(rest.begin, std::min(next->end, rest.end));
    }
    if (rest.begin < rest.end) result.push_back(rest);
  }
  return result;
}

}  // namespace

int32_t ExifOrientation(std::span<const uint8_t> block) {
  const ExifBytes numbers = OpenExifBytes(block);
  const auto first = FirstDirectory(numbers);
  const auto field = first ? FindField(numbers, *first, kOrientation) : std::nullopt;
  const uint32_t orientation = field ? FieldNumber(numbers, *field) : 1;
  return orientation >= 1 && orientation <= 8 ? static_cast<int32_t>(orientation) : 1;
}

void SetExifPictureFacts(std::span<uint8_t> block, const ExifPictureFacts& facts) {
  const ExifBytes numbers = OpenExifBytes(block);
  const auto first = FirstDirectory(numbers);
  if (!first) return;
  if (const auto exif = SubDirectory(numbers, *first, kExifPointerTag)) {
    SetField(block, numbers, *exif, kValidWidth, facts.width);
    SetField(block, numbers, *exif, kValidHeight, facts.height);
  }
  SetField(block, numbers, *first, kImageWidth, facts.width);
  SetField(block, numbers, *first, kImageHeight, facts.height);
  SetField(block, numbers, *first, kOrientation, facts.orientation);
}

bool PutExifOrientation(std::vector<uint8_t>& block, int32_t orientation) {
  if (block.empty()) block.assign(std::begin(kEmptyBlock), std::end(kEmptyBlock));
  const ExifBytes numbers = OpenExifBytes(block);
  if (numbers.U16(2) != kExifMagic) return false;
  const uint64_t begin = numbers.U32(4);
  const bool empty =
      begin >= kExifHeaderSize && begin + kExifCountSize <= block.size() && numbers.U16(begin) == 0;
  const auto first = empty ? std::optional(Directory{
                                 begin, 0, begin + kExifCountSize + kExifLinkSize <= block.size()})
                           : FirstDirectory(numbers);
  if (!first) return false;
  if (!FindField(numbers, *first, kOrientation)) AddField(block, *first, kOrientation);
  SetExifPictureFacts(block, {.orientation = orientation});
  return true;
}

void DropExifThumbnail(std::vector<uint8_t>& block) {
  const ExifBytes numbers = OpenExifBytes(block);
  const auto first = FirstDirectory(numbers);
  if (!first || !first->linked || numbers.U32(first->LinkOffset()) == 0) return;
  std::vector<Range> kept = KeptRanges(numbers, *first), dropped = DroppedRanges(numbers, *first);
  JoinRanges(kept);
  JoinRanges(dropped);
  Put32(block, numbers.BigEndian(), first->LinkOffset(), 0);
  for (const Range& range : Difference(dropped, kept)) {
    std::fill(block.begin() + static_cast<std::ptrdiff_t>(range.begin),
              block.begin() + static_cast<std::ptrdiff_t>(range.end), uint8_t{0});
  }
  // Trailing zeros can be dropped, since bytes beyond the end read as zero.
  size_t size = block.size();
  while (size > kept.back().end && block[size - 1] == 0) --size;
  block.resize(size);
}

bool ReplaceExifThumbnail(std::vector<uint8_t>& block, std::span<const uint8_t> thumbnail,
                          uint64_t most) {
  DropExifThumbnail(block);
  const bool bigEndian = OpenExifBytes(block).BigEndian();
  const auto first = FirstDirectory(OpenExifBytes(block));
  const uint64_t offset = block.size() + block.size() % 2;  // directories begin at even offsets
  const Directory second{offset, std::size(kThumbnailFields), true};
  const uint64_t resolution = second.Whole().end, begin = resolution + kResolutionSize,
                 end = begin + thumbnail.size();
  if (!first || !first->linked || thumbnail.empty() || end > most || end > UINT32_MAX) return false;
  block.resize(begin);
  Put32(block, bigEndian, first->LinkOffset(), static_cast<uint32_t>(offset));
  Put16(block, bigEndian, offset, std::size(kThumbnailFields));
  for (uint32_t i = 0; i < std::size(kThumbnailFields); ++i) {
    const ThumbnailField& field = kThumbnailFields[i];
    uint32_t number = field.number;
    if (field.type == kExifRational) number = static_cast<uint32_t>(resolution);
    if (field.tag == kThumbnailOffsetTag) number = static_cast<uint32_t>(begin);
    if (field.tag == kThumbnailSizeTag) number = static_cast<uint32_t>(thumbnail.size());
    Put16(block, bigEndian, second.EntryOffset(i), field.tag);
    PutField(block, bigEndian, second.EntryOffset(i), field.type, number);
  }
  Put32(block, bigEndian, resolution, 72);
  Put32(block, bigEndian, resolution + 4, 1);
  block.insert(block.end(), thumbnail.begin(), thumbnail.end());
  return true;
}

}  // namespace fotomill
