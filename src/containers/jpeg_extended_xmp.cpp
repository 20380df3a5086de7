#include "containers/jpeg_extended_xmp.h"

#include <algorithm>

#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

ExtendedXmpPart ExtendedXmpPartOf(const JpegSegment& segment) {
  constexpr uint8_t kApp1 = 0xE1;
  ByteReader bytes(segment.data);
  ExtendedXmpPart part;
  if (segment.marker != kApp1 || !bytes.Match(kExtendedXmpHead)) return {};
  part.digest = TextOf(bytes.Take(32));
  part.size = bytes.Be32();
  part.offset = bytes.Be32();
  part.data = bytes.Take(bytes.Left());
  return bytes.Ok() ? part : ExtendedXmpPart();
}

std::vector<uint8_t> JoinExtendedXmp(const JpegHead& head, std::string_view digest) {
  std::vector<ExtendedXmpPart> parts;
  uint64_t held = 0;
  for (const JpegSegment& segment : head.segments) {
    const ExtendedXmpPart part = ExtendedXmpPartOf(segment);
    if (part.data.empty() || part.digest != digest) continue;
    held += part.data.size();
    parts.push_back(part);
  }
  std::ranges::sort(parts, {}, &ExtendedXmpPart::offset);
  std::vector<uint8_t> packet;
  for (const ExtendedXmpPart& part : parts) {
    if (part.offset != packet.size() || part.size != parts[0].size) return {};
    packet.insert(packet.end(), part.data.begin(), part.data.end());
  }
  const bool complete = !parts.empty() && packet.size() == parts[0].size;
  return complete && held <= limits.metadataBytes ? packet : std::vector<uint8_t>();
}

}  // namespace fotomill
