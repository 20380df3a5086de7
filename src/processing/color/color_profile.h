#pragma once

#include <cstdint>
#include <memory>
#include <span>

namespace fotomill {

// Closes a profile of the library when its owner goes.
struct CloseProfile {
  void operator()(void* profile) const;
};
using Profile = std::unique_ptr<void, CloseProfile>;  // the library's

// Opens an ICC profile that came with a picture from anywhere, without the tags that are not
// trusted. Null for bytes that are no profile, and for one of an unlikely size.
Profile OpenTrustedProfile(std::span<const uint8_t> bytes);

}  // namespace fotomill
