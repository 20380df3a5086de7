#include "metadata/exif/exif_names.h"

#include <charconv>
#include <string>

#include "core/text.h"
#include "core/whole_number.h"
#include "metadata/exif/exif_tags.h"

namespace fotomill {

namespace {

// Field names of the standard, and two older ones of the sensitivity. Source: CIPA DC-008-2012,
// sections 4.6.4 to 4.6.6.
struct FieldName {
  std::string_view name;
  uint16_t tag;
};
// clang-format off
constexpr FieldName kFieldNames[] = {
    {"ImageWidth", 0x0100}, {"ImageLength", 0x0101}, {"BitsPerSample", 0x0102},
    {"Compression", 0x0103}, {"PhotometricInterpretation", 0x0106}, {"ImageDescription", 0x010e},
    {"Make", 0x010f}, {"Model", 0x0110}, {"StripOffsets", 0x0111}, {"Orientation", 0x0112},
    {"SamplesPerPixel", 0x0115}, {"RowsPerStrip", 0x0116}, {"StripByteCounts", 0x0117},
    {"XResolution", 0x011a}, {"YResolution", 0x011b}, {"PlanarConfiguration", 0x011c},
    {"ResolutionUnit", 0x0128}, {"TransferFunction", 0x012d}, {"Software", 0x0131},
    {"DateTime", 0x0132}, {"Artist", 0x013b}, {"WhitePoint", 0x013e},
    {"PrimaryChromaticities", 0x013f}, {"JPEGInterchangeFormat", 0x0201},
    {"JPEGInterchangeFormatLength", 0x0202}, {"YCbCrCoefficients", 0x0211},
    {"YCbCrSubSampling", 0x0212}, {"YCbCrPositioning", 0x0213}, {"ReferenceBlackWhite", 0x0214},
    {"Copyright", 0x8298}, {"ExposureTime", 0x829a}, {"FNumber", 0x829d},
    {"ExposureProgram", 0x8822}, {"SpectralSensitivity", 0x8824},
    {"PhotographicSensitivity", 0x8827}, {"ISOSpeedRatings", 0x8827}, {"ISO", 0x8827},
    {"OECF", 0x8828}, {"SensitivityType", 0x8830}, {"StandardOutputSensitivity", 0x8831},
    {"RecommendedExposureIndex", 0x8832}, {"ISOSpeed", 0x8833}, {"ISOSpeedLatitudeyyy", 0x8834},
    {"ISOSpeedLatitudezzz", 0x8835}, {"ExifVersion", 0x9000}, {"DateTimeOriginal", 0x9003},
    {"DateTimeDigitized", 0x9004}, {"ComponentsConfiguration", 0x9101},
    {"CompressedBitsPerPixel", 0x9102}, {"ShutterSpeedValue", 0x9201}, {"ApertureValue", 0x9202},
    {"BrightnessValue", 0x9203}, {"ExposureBiasValue", 0x9204}, {"MaxApertureValue", 0x9205},
    {"SubjectDistance", 0x9206}, {"MeteringMode", 0x9207}, {"LightSource", 0x9208},
    {"Flash", 0x9209}, {"FocalLength", 0x920a}, {"SubjectArea", 0x9214}, {"MakerNote", 0x927c},
    {"UserComment", 0x9286}, {"SubSecTime", 0x9290}, {"SubSecTimeOriginal", 0x9291},
    {"SubSecTimeDigitized", 0x9292}, {"FlashpixVersion", 0xa000}, {"ColorSpace", 0xa001},
    {"PixelXDimension", 0xa002}, {"PixelYDimension", 0xa003}, {"RelatedSoundFile", 0xa004},
    {"FlashEnergy", 0xa20b}, {"SpatialFrequencyResponse", 0xa20c},
    {"FocalPlaneXResolution", 0xa20e}, {"FocalPlaneYResolution", 0xa20f},
    {"FocalPlaneResolutionUnit", 0xa210}, {"SubjectLocation", 0xa214}, {"ExposureIndex", 0xa215},
    {"SensingMethod", 0xa217}, {"FileSource", 0xa300}, {"SceneType", 0xa301},
    {"CFAPattern", 0xa302}, {"CustomRendered", 0xa401}, {"ExposureMode", 0xa402},
    {"WhiteBalance", 0xa403}, {"DigitalZoomRatio", 0xa404}, {"FocalLengthIn35mmFilm", 0xa405},
    {"SceneCaptureType", 0xa406}, {"GainControl", 0xa407}, {"Contrast", 0xa408},
    {"Saturation", 0xa409}, {"Sharpness", 0xa40a}, {"DeviceSettingDescription", 0xa40b},
    {"SubjectDistanceRange", 0xa40c}, {"ImageUniqueID", 0xa420}, {"CameraOwnerName", 0xa430},
    {"BodySerialNumber", 0xa431}, {"LensSpecification", 0xa432}, {"LensMake", 0xa433},
    {"LensModel", 0xa434}, {"LensSerialNumber", 0xa435}, {"Gamma", 0xa500},
    {"GPSVersionID", 0x0000}, {"GPSLatitudeRef", 0x0001}, {"GPSLatitude", 0x0002},
    {"GPSLongitudeRef", 0x0003}, {"GPSLongitude", 0x0004}, {"GPSAltitudeRef", 0x0005},
    {"GPSAltitude", 0x0006}, {"GPSTimeStamp", 0x0007}, {"GPSSatellites", 0x0008},
    {"GPSStatus", 0x0009}, {"GPSMeasureMode", 0x000a}, {"GPSDOP", 0x000b}, {"GPSSpeedRef", 0x000c},
    {"GPSSpeed", 0x000d}, {"GPSTrackRef", 0x000e}, {"GPSTrack", 0x000f},
    {"GPSImgDirectionRef", 0x0010}, {"GPSImgDirection", 0x0011}, {"GPSMapDatum", 0x0012},
    {"GPSDestLatitudeRef", 0x0013}, {"GPSDestLatitude", 0x0014}, {"GPSDestLongitudeRef", 0x0015},
    {"GPSDestLongitude", 0x0016}, {"GPSDestBearingRef", 0x0017}, {"GPSDestBearing", 0x0018},
    {"GPSDestDistanceRef", 0x0019}, {"GPSDestDistance", 0x001a}, {"GPSProcessingMethod", 0x001b},
    {"GPSAreaInformation", 0x001c}, {"GPSDateStamp", 0x001d}, {"GPSDifferential", 0x001e},
    {"GPSHPositioningError", 0x001f},
};
// clang-format on

std::string Plain(std::string_view name) {
  std::string plain;
  for (const char c : name) {
    if (c != ' ' && c != '-' && c != '_') plain += LowerCase(c);
  }
  return plain;
}

// Parses "unknown(50341)".
std::optional<uint16_t> UnknownTag(std::string_view plain) {
  constexpr std::string_view kStart = "unknown(";
  if (!plain.starts_with(kStart) || !plain.ends_with(')')) return std::nullopt;
  return ParseNumber<uint16_t>(plain.substr(kStart.size(), plain.size() - kStart.size() - 1));
}

// Parses "0x9003".
std::optional<uint16_t> NumberedTag(std::string_view plain) {
  if (!plain.starts_with("0x")) return std::nullopt;
  plain.remove_prefix(2);
  uint16_t tag = 0;
  const auto [end, error] = std::from_chars(plain.data(), plain.data() + plain.size(), tag, 16);
  if (error != std::errc{} || end != plain.data() + plain.size()) return std::nullopt;
  return tag;
}

}  // namespace

std::optional<uint16_t> FindExifTagByName(std::string_view name) {
  const std::string plain = Plain(name);
  if (const auto tag = NumberedTag(plain)) return tag;
  for (const FieldName& field : kFieldNames) {
    if (Plain(field.name) == plain) return field.tag;
  }
  for (const ExifTag& row : ExifTags()) {
    if (Plain(row.name) == plain) return row.tag;
  }
  return UnknownTag(plain);
}

std::vector<std::string_view> ExifTagNames() {
  std::vector<std::string_view> names;
  for (const FieldName& field : kFieldNames) names.push_back(field.name);
  for (const ExifTag& row : ExifTags()) names.push_back(row.name);
  return names;
}

}  // namespace fotomill
