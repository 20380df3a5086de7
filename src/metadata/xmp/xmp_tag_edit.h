#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// How the value of a property is written.
enum class XmpForm : uint8_t {
  Text,
  Bag,        // a list without an order
  Seq,        // an ordered list
  Languages,  // the first value is the default language; those in other languages stay
};

// A property with its new values.
struct XmpChange {
  std::string_view uri, prefix, name;  // the prefix for a packet that has none for the namespace
  XmpForm form = XmpForm::Text;
  std::vector<std::string> values = {};  // UTF-8; none: the property is removed
  bool adds = true;                      // if the packet does not have the property
};

// Makes a new packet with these properties set; an empty packet is started anew. All other bytes
// stay the same, and so does the size as long as the packet has enough padding. DamagedFile (2) if
// it is not XMP in UTF-8 or has a structure that cannot be changed safely.
Status EditXmp(std::span<const uint8_t> packet, std::span<const XmpChange> changes,
               std::vector<uint8_t>& made);

}  // namespace fotomill
