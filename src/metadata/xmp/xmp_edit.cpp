// The orientation in an XMP packet has one of two forms:
//
//   <rdf:Description ... tiff:Orientation="6" ...>
//   <tiff:Orientation>6</tiff:Orientation>
// Source: ISO 16684-1:2012, sections 7.4 and 7.5; XMP specification part 2, "TIFF schema".
#include "metadata/xmp/xmp_edit.h"

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "containers/walked_bytes.h"
#include "core/text.h"
#include "metadata/xmp/xml_markup.h"
#include "metadata/xmp/xmp_names.h"

namespace fotomill {

namespace {

constexpr std::string_view kName = "tiff:Orientation";

bool IsBlank(uint8_t c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

// The position of the value after a name: after "=" and a quotation mark, or after ">"; else the
// end of the packet.
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

// Properties with place names, at any depth.
constexpr struct {
  std::string_view uri, name;
} kPlaceNames[] = {
    {xmp::kPhotoshop, "City"},
    {xmp::kPhotoshop, "State"},
    {xmp::kPhotoshop, "Country"},
    {xmp::kIptcCore, "Location"},
    {xmp::kIptcCore, "CountryCode"},
    {xmp::kIptcExtension, "LocationCreated"},
    {xmp::kIptcExtension, "LocationShown"},
};

// Finds the names' namespaces; declarations may be anywhere, prefixes have one meaning in practice.
bool IsPlaceName(std::string_view name,
                 const std::multimap<std::string_view, std::string_view>& uris) {
  const size_t colon = name.find(':');
  const std::string_view local = name.substr(colon + 1);
  const std::string_view prefix = colon == std::string_view::npos ? "" : name.substr(0, colon);
  const auto [first, end] = uris.equal_range(prefix);
  return std::any_of(first, end, [local](const auto& declared) {
    return std::ranges::any_of(kPlaceNames, [&](const auto& row) {
      return row.uri == declared.second && row.name == local;
    });
  });
}

bool BlankPlaceNames(std::span<uint8_t> packet) {
  const std::string text(TextOf(packet));
  std::vector<XmlElement> elements;
  if (!ScanXml(text, elements)) return false;
  std::set<std::pair<std::string_view, std::string_view>> declared;  // of the namespaces above
  const auto declare = [&](std::string_view prefix, std::string_view uri) {
    const auto isOne = [uri](const auto& row) { return row.uri == uri; };
    if (std::ranges::any_of(kPlaceNames, isOne)) declared.emplace(prefix, uri);
  };
  for (const XmlElement& element : elements) {
    for (const XmlAttribute& attribute : element.attributes) {
      if (attribute.name == "xmlns") declare("", attribute.value);
      if (attribute.name.starts_with("xmlns:")) declare(attribute.name.substr(6), attribute.value);
    }
  }
  const std::multimap<std::string_view, std::string_view> uris(declared.begin(), declared.end());
  bool found = false;
  const auto blank = [&](size_t begin, size_t end) {
    std::fill(packet.begin() + static_cast<ptrdiff_t>(begin),
              packet.begin() + static_cast<ptrdiff_t>(end), uint8_t{' '});
    found = true;
  };
  for (const XmlElement& element : elements) {
    if (IsPlaceName(element.name, uris)) blank(element.begin, element.end);
    for (const XmlAttribute& attribute : element.attributes) {
      if (IsPlaceName(attribute.name, uris)) blank(attribute.begin, attribute.end);
    }
  }
  return found;
}

// Whatever the prefix: drones have names of their own beside those of EXIF.
bool BlankPositions(std::span<uint8_t> packet) {
  constexpr std::string_view kPlace = ":gps", kBlanks = " \t\r\n";
  const std::string_view text = TextOf(packet);
  const auto same = [](char a, char b) { return LowerCase(a) == b; };
  bool found = false;
  for (size_t at = 0;;) {
    const auto match = std::search(text.begin() + static_cast<ptrdiff_t>(at), text.end(),
                                   kPlace.begin(), kPlace.end(), same);
    if (match == text.end()) break;
    const auto colon = static_cast<size_t>(match - text.begin());
    const size_t before = text.substr(0, colon).find_last_of("<>/=\"' \t\r\n");
    const size_t name = before == std::string_view::npos ? 0 : before + 1;
    at = text.find_first_of("<>=\"' \t\r\n/", colon);
    if (at == std::string_view::npos) break;
    const std::string tag(text.substr(name, at - name));
    size_t begin = name, end = 0;
    if (name > 0 && text[name - 1] == '<') {
      begin = name - 1;
      const size_t close = text.find('>', at);
      if (close == std::string_view::npos) break;
      const std::string closing = "</" + tag;
      const size_t last =
          text[close - 1] == '/' ? close : text.find('>', text.find(closing, close));
      if (last == std::string_view::npos) break;
      end = last + 1;
    } else {
      const size_t equals = text.find_first_not_of(kBlanks, at);
      // only a text, or the declaration of a prefix
      if (equals == std::string_view::npos || text[equals] != '=') continue;
      if (tag.starts_with("xmlns:")) continue;
      const size_t quote = text.find_first_not_of(kBlanks, equals + 1);
      if (quote == std::string_view::npos || (text[quote] != '"' && text[quote] != '\'')) continue;
      const size_t last = text.find(text[quote], quote + 1);
      if (last == std::string_view::npos) break;
      end = last + 1;
    }
    std::fill(packet.begin() + static_cast<ptrdiff_t>(begin),
              packet.begin() + static_cast<ptrdiff_t>(end), uint8_t{' '});
    found = true;
    at = end;
  }
  return found;
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

bool BlankXmpPlaces(std::span<uint8_t> packet) {
  const bool names = BlankPlaceNames(packet);
  return BlankPositions(packet) || names;
}

bool IsBlankableXmp(std::span<const uint8_t> packet) {
  while (!packet.empty() && packet.back() == 0) packet = packet.first(packet.size() - 1);
  return std::ranges::find(packet, uint8_t{0}) == packet.end();
}

}  // namespace fotomill
