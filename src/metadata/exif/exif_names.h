#pragma once

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

namespace fotomill {

// Finds a tag by name; case, spaces, hyphens and underscores are
// ignored: a field name of the standard ("DateTimeOriginal"), a
// name from the tag dictionary ("Date time of original data"),
// "Unknown (50341)", or a number ("0x9003"). nullopt if not found.
std::optional<uint16_t> FindExifTagByName(std::string_view name);

// All known names, for suggestions.
std::vector<std::string_view> ExifTagNames();

}  // namespace fotomill
