#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

namespace fotomill {

// The tag that a name means, in any case and with or without blanks, hyphens and underscores: a
// field name of the standard ("DateTimeOriginal"), a name that the tag dictionary shows ("Date time
// of original data"), "Unknown (50341)", or a number
// ("0x9003"). nullopt if there is none.
std::optional<uint16_t> FindExifTagByName(std::string_view name);

// All names but the unknown ones, for hints.
std::vector<std::string_view> ExifTagNames();

}  // namespace fotomill
