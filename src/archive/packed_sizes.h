#pragma once

#include <cstdint>
#include <map>
#include <span>
#include <string>

namespace fotomill {

// The compressed sizes of a ZIP archive's entries, in bytes, by readable name, from its central
// directory. Empty if that is damaged; at most `most` entries. Source: PKWARE, APPNOTE.TXT 6.3.9,
// sections 4.3.12 to 4.3.16 and 4.5.3.
std::map<std::string, uint64_t> ZipPackedSizes(std::span<const uint8_t> file, uint32_t most);

}  // namespace fotomill
