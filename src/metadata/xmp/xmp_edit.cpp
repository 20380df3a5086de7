// The orientation in an XMP packet, in one of its two forms:
//
//   <rdf:Description ... tiff:Orientation="6" ...>
//   <tiff:Orientation>6</tiff:Orientation>
// Source: ISO 16684-1:2012, sections 7.4 and 7.5; XMP specification part 2, "TIFF schema".
#include "metadata/xmp/xmp_edit.h"

#include <algorithm>
#include <string_view>

namespace fotomill {

namespace {

constexpr std::string_view kName = "tiff:Orientation";

bool IsBlank(uint8_t c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

// Where the value behind a name begins: beyond "=" and a quotation mark, or beyond ">"; the
// packet's end when it does not.
size_t ValueBehind(std::span<const uint8_t> packet, size_t at) {
  const auto skipBlanks = [&] {
    while (at < packet.size() && IsBlank(packet[at])) ++at;
  };
  skipBlanks();
  if (at < packet.size() && packet[at] == '=') {
    ++at;
    skipBlanks();
    return at < packet.size() && (packet[at] == '"' || packet[at] == '\'') ? at + 1 : packet.size();
  }
  if (at >= packet.size() || packet[at] != '>') return packet.size();
  ++at;
  skipBlanks();
  return at;
}

}  // namespace

void SetXmpOrientation(std::span<uint8_t> packet, int32_t orientation) {
  auto rest = packet.begin();
  while ((rest = std::search(rest, packet.end(), kName.begin(), kName.end())) != packet.end()) {
    rest += kName.size();
    const size_t value = ValueBehind(packet, static_cast<size_t>(rest - packet.begin()));
    const bool oneDigit = value + 1 < packet.size() && packet[value] >= '1' &&
                          packet[value] <= '8' &&
                          (packet[value + 1] < '0' || packet[value + 1] > '9');
    if (oneDigit) packet[value] = static_cast<uint8_t>('0' + orientation);
  }
}

}  // namespace fotomill
