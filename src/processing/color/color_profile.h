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

// The colors that a profile of a device or a color space describes.
enum class ProfileColors { None, Gray, Rgb, Other };  // None: bytes that are no such profile
// Looks into the profile. Source: ICC.1:2022, section 7.2.
ProfileColors ColorsOfProfile(std::span<const uint8_t> bytes);

}  // namespace fotomill
