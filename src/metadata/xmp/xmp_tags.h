#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Properties of an XMP packet, in UTF-8; empty if missing.
struct XmpTags {
  std::string title, description;  // the default language
  std::vector<std::string> keywords;
  std::vector<std::string> creators;
  std::string copyright;
  std::string rating;  // a number; -1: rejected
  std::string label;
  std::string sublocation, city, state, country, countryCode;
  std::string taken, dateCreated, created;  // ISO 8601, the most reliable one first
  std::string make, model;                  // of the camera
  // the extension of the picture that a sidecar belongs to, as some programs note it
  std::string sidecarFor;
  std::string extended;  // digest of a second packet with further properties, 32 hex digits
  // copies in namespaces of other programs; keywords with their parents
  std::vector<std::string> digiKamTags, lightroomTags, microsoftTags;
  std::string digiKamLabel, microsoftRating;
};

// Reads the properties of a packet into `tags`; those already there are kept, so a second call adds
// the properties of an extended packet. DamagedFile (2) if it is not XMP, MemoryAllocationError (6)
// for packets beyond the limit.
Status ReadXmpTags(std::span<const uint8_t> packet, XmpTags& tags);

// "2024-05-31T14:03:00+02:00" as 20240531140300; missing parts are 0. 0 if it is not a date.
int64_t XmpDateNumber(std::string_view text);

}  // namespace fotomill
