// Icons of macOS (ICNS), read only: PNG entries through libpng, entries of packed colors by code
// here. Entries of JPEG 2000 are passed over.
//
//   "icns", size of the file; entries: type, size with these 8 bytes, data; all big-endian
//
// Colors are packed by component: a byte below 128 is followed by that many bytes and one more, any
// other by one byte that stands for that many, less 125. Data of just the size of the pixels are
// not packed: red, green, blue of one pixel after the other. Alpha is an entry of its own, not
// packed; "ARGB" entries have it before the colors, packed as well. Source: the format as Apple's
// IconStorage.h (2001) and the Archive Team's file format wiki describe it.
#include <png.h>

#include <algorithm>
#include <span>
#include <vector>

#include "fotomill_plugin_exports.h"

namespace {

constexpr uint32_t kMostSide = 4096;
constexpr size_t kMostEntries = 256;

constexpr uint32_t Type(const char (&name)[5]) {
  return static_cast<uint32_t>(name[0]) << 24 | static_cast<uint32_t>(name[1]) << 16 |
         static_cast<uint32_t>(name[2]) << 8 | static_cast<uint32_t>(name[3]);
}

// Types of packed colors; those of PNG are known by their contents.
struct PackedType {
  uint32_t type, mask, side;
  size_t skipped;  // bytes before the colors
};
constexpr PackedType kPackedTypes[] = {
    {Type("is32"), Type("s8mk"), 16, 0},
    {Type("il32"), Type("l8mk"), 32, 0},
    {Type("ih32"), Type("h8mk"), 48, 0},
    {Type("it32"), Type("t8mk"), 128, 4},
    {Type("ic04"), 0, 16, 4},
    {Type("ic05"), 0, 32, 4},
    {Type("icsb"), 0, 18, 4},
    {Type("icsB"), 0, 36, 4},
};

using Bytes = std::span<const uint8_t>;

struct Entry {
  uint32_t type = 0;
  Bytes data;
};

// A picture of the file.
struct Icon {
  const PackedType* packed = nullptr;  // null: PNG
  Bytes data, mask;
  uint32_t width = 0, height = 0;
};

bool StartsWith(Bytes data, const char* text, size_t size) {
  return data.size() >= size && memcmp(data.data(), text, size) == 0;
}

bool IsPng(Bytes data) { return data.size() >= 24 && StartsWith(data, "\x89PNG\r\n\x1a\n", 8); }

bool IsJpeg2000(Bytes data) {
  return StartsWith(data, "\0\0\0\x0cjP  ", 8) || StartsWith(data, "\xff\x4f\xff\x51", 4);
}

bool HasOwnAlpha(const PackedType& packed) { return packed.mask == 0; }

struct File {
  FmwOwnedFile whole;
  std::vector<Icon> icons;  // the largest first
  bool others = false;      // there are pictures of JPEG 2000
};

const Entry* Find(const std::vector<Entry>& entries, uint32_t type) {
  const auto found =
      std::ranges::find_if(entries, [&](const Entry& entry) { return entry.type == type; });
  return found == entries.end() ? nullptr : &*found;
}

std::vector<Entry> EntriesOf(const FmwFile& file) {
  std::vector<Entry> entries;
  for (size_t place = 8; file.size - place >= 8 && entries.size() < kMostEntries;) {
    const uint8_t* const head = file.bytes + place;
    const size_t size = FmwGetBe(head + 4, 4);
    if (size < 8 || size > file.size - place) break;
    entries.push_back({FmwGetBe(head, 4), {head + 8, size - 8}});
    place += size;
  }
  return entries;
}

// The picture in an entry; its width is 0 if there is none.
Icon IconOf(const Entry& entry, const std::vector<Entry>& entries) {
  Icon icon;
  icon.data = entry.data;
  if (IsPng(entry.data)) {
    icon.width = FmwGetBe(entry.data.data() + 16, 4);
    icon.height = FmwGetBe(entry.data.data() + 20, 4);
    if (icon.width > kMostSide || icon.height > kMostSide || icon.height == 0) icon.width = 0;
    return icon;
  }
  for (const PackedType& packed : kPackedTypes) {
    if (packed.type != entry.type || entry.data.size() <= packed.skipped) continue;
    if (HasOwnAlpha(packed) && !StartsWith(entry.data, "ARGB", 4)) continue;
    icon.packed = &packed;
    icon.data = entry.data.subspan(packed.skipped);
    icon.width = icon.height = packed.side;
    const Entry* const mask = Find(entries, packed.mask);
    if (mask != nullptr && mask->data.size() >= size_t{packed.side} * packed.side)
      icon.mask = mask->data;
  }
  return icon;
}

int32_t Open(const char* fileName, File& file) {
  const int32_t error = FmwReadFile(fileName, UINT64_MAX, &file.whole.file);
  if (error != 0) return error;
  const Bytes bytes(file.whole.file.bytes, file.whole.file.size);
  if (!StartsWith(bytes, "icns", 4) || bytes.size() < 16) return FMW_ERROR_DAMAGED;
  const std::vector<Entry> entries = EntriesOf(file.whole.file);
  for (const Entry& entry : entries) {
    const Icon icon = IconOf(entry, entries);
    if (icon.width > 0) file.icons.push_back(icon);
    file.others |= IsJpeg2000(entry.data);
  }
  std::ranges::stable_sort(file.icons, std::ranges::greater(), &Icon::width);
  if (!file.icons.empty()) return 0;
  return entries.empty() ? FMW_ERROR_DAMAGED : FMW_ERROR_FORMAT;
}

// ---- pixels ----

// Unpacks one component; what the data lack stays as it is. False if they lack any.
bool Unpack(Bytes& data, size_t place, const FmwBitmap& bitmap) {
  const size_t count = size_t{bitmap.width} * bitmap.height;
  uint8_t* const target = bitmap.rows + place;  // rows of 4 bytes a pixel have no padding
  for (size_t done = 0; done < count;) {
    if (data.size() < 2) return false;
    const bool run = data[0] >= 128;
    const size_t length = run ? data[0] - 125u : data[0] + 1u;
    const size_t bytes = run ? 1 : length;
    if (length > count - done || bytes > data.size() - 1) return false;
    for (size_t i = 0; i < length; ++i, ++done) target[4 * done] = data[run ? 1 : 1 + i];
    data = data.subspan(1 + bytes);
  }
  return true;
}

int32_t ReadPacked(const Icon& icon, const FmwBitmap& bitmap) {
  const size_t count = size_t{icon.width} * icon.height;
  Bytes data = icon.data;
  const bool plain = !HasOwnAlpha(*icon.packed) && data.size() == 3 * count;
  if (HasOwnAlpha(*icon.packed)) {
    if (!Unpack(data, 3, bitmap)) return FMW_ERROR_READ;
  } else {
    for (size_t i = 0; i < count; ++i)
      bitmap.rows[4 * i + 3] = icon.mask.empty() ? 255 : icon.mask[i];
  }
  for (size_t i = 0; plain && i < 3 * count; ++i) bitmap.rows[i / 3 * 4 + 2 - i % 3] = data[i];
  for (size_t place = 3; !plain && place-- > 0;) {
    if (!Unpack(data, place, bitmap)) return FMW_ERROR_READ;
  }
  return 0;
}

int32_t ReadPng(const Icon& icon, const FmwBitmap& bitmap) {
  png_image image = {};
  image.version = PNG_IMAGE_VERSION;
  if (png_image_begin_read_from_memory(&image, icon.data.data(), icon.data.size()) == 0)
    return FMW_ERROR_DAMAGED;
  image.format = PNG_FORMAT_BGRA;
  const bool fits = image.width == icon.width && image.height == icon.height;
  const bool done = fits && png_image_finish_read(&image, nullptr, bitmap.rows,
                                                  static_cast<png_int_32>(bitmap.stride), nullptr);
  png_image_free(&image);
  return done ? 0 : FMW_ERROR_DAMAGED;
}

// The smallest icon that is as large as wanted, else the one of the page.
const Icon* IconFor(const File& file, const FMW_READ_REQUEST& request) {
  if (request.page < 0 || static_cast<size_t>(request.page) >= file.icons.size()) return nullptr;
  const Icon* chosen = &file.icons[static_cast<size_t>(request.page)];
  for (const Icon& icon : file.icons) {
    const uint32_t side = std::max(icon.width, icon.height);
    if (request.page == 0 && request.wantedSide > 0 &&
        side >= static_cast<uint32_t>(request.wantedSide))
      chosen = &icon;
  }
  return chosen;
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  File file;
  const int32_t error = Open(fileName, file);
  if (error != 0) return error;
  const Icon* const icon = IconFor(file, *request);
  if (icon == nullptr) return FMW_ERROR_DAMAGED;
  *bitmap = FmwNewBitmap(icon->width, icon->height, 32, request);
  if (bitmap->block == nullptr) return FMW_ERROR_MEMORY;
  return icon->packed != nullptr ? ReadPacked(*icon, *bitmap) : ReadPng(*icon, *bitmap);
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  File file;
  const int32_t error = Open(fileName, file);
  if (error != 0) return error;
  const auto last = static_cast<int32_t>(file.icons.size()) - 1;
  const Icon& icon = file.icons[static_cast<size_t>(std::clamp(info->frame, 0, last))];
  info->width = static_cast<int32_t>(icon.width);
  info->height = static_cast<int32_t>(icon.height);
  info->bitsPerPixel = 32;
  info->frame = last + 1;
  snprintf(info->typeName, sizeof info->typeName, "Apple icon, %s",
           icon.packed != nullptr ? "packed" : "PNG");
  return 0;
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST*, FMW_METADATA* metadata) {
  File file;
  const int32_t error = Open(fileName, file);
  if (file.others) metadata->lost = FMW_LOST_LAYERS;
  return error;
}

constexpr FmwModule kModule = {
    .name = "Apple icon",
    .extensions = "icns",
    .description = "Apple icon",
    .bits = 0,
    .flags = FMW_FORMAT_BITMAP | FMW_FORMAT_MULTI,
    .options = nullptr,
    .optionCount = 0,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("libpng\t%s\tlibpng-2.0", png_get_libpng_ver(nullptr))
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
