#include "metadata/exif/exif_source.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "containers/jpeg_segments.h"
#include "containers/png_chunks.h"
#include "containers/riff_chunks.h"
#include "core/byte_reader.h"
#include "core/limits.h"
#include "formats/hdphoto/hdp_file.h"

namespace fotomill {

namespace {

// covers the directories of most pictures; the rest is read as needed
constexpr uint64_t kHeadSize = 16 * 1024;

bool Starts(std::span<const uint8_t> bytes, std::string_view text) {
  return ByteReader(bytes).Match(text);
}

// A TIFF header. JPEG XR uses it with a different magic number, but its directories are not EXIF.
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
  if (IsRiff(head, "WEBP")) return FindInWebp(place);
  if (StartsBareBlock(head) || Starts(head, kExifHead)) place = {0, file_.FileSize()};
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

Status ExifSource::FindInJpeg(Place& place) const {
  constexpr uint8_t kApp1 = 0xE1;
  const uint64_t fileSize = file_.FileSize();
  JpegWalk walk{WalkedBytes(file_)};
  for (JpegPlace segment; walk.Next(segment);) {
    const uint64_t block = segment.data + kExifHead.size();
    if (segment.marker != kApp1 || segment.end < block || !Starts(segment.first, "Exif")) continue;
    place = {block, std::min(segment.end, fileSize) - std::min(block, fileSize)};
    break;
  }
  return walk.ReadFailed() ? Status::FileReadError : Status::Ok;
}

Status ExifSource::FindInPng(Place& place) const {
  PngWalk walk{WalkedBytes(file_)};
  for (PngPlace chunk; walk.Next(chunk);) {
    if (chunk.type != "eXIf") continue;
    place = {chunk.data, std::min(chunk.size, file_.FileSize() - chunk.data)};
    break;
  }
  return walk.ReadFailed() ? Status::FileReadError : Status::Ok;
}

Status ExifSource::FindInWebp(Place& place) const {
  RiffWalk walk{WalkedBytes(file_)};
  for (RiffPlace chunk; walk.Next(chunk);) {
    if (chunk.name != "EXIF") continue;
    place = {chunk.data, chunk.size};
    break;
  }
  return walk.ReadFailed() ? Status::FileReadError : Status::Ok;
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
    if (!file_.ReadAt(place.offset, copy_.Bytes())) return Status::FileReadError;
    block_ = copy_.Bytes();
  }
  if (Starts(block_, kExifHead)) block_ = block_.subspan(kExifHead.size());
  return Status::Ok;
}

}  // namespace fotomill
