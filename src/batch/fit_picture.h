#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "core/status.h"
#include "formats/format_entry.h"
#include "picture/picture_record.h"

namespace fotomill {

// What becomes of a picture's color profile.
struct ProfileRequest {
  enum class Use {
    Keep,   // goes along; if the format has no place for it, the colors become sRGB
    Srgb,   // the colors become sRGB, without a profile
    Given,  // the colors become those of `profile`, which goes along
  };
  Use use = Use::Keep;
  // An ICC profile of RGB colors; only for Given.
  std::shared_ptr<const std::vector<uint8_t>> profile = {};
};

// How a picture is to look in a file that may not hold what it says about itself.
struct FitRequest {
  bool keepsMetadata = true;     // EXIF goes along where the format can hold it
  bool turnsUpright = true;      // pixels are turned where the orientation tag gets lost
  ProfileRequest profile = {};
};

// Whether a file of this format carries a profile.
bool HoldsProfile(const FormatEntry& row);

// Makes a picture look the same in a file of the format: if the EXIF orientation cannot go along,
// the pixels are turned; if the color profile cannot, or does not suit the pixels, the colors
// become sRGB. UnsuitableImage (13) if a profile is given that the format cannot hold, with the
// reason in `hint`; MemoryAllocationError (6) leaves the picture whole.
Status FitPicture(PictureRecord& picture, const FormatEntry& row, const FitRequest& request,
                  std::string& hint);

}  // namespace fotomill
