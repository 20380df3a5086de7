#include "containers/exif_directories.h"

#include <algorithm>
#include <iterator>

#include "containers/directory_bytes.h"
#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

namespace {

constexpr uint16_t kExifPointer = 0x8769, kGpsPointer = 0x8825, kInteroperabilityPointer = 0xA005,
                   kOrientation = 0x0112;
constexpr uint16_t kShort = 3, kLong = 4;
constexpr uint16_t kMostTypes = 13;

// Tags of IFD0 that describe the picture: author, date and camera; orientation; ratings; titles.
constexpr uint16_t kDescriptive[] = {0x010D, 0x010E, 0x010F, 0x0110, kOrientation, 0x0131,
                                     0x0132, 0x013B, 0x013C, 0x4746, 0x4749,       0x8298,
                                     0x9C9B, 0x9C9C, 0x9C9D, 0x9C9E, 0x9C9F};

bool IsPointer(uint16_t tag) {
  return tag == kExifPointer || tag == kGpsPointer || tag == kInteroperabilityPointer;
}

class DirectoryReader {
 public:
  DirectoryReader(std::span<const uint8_t> file, const DirectoryForm& form)
      : file_(file), form_(form) {}

  // The entries of the directory at `offset`, and the offsets of its subdirectories.
  struct Result {
    ExifDirectory entries;
    uint64_t exif = 0, gps = 0, interoperability = 0;
  };
  Result Read(uint64_t offset) {
    Result result;
    ByteReader bytes(file_);
    bytes.Seek(offset);
    const uint64_t count = form_.wide ? Wide(bytes) : Short(bytes);
    for (uint64_t i = 0; offset != 0 && i < count && bytes.Ok() && entriesLeft_ > 0;
         ++i, --entriesLeft_)
      TakeEntry(bytes, result);
    return result;
  }

 private:
  uint64_t Short(ByteReader& bytes) const { return form_.bigEndian ? bytes.Be16() : bytes.Le16(); }
  uint64_t Long(ByteReader& bytes) const { return form_.bigEndian ? bytes.Be32() : bytes.Le32(); }
  uint64_t Wide(ByteReader& bytes) const { return form_.bigEndian ? bytes.Be64() : bytes.Le64(); }

  void TakeEntry(ByteReader& bytes, Result& result) {
    ExifEntry entry;
    entry.tag = static_cast<uint16_t>(Short(bytes));
    entry.type = static_cast<uint16_t>(Short(bytes));
    const uint64_t count = form_.wide ? Wide(bytes) : Long(bytes);
    const uint64_t inside = form_.wide ? 8 : 4, place = bytes.Position();
    const uint64_t value = form_.wide ? Wide(bytes) : Long(bytes);
    if (!bytes.Ok()) return;
    if (IsPointer(entry.tag)) {
      (entry.tag == kExifPointer ? result.exif : entry.tag == kGpsPointer ? result.gps : result.interoperability) = value;
      return;
    }
    if (entry.type == 0 || entry.type > kMostTypes || count > bytesLeft_) return;
    const uint64_t size = count * DirectoryValueBytes(entry.type),
                   at = size <= inside ? place : value;
    if (size > bytesLeft_ || at > file_.size() || size > file_.size() - at) return;
    const auto values = file_.subspan(at, size);
    entry.count = static_cast<uint32_t>(count);
    entry.value.assign(values.begin(), values.end());
    bytesLeft_ -= size;
    result.entries.push_back(std::move(entry));
  }

  std::span<const uint8_t> file_;
  DirectoryForm form_;
  uint64_t entriesLeft_ = limits.exifEntries, bytesLeft_ = limits.metadataBytes;
};

// Writes directories one after the other, in a given byte order.
class DirectoryWriter {
 public:
  DirectoryWriter(std::vector<uint8_t>& bytes, uint32_t base, bool bigEndian, bool swapped)
      : bytes_(bytes), base_(base), bigEndian_(bigEndian), swapped_(swapped) {}

  void Short(uint16_t value) { Number(value, 2); }
  void Long(uint32_t value) { Number(value, 4); }
  uint32_t Position() const { return base_ + static_cast<uint32_t>(bytes_.size()); }

  // Writes a directory with its values; returns its offset, 0 for an empty one.
  uint32_t Write(ExifDirectory directory) {
    if (directory.empty()) return 0;
    std::stable_sort(directory.begin(), directory.end(),
                     [](const ExifEntry& a, const ExifEntry& b) { return a.tag < b.tag; });
    const uint32_t start = Position();
    Short(static_cast<uint16_t>(directory.size()));
    uint32_t place = start + static_cast<uint32_t>(2 + 12 * directory.size() + 4);
    for (const ExifEntry& entry : directory) {
      Short(entry.tag);
      Short(entry.type);
      Long(entry.count);
      if (entry.value.size() <= 4) {
        Values(entry);
        bytes_.resize(bytes_.size() + 4 - entry.value.size());
      } else {
        Long(place);
        place += static_cast<uint32_t>(entry.value.size() + entry.value.size() % 2);
      }
    }
    Long(0);
    for (const ExifEntry& entry : directory) {
      if (entry.value.size() <= 4) continue;
      Values(entry);
      bytes_.resize(bytes_.size() + entry.value.size() % 2);
    }
    return start;
  }

  // A pointer to a directory, in the byte order of the directories.
  ExifEntry Pointer(uint16_t tag, uint32_t offset) const {
    ExifEntry entry{tag, kLong, 1, {}};
    const bool big = bigEndian_ != swapped_;
    for (int i = 0; i < 4; ++i)
      entry.value.push_back(static_cast<uint8_t>(offset >> (big ? 24 - 8 * i : 8 * i)));
    return entry;
  }

