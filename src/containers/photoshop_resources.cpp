// A resource, big-endian:
//
//   offset size  field
//        0    4  "8BIM"; other programs use further signatures
//        4    2  number
//        6       name: length (1 byte) and characters, padded to an even size
//             4  size of the data
//                data, padded to an even size
// Source: Adobe, "Photoshop File Formats Specification" (2019), "Image Resource Blocks".
#include "containers/photoshop_resources.h"

#include <algorithm>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr std::string_view kSignatures[] = {"8BIM", "PHUT", "AgHg", "DCSR", "MeSa"};

bool MatchSignature(ByteReader& bytes) {
  return std::ranges::any_of(kSignatures, [&](std::string_view s) { return bytes.Match(s); });
}

}  // namespace

std::vector<PhotoshopResource> PhotoshopResources(std::span<const uint8_t> block, bool& complete) {
  std::vector<PhotoshopResource> resources;
  ByteReader bytes(block);
  complete = true;
  while (bytes.Left() > 0) {
    const uint64_t start = bytes.Position();
    PhotoshopResource resource;
    complete = MatchSignature(bytes);
    if (!complete) break;
    resource.number = bytes.Be16();
    bytes.Skip(bytes.U8() | 1u);
    const uint32_t size = bytes.Be32();
    resource.data = bytes.Take(size);
    complete = bytes.Ok();
    if (!complete) break;
    bytes.Skip(std::min<uint64_t>(size % 2, bytes.Left()));  // the last may lack padding
    resource.whole = block.subspan(start, bytes.Position() - start);
    resources.push_back(resource);
  }
  return resources;
}

std::span<const uint8_t> FindPhotoshopResource(std::span<const uint8_t> block, uint16_t number) {
  bool complete = false;
  const std::vector<PhotoshopResource> resources = PhotoshopResources(block, complete);
  const auto found = std::ranges::find(resources, number, &PhotoshopResource::number);
  return found == resources.end() ? std::span<const uint8_t>() : found->data;
}

std::vector<uint8_t> ReplacePhotoshopResources(std::span<const uint8_t> block,
                                               std::span<const NewResource> items) {
  std::vector<uint8_t> made;
  uint64_t copied = 0;
  const auto copyTo = [&](uint64_t end) {
    const auto part = block.subspan(copied, end - copied);
    made.insert(made.end(), part.begin(), part.end());
    copied = end;
  };
  bool complete = false;
  for (const PhotoshopResource& resource : PhotoshopResources(block, complete)) {
    const auto item = std::ranges::find(items, resource.number, &NewResource::number);
    if (item == items.end()) continue;
    const auto start = static_cast<uint64_t>(resource.whole.data() - block.data());
    const auto data = static_cast<uint64_t>(resource.data.data() - block.data());
    copyTo(data - 4);
    for (int shift = 24; shift >= 0; shift -= 8)
      made.push_back(static_cast<uint8_t>(item->data.size() >> shift));
    made.insert(made.end(), item->data.begin(), item->data.end());
    if (item->data.size() % 2 != 0) made.push_back(0);
    copied = start + resource.whole.size();
  }
  copyTo(block.size());
  return made;
}

}  // namespace fotomill
