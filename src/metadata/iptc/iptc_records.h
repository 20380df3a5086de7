#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// IPTC-IIM, the older standard for captions and keywords: a sequence of datasets, each with a
// record number and a number within the record.

// Datasets of the application record, in UTF-8; empty if missing.
struct IptcTags {
  std::string title, description;
  std::vector<std::string> keywords;
  std::vector<std::string> creators;
  std::string copyright;
  std::string sublocation, city, state, country, countryCode;
};
// Reads the datasets. Texts are UTF-8 if the envelope says so or they are valid UTF-8, else
// Latin-1. Whatever follows an invalid dataset is ignored.
IptcTags ReadIptcTags(std::span<const uint8_t> data);

// What to write; none: unchanged, empty: removed.
struct IptcChanges {
  std::optional<std::vector<std::string>> keywords = {};
  std::optional<std::string> description = {};
};
// Makes new data with these datasets replaced; all others stay byte for byte and in order. Texts
// longer than the standard allows are cut. If the texts need it, the data are converted to UTF-8.
// DamagedFile (2) if the data are not a sequence of datasets.
Status EditIptc(std::span<const uint8_t> data, const IptcChanges& changes,
                std::vector<uint8_t>& made);

// Removes city, state, country and sublocation by overwriting them with spaces; the data keep their
// length. False if there are none.
bool BlankIptcPlaces(std::span<uint8_t> data);

// The MD5 digest of the data, by which programs see whether others changed them.
std::vector<uint8_t> IptcDigest(std::span<const uint8_t> data);

}  // namespace fotomill
