#include "batch/fit_picture.h"

#include <algorithm>

#include "metadata/exif/picture_exif.h"
#include "picture/gray_palette.h"
#include "processing/color/color_profile.h"
#include "processing/color/color_transform.h"
#include "processing/promote.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Whether the palette is a standard gray ramp; readers may treat files with another one as color.
bool IsRamp(const PictureRecord& picture) {
  const Palette ramp = GrayLevels(picture.image.Bits());
  return std::equal(ramp.begin(), ramp.begin() + 3 * picture.image.Colors(),
                    picture.palette.begin());
}

bool IsGray(const PictureRecord& picture) {
  return HasOnlyGrays(picture.palette, picture.image.Colors());
}

// Gray pixels need a gray profile, others an RGB one; gray ones with alpha may be stored as RGB.
// CMYK profiles no longer apply, as pixels have been converted to RGB.
bool SuitsPixels(const PictureRecord& picture, const FormatEntry& row) {
  const ProfileColors colors = ColorsOfProfile(picture.metadata.icc);
  if (!IsGray(picture)) return colors == ProfileColors::Rgb;
  return colors == ProfileColors::Gray && picture.alpha.Empty() &&
         (row.keepsMetadata & kLostGrayIcc) != 0 && IsRamp(picture);
}

// Converts colors from the picture's profile to another one; empty: sRGB.
Status ConvertColors(PictureRecord& picture, std::span<const uint8_t> target) {
  const ColorTransform transform(picture.metadata.icc, target);
  if (!transform.ChangesColors()) return Status::Ok;
  RETURN_IF_BAD(transform.Apply(picture.image, picture.stop));
  const auto table = picture.image.ColorTable();
  for (size_t i = 0; i < table.size() / 4; ++i) {
    for (size_t c = 0; c < 3; ++c) picture.palette[3 * i + c] = table[4 * i + 2 - c];
  }
  return Status::Ok;
}

Status FitOrientation(PictureRecord& picture, bool keepsTag) {
  if (keepsTag || OrientationOf(picture) == Orientation::Upright) return Status::Ok;
  // both the old and the turned picture are in memory
  RETURN_IF_BAD(CheckFileMemory(2 * (picture.image.Bytes().size() + picture.alpha.Bytes().size())));
  return TurnUpright(picture);
}

Status GiveProfile(PictureRecord& picture, const FormatEntry& row,
                   const std::vector<uint8_t>& profile, std::string& hint) {
  if (!HoldsProfile(row)) {
    hint = Tr("%1 files cannot hold a color profile.", row.extension.view());
    return Status::UnsuitableImage;
  }
  if (IsGray(picture)) RETURN_IF_BAD(PromotePicture(picture));
  RETURN_IF_BAD(ConvertColors(picture, profile));
  picture.metadata.icc = profile;
  return Status::Ok;
}

}  // namespace

bool HoldsProfile(const FormatEntry& row) { return (row.keepsMetadata & kLostIcc) != 0; }

Status FitPicture(PictureRecord& picture, const FormatEntry& row, const FitRequest& request,
                  std::string& hint) {
  if (picture.image.Empty()) return Status::Ok;
  const bool keepsTag = request.keepsMetadata && (row.keepsMetadata & kLostExif) != 0;
  RETURN_IF_BAD(FitOrientation(picture, keepsTag || !request.turnsUpright));
  if (request.profile.use == ProfileRequest::Use::Given)
    return GiveProfile(picture, row, *request.profile.profile, hint);
  if (picture.metadata.icc.empty()) return Status::Ok;
  const bool keep = request.profile.use == ProfileRequest::Use::Keep;
  if (keep && HoldsProfile(row) && SuitsPixels(picture, row)) return Status::Ok;
  RETURN_IF_BAD(ConvertColors(picture, {}));
  picture.metadata.icc.clear();
  return Status::Ok;
}

}  // namespace fotomill
