#include "metadata/exif/exif_source.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <string_view>
#include <vector>

#include "core/byte_reader.h"
#include "core/limits.h"
#include "formats/hdphoto/hdp_file.h"

namespace fotomill {

namespace {

constexpr uint64_t kHeadSize = 16 * 1024;  // holds the directories of most pictures; the rest is read when needed
constexpr std::string_view kExifMark("Exif\0\0", 6);
constexpr std::string_view kPngSignature("\x89PNG\r\n\x1a\n", 8);
constexpr size_t kPngChunkSize = 12;  // of an empty chunk: length, type, checksum
constexpr int kMostParts = 65536;     // segments or chunks that are passed by in search of the block

bool Starts(std::span<const uint8_t> bytes, std::string_view text) { return ByteReader(bytes).Match(text); }

// A TIFF header. JPEG XR borrows its look with a magic number of its own, but its own directories are not EXIF.
bool StartsBareBlock(std::span<const uint8_t> head) {
  if (Starts(head, "II")) return !Starts(head, "II\xBC");
  if (Starts(head, "MM")) return true;
  ByteReader bytes(head);
  bytes.Skip(2);
  return bytes.Be16() == 42 && bytes.Be32() >= 8 && bytes.Ok();
}

}  // namespace

Status ExifSource::Open(const char* path) {
  block_ = {};
  copy_.Free();
  if (!file_.OpenHead(path, kHeadSize)) return Status::FileOpenError;
  if (Starts(file_.Bytes(), "II\xBC")) return GatherFromHdp(path);
  Place place;
  RETURN_IF_BAD(Find(place));
  return Take(path, place);
}

Status ExifSource::Find(Place& place) const {
  const auto head = file_.Bytes();
  if (Starts(head, "\xFF\xD8")) return FindInJpeg(place);
  if (Starts(head, kPngSignature)) return FindInPng(place);
  if (Starts(head, "RIFF") && head.size() >= 12 && Starts(head.subspan(8), "WEBP")) return FindInWebp(place);
  if (StartsBareBlock(head) || Starts(head, kExifMark)) place = {0, file_.FileSize()};
  return Status::Ok;
}

Status ExifSource::GatherFromHdp(const char* path) {
  if (!file_.Open(path)) return Status::FileOpenError;
  HdpPage page;
  if (ParseHdpPage(file_.Bytes(), 0, page) != Status::Ok) return Status::Ok;
  const std::vector<uint8_t> block = HdpExifBlock(file_.Bytes(), page);
  if (block.empty()) return Status::Ok;
  if (!copy_.Allocate(block.size(), platform::Fill::Unset)) return Status::MemoryAllocationError;
  std::copy(block.begin(), block.end(), copy_.Data());
  block_ = copy_.Bytes();
  return Status::Ok;
}

// Segments: 0xFF, a marker, for most of them a 16-bit size that counts itself.
Status ExifSource::FindInJpeg(Place& place) const {
  constexpr uint8_t kApp1 = 0xE1, kEndOfImage = 0xD9, kStartOfScan = 0xDA;
  const uint64_t fileSize = file_.FileSize();
  uint64_t offset = 2;
  for (int parts = 0; parts < kMostParts && offset + 4 <= fileSize; ++parts) {
    std::array<uint8_t, 10> bytes{};
    RETURN_IF_BAD(Fetch(offset, std::span(bytes).first(std::min<uint64_t>(bytes.size(), fileSize - offset))));
    const uint8_t marker = bytes[1];
    if (bytes[0] != 0xFF || marker == kEndOfImage || marker == kStartOfScan) break;
    if (marker == 0xFF) {  // a fill byte
      ++offset;
      continue;
    }
    const bool alone = marker == 0x01 || (marker >= 0xD0 && marker <= 0xD8);
    const uint64_t size = alone ? 0 : uint64_t{bytes[2]} << 8 | bytes[3];
    if (!alone && size < 2) break;
    if (marker == kApp1 && size >= 2 + kExifMark.size() && Starts(std::span(bytes).subspan(4), "Exif")) {
      const uint64_t first = offset + 4 + kExifMark.size();
      place = {first, std::min(offset + 2 + size, fileSize) - std::min(first, fileSize)};
      break;
    }
    offset += 2 + size;
  }
  return Status::Ok;
}

Status ExifSource::FindInPng(Place& place) const {
  const uint64_t fileSize = file_.FileSize();
  uint64_t offset = kPngSignature.size();
  for (int parts = 0; parts < kMostParts && offset + kPngChunkSize <= fileSize; ++parts) {
    std::array<uint8_t, 8> bytes{};
    RETURN_IF_BAD(Fetch(offset, bytes));
    const uint64_t size = ByteReader(bytes).Be32();
    const auto type = std::span(bytes).subspan(4);
    if (Starts(type, "eXIf")) {
      place = {offset + bytes.size(), std::min(size, fileSize - offset - bytes.size())};
      break;
    }
    if (Starts(type, "IEND")) break;
    offset += kPngChunkSize + size;
  }
  return Status::Ok;
}

Status ExifSource::FindInWebp(Place& place) const {
  const uint64_t fileSize = file_.FileSize();
  uint64_t offset = 12;
  for (int parts = 0; parts < kMostParts && offset + 8 <= fileSize; ++parts) {
    std::array<uint8_t, 8> bytes{};
    RETURN_IF_BAD(Fetch(offset, bytes));
    ByteReader header(bytes);
    header.Skip(4);
    const uint64_t size = header.Le32();
    if (Starts(bytes, "EXIF")) {
      place = {offset + bytes.size(), std::min(size, fileSize - offset - bytes.size())};
      break;
    }
    offset += bytes.size() + size + size % 2;
  }
  return Status::Ok;
}

// Bytes of the file, from the head where they are there.
Status ExifSource::Fetch(uint64_t offset, std::span<uint8_t> into) const {
  return file_.ReadAt(offset, into) ? Status::Ok : Status::FileReadError;
}

Status ExifSource::Take(const char* path, const Place& place) {
  if (place.size == 0) return Status::Ok;
  if (place.offset == 0 && place.size > file_.Bytes().size()) {
    if (!file_.Open(path)) return Status::FileOpenError;
    block_ = file_.Bytes();
  } else if (place.offset + place.size <= file_.Bytes().size()) {
    block_ = file_.Bytes().subspan(place.offset, place.size);
  } else {
    if (place.size > limits.metadataBytes) return Status::MemoryAllocationError;
    if (!copy_.Allocate(place.size, platform::Fill::Unset)) return Status::MemoryAllocationError;
    RETURN_IF_BAD(Fetch(place.offset, copy_.Bytes()));
    block_ = copy_.Bytes();
  }
  if (Starts(block_, kExifMark)) block_ = block_.subspan(kExifMark.size());
  return Status::Ok;
}

}  // namespace fotomill