 private:
  void Number(uint32_t value, int count) {
    for (int i = 0; i < count; ++i)
      bytes_.push_back(static_cast<uint8_t>(value >> 8 * (bigEndian_ ? count - 1 - i : i)));
  }
  void Values(const ExifEntry& entry) {
    const size_t unit = swapped_ ? DirectoryUnitBytes(entry.type) : 1;
    for (size_t i = 0; i + unit <= entry.value.size(); i += unit) {
      for (size_t k = unit; k > 0; --k) bytes_.push_back(entry.value[i + k - 1]);
    }
  }

  std::vector<uint8_t>& bytes_;
  uint32_t base_;
  bool bigEndian_, swapped_;
};

// The GPS and EXIF directories, preceded by the one that EXIF points to.
void WriteSubdirectories(DirectoryWriter& writer, const ExifDirectories& directories,
                         uint32_t& exif, uint32_t& gps) {
  ExifDirectory entries = directories.exif;
  if (const uint32_t place = writer.Write(directories.interoperability); place != 0) {
    entries.push_back(writer.Pointer(kInteroperabilityPointer, place));
  }
  exif = writer.Write(std::move(entries));
  gps = writer.Write(directories.gps);
}

}  // namespace

ExifDirectories GatherExif(std::span<const uint8_t> file, const DirectoryForm& form,
                           uint64_t offset) {
  DirectoryReader reader(file, form);
  ExifDirectories directories;
  directories.bigEndian = form.bigEndian;
  DirectoryReader::Result first = reader.Read(offset), exif = reader.Read(first.exif);
  std::erase_if(first.entries, [](const ExifEntry& entry) {
    return std::find(std::begin(kDescriptive), std::end(kDescriptive), entry.tag) ==
           std::end(kDescriptive);
  });
  directories.first = std::move(first.entries);
  directories.exif = std::move(exif.entries);
  directories.interoperability = reader.Read(exif.interoperability).entries;
  directories.gps = reader.Read(first.gps).entries;
  return directories;
}

ExifDirectories ParseExifBlock(std::span<const uint8_t> block) {
  constexpr uint16_t kMagic = 42;
  ByteReader bytes(block);
  const bool big = bytes.Match("MM");
  if (!big && !bytes.Match("II")) return {};
  if ((big ? bytes.Be16() : bytes.Le16()) != kMagic) return {};
  const uint32_t first = big ? bytes.Be32() : bytes.Le32();
  return bytes.Ok() ? GatherExif(block, {big, false}, first) : ExifDirectories();
}

std::vector<uint8_t> MakeExifBlock(const ExifDirectories& directories) {
  std::vector<uint8_t> subdirectories, block;
  // IFD0 comes first: the other offsets depend on its size.
  ExifDirectory first = directories.first;
  const bool hasExif = !directories.exif.empty() || !directories.interoperability.empty(),
             hasGps = !directories.gps.empty();
  uint64_t size = 8 + 2 + 12 * (first.size() + (hasExif ? 1 : 0) + (hasGps ? 1 : 0)) + 4;
  for (const ExifEntry& entry : first)
    size += entry.value.size() <= 4 ? 0 : entry.value.size() + entry.value.size() % 2;
  DirectoryWriter behind(subdirectories, static_cast<uint32_t>(size), directories.bigEndian, false);
  uint32_t exif = 0, gps = 0;
  WriteSubdirectories(behind, directories, exif, gps);
  if (exif != 0) first.push_back(behind.Pointer(kExifPointer, exif));
  if (gps != 0) first.push_back(behind.Pointer(kGpsPointer, gps));
  if (first.empty()) return {};
  block.assign(2, directories.bigEndian ? uint8_t{'M'} : uint8_t{'I'});
  DirectoryWriter front(block, 0, directories.bigEndian, false);
  front.Short(42);
  front.Long(8);
  front.Write(std::move(first));
  block.insert(block.end(), subdirectories.begin(), subdirectories.end());
  return block;
}

std::vector<uint8_t> MakePictureBlock(ExifDirectories directories) {
  if (directories.exif.empty() && directories.gps.empty()) {
    const uint16_t orientation = OrientationOf(directories);
    directories.first.clear();
    if (orientation > 1) SetOrientation(directories, orientation);
  }
  return MakeExifBlock(directories);
}

PlacedExif PlaceExif(const ExifDirectories& directories, uint32_t base) {
  PlacedExif placed;
  DirectoryWriter writer(placed.bytes, base, false, directories.bigEndian);
  WriteSubdirectories(writer, directories, placed.exifOffset, placed.gpsOffset);
  return placed;
}

uint16_t OrientationOf(const ExifDirectories& directories) {
  for (const ExifEntry& entry : directories.first) {
    if (entry.tag != kOrientation || entry.type != kShort || entry.value.size() < 2) continue;
    const int value = directories.bigEndian ? entry.value[0] << 8 | entry.value[1]
                                            : entry.value[1] << 8 | entry.value[0];
    return value >= 1 && value <= 8 ? static_cast<uint16_t>(value) : uint16_t{1};
  }
  return 1;
}

void SetOrientation(ExifDirectories& directories, uint16_t orientation) {
  std::erase_if(directories.first,
                [](const ExifEntry& entry) { return entry.tag == kOrientation; });
  const auto low = static_cast<uint8_t>(orientation);
  directories.first.push_back(
      {kOrientation, kShort, 1, directories.bigEndian ? std::vector<uint8_t>{0, low} : std::vector<uint8_t>{low, 0}});
}

}  // namespace fotomill
