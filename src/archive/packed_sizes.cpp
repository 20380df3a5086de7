#include "archive/packed_sizes.h"

#include <algorithm>
#include <string_view>

#include "archive/entry_name.h"
#include "core/byte_reader.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

constexpr size_t kEndSize = 22, kLocatorSize = 20, kLongestComment = 65535;
constexpr uint32_t kIn64 = 0xFFFFFFFF;  // the value is in a ZIP64 field

std::string_view TextOf(std::span<const uint8_t> bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

// The offset of the end record; the file's size if there is none.
uint64_t FindEnd(std::span<const uint8_t> file) {
  const size_t most = std::min(file.size(), kEndSize + kLongestComment);
  const size_t at = TextOf(file.last(most)).rfind("PK\5\6"sv);
  return at == std::string_view::npos ? file.size() : file.size() - most + at;
}

// The offset of the central directory; the file's size if there is none.
uint64_t FindDirectory(std::span<const uint8_t> file) {
  const uint64_t at = FindEnd(file);
  ByteReader end(file);
  end.Seek(at + 16);
  const uint32_t directory = end.Le32();
  if (!end.Ok()) return file.size();
  if (directory != kIn64 || at < kLocatorSize) return directory;
  ByteReader locator(file);
  locator.Seek(at - kLocatorSize);
  if (!locator.Match("PK\6\7"sv)) return directory;
  locator.Seek(at - kLocatorSize + 8);
  ByteReader end64(file);
  end64.Seek(locator.Le64());
  if (!end64.Match("PK\6\6"sv)) return file.size();
  end64.Skip(44);
  const uint64_t wide = end64.Le64();
  return end64.Ok() ? wide : file.size();
}

// The compressed size in the extra fields, after the uncompressed one if that is there as well.
uint64_t PackedIn(std::span<const uint8_t> extra, bool afterSize) {
  ByteReader bytes(extra);
  while (bytes.Ok() && bytes.Left() >= 4) {
    const uint16_t id = bytes.Le16(), size = bytes.Le16();
    if (id != 1) {
      bytes.Skip(size);
      continue;
    }
    if (afterSize) bytes.Skip(8);
    const uint64_t packed = bytes.Le64();
    return bytes.Ok() ? packed : 0;
  }
  return 0;
}

}  // namespace

std::map<std::string, uint64_t> ZipPackedSizes(std::span<const uint8_t> file, uint32_t most) {
  std::map<std::string, uint64_t> sizes;
  ByteReader bytes(file);
  bytes.Seek(FindDirectory(file));
  while (sizes.size() < most && bytes.Match("PK\1\2"sv)) {
    bytes.Skip(16);
    uint64_t packed = bytes.Le32();
    const uint32_t unpacked = bytes.Le32();
    const uint16_t nameSize = bytes.Le16(), extraSize = bytes.Le16(), commentSize = bytes.Le16();
    bytes.Skip(12);
    const auto name = bytes.Take(nameSize), extra = bytes.Take(extraSize);
    bytes.Skip(commentSize);
    if (!bytes.Ok()) break;
    if (packed == kIn64) packed = PackedIn(extra, unpacked == kIn64);
    sizes.emplace(ReadableEntryName(TextOf(name)), packed);
  }
  return sizes;
}

}  // namespace fotomill
