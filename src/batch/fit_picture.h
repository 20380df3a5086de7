#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "core/status.h"
#include "formats/format_entry.h"
#include "picture/picture_record.h"

namespace fotomill {

// How to handle a picture's color profile.
struct ProfileRequest {
  enum class Use {
    Keep,   // copy it; convert to sRGB if the format does not support it
    Srgb,   // convert to sRGB, without a profile
    Given,  // convert to `profile` and store that
  };
  Use use = Use::Keep;
  // An RGB ICC profile; only for Given.
  std::shared_ptr<const std::vector<uint8_t>> profile = {};
};

// Options for fitting a picture to a format.
struct FitRequest {
  bool keepsMetadata = true;  // copy EXIF if the format supports it
  bool turnsUpright = true;   // turn the pixels if the orientation tag gets lost
  ProfileRequest profile = {};
};

// Whether files of this format can have a profile.
bool HoldsProfile(const FormatEntry& row);

// Makes a picture look the same in a file of the format: turns the pixels if the EXIF orientation
// cannot be stored; converts colors to sRGB if the color profile cannot be stored or does not match
// the pixels. UnsuitableImage (13), with the reason in `hint`, if a profile is given but not
// supported by the format; MemoryAllocationError (6) leaves the picture valid.
Status FitPicture(PictureRecord& picture, const FormatEntry& row, const FitRequest& request,
                  std::string& hint);

}  // namespace fotomill
