#include "processing/color/color_profile.h"

#include <lcms2.h>

#include <algorithm>
#include <iterator>
#include <vector>

#include "core/byte_reader.h"

// Profiles of implausible size are ignored, and so are tags of type 'mpet': a file of a few
// megabytes can request a chain of a million steps there, which would keep a core busy for hours.
// The library limits the time for all other tags, and hardly any profile relies on mpet alone.

namespace fotomill {

namespace {

constexpr uint64_t kLargestProfile = 8 << 20;
constexpr uint32_t kMostTags = 100;          // the library's limit
// bytes; followed by the tag table: count, then signature, offset and size of each tag
constexpr uint64_t kHeaderSize = 128;
constexpr uint32_t kStepsType = 0x6d706574;  // "mpet"
constexpr uint8_t kHiddenTag = 'x';          // starts no tag signature

// The profile without untrusted tags; empty if it is not a profile.
std::vector<uint8_t> TrustedTags(std::span<const uint8_t> profile) {
  if (profile.size() > kLargestProfile) return {};
  std::vector<uint8_t> trusted(profile.begin(), profile.end());
  ByteReader table(profile);
  table.Seek(kHeaderSize);
  const uint32_t count = table.Be32();
  if (!table.Ok() || count > kMostTags) return {};
  for (uint32_t i = 0; i < count; ++i) {
    const uint64_t entry = table.Position();
    table.Skip(4);
    ByteReader tag(profile);
    tag.Seek(table.Be32());
    table.Skip(4);
    if (!table.Ok()) return {};
    if (tag.Be32() == kStepsType) trusted[entry] = kHiddenTag;
  }
  return trusted;
}

}  // namespace

void CloseProfile::operator()(void* profile) const { cmsCloseProfile(profile); }

Profile OpenTrustedProfile(std::span<const uint8_t> bytes) {
  const std::vector<uint8_t> trusted = TrustedTags(bytes);
  if (trusted.empty()) return nullptr;
  return Profile(
      cmsOpenProfileFromMem(trusted.data(), static_cast<cmsUInt32Number>(trusted.size())));
}

ProfileColors ColorsOfProfile(std::span<const uint8_t> bytes) {
  const Profile profile = OpenTrustedProfile(bytes);
  if (profile == nullptr) return ProfileColors::None;
  constexpr cmsProfileClassSignature kDevices[] = {cmsSigInputClass, cmsSigDisplayClass,
                                                   cmsSigOutputClass, cmsSigColorSpaceClass};
  if (std::ranges::find(kDevices, cmsGetDeviceClass(profile.get())) == std::end(kDevices))
    return ProfileColors::None;
  const cmsColorSpaceSignature colors = cmsGetColorSpace(profile.get());
  if (colors == cmsSigGrayData) return ProfileColors::Gray;
  return colors == cmsSigRgbData ? ProfileColors::Rgb : ProfileColors::Other;
}

}  // namespace fotomill
