#pragma once

#include <cstdint>
#include <memory>
#include <span>

namespace fotomill {

// Deleter for the library's profiles.
struct CloseProfile {
  void operator()(void* profile) const;
};
using Profile = std::unique_ptr<void, CloseProfile>;  // the library's handle

// Opens an ICC profile from an untrusted picture, without untrusted tags. Null if it is not a
// profile, or of implausible size.
Profile OpenTrustedProfile(std::span<const uint8_t> bytes);

// The color space of a device or color space profile.
enum class ProfileColors { None, Gray, Rgb, Other };  // None: not such a profile
// Source: ICC.1:2022, section 7.2.
ProfileColors ColorsOfProfile(std::span<const uint8_t> bytes);

}  // namespace fotomill
