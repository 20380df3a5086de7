#include "metadata/exif/exif_tags.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace fotomill {

namespace {

using enum ExifRule;
using enum ExifWordKey;

// Values in the order of the corresponding words.
constexpr uint16_t kNorth[] = {'N', 'S'};
constexpr uint16_t kEast[] = {'E', 'W'};
constexpr uint16_t kActive[] = {'A', 'V'};
constexpr uint16_t kTwo[] = {'2', '3'};
constexpr uint16_t kSpeedUnits[] = {'K', 'M', 'N'};
constexpr uint16_t kTrue[] = {'T', 'M'};
constexpr uint16_t kResolutionUnits[] = {2, 3, 1};
constexpr uint16_t kCompressions[] = {1, 6};
constexpr uint16_t kMeteringModes[] = {0, 1, 2, 3, 4, 5, 6, 255};
constexpr uint16_t kLightSources[] = {0,  1,  2,  3,  4,  9,  10, 11, 12, 13, 14,
                                      15, 17, 18, 19, 20, 21, 22, 23, 24, 255};
constexpr uint16_t kColorSpaces[] = {0xffff, 1};

// Users know these lists, although some deviate from the standard: the words for orientations 3 and
// 4 are swapped, white balance 0 reads "None", and a sensing method has the words of the next one.
// clang-format off
constexpr ExifWordList kAltitudeWords{"Sea level;Sea level reference"};
constexpr ExifWordList kLatitudeWords{"North;South", Letter, kNorth, 1};
constexpr ExifWordList kLongitudeWords{"East;West", Letter, kEast, 1};
constexpr ExifWordList kReceiverWords{"Measurement in progress;Measurement interoperability", Letter, kActive, 1};
constexpr ExifWordList kDimensionWords{"2-dimensional measurement;3-dimensional measurement", Letter, kTwo, 1};
constexpr ExifWordList kSpeedWords{"Kilometers per hour;Miles per hour;Knots", Letter, kSpeedUnits, 1};
constexpr ExifWordList kNorthWords{"True;Magnetic", Letter, kTrue, 1};
constexpr ExifWordList kCorrectionWords{
    "Measurement without differential correction;Differential correction applied"};
constexpr ExifWordList kCornerWords{"Unknown;Top Left;Top Right;Bottom Left;Bottom Right;"
                                         "Left Top;Right Top;Right Bottom;Left Bottom"};
constexpr ExifWordList kUnitWords{"Inches;Centimeters;Unknown", Number, kResolutionUnits, 2};
constexpr ExifWordList kSchemeWords{"Uncompressed;JPEG;Unknown", Number, kCompressions, 2};
constexpr ExifWordList kMeteringWords{"Unknown;Average;Center weighted average;Spot;Multi-spot;Pattern;Partial;Other",
                                      Number, kMeteringModes, 0};
constexpr ExifWordList kLightWords{
    "Unknown;Daylight;Fluorescent;Tungsten (incandescent light);Flash;Fine weather;Cloudy weather;Shade;"
    "Daylight fluorescent (D 5700 - 7100K);Day white fluorescent (N 4600 - 5400K);"
    "Cool white fluorescent (W 3900 - 4500K);White fluorescent (WW 3200 - 3700K);Standard light A;Standard light B;"
    "Standard light C;D55;D65;D75;D50;ISO studio tungsten;Other light source",
    Number, kLightSources, 0};
constexpr ExifWordList kProgramWords{"Not defined;Manual;Normal program;Aperture priority;Shutter priority;"
                                     "Creative program;Action program;Portrait mode;Landscape mode"};
constexpr ExifWordList kColorSpaceWords{"Uncalibrated;sRGB", Number, kColorSpaces, 0};
constexpr ExifWordList kSensingWords{
    "Not defined;One-chip color area sensor;Two-chip color area sensor;Three-chip color area sensor;"
    "Color sequential area sensor;Trilinear sensor;Color sequential linear sensor"};
constexpr ExifWordList kProcessWords{"Normal process;Custom process"};
constexpr ExifWordList kModeWords{"Auto exposure;Manual exposure;Auto bracket"};
constexpr ExifWordList kBalanceWords{"None;Auto white balance;Manual white balance"};
constexpr ExifWordList kSceneWords{"Standard;Landscape;Portrait;Night scene"};
constexpr ExifWordList kGainWords{"None;Low gain up;High gain up;Low gain down;High gain down"};
constexpr ExifWordList kHardnessWords{"Normal;Soft;Hard"};
constexpr ExifWordList kSaturationWords{"Normal;Low saturation;High saturation"};
constexpr ExifWordList kRangeWords{"Unknown;Macro;Close view;Distant view"};
constexpr ExifWordList kFileSourceWords{
    "Other;Scanner of transparent type;Scanner of reflex type;Digital still camera", Opaque};
constexpr ExifWordList kSceneTypeWords{"Other;Directly photographed image", Opaque};
constexpr ExifWordList kChannelWords{"*;Y;Cb;Cr;R;G;B", Opaque};

constexpr ExifTag kTags[] = {
    // name                                   tag   class   least       most  type            rule
    {"Altitude",                               0x0006, 0,      0,          0, kExifRational,  Plain},
    {"Altitude reference",                     0x0005, 0,      0,          0, kExifByte,      Words, &kAltitudeWords},
    {"Bearing of destination",                 0x0018, 0,      0,     359000, kExifRational,  Plain},
    {"Direction of image",                     0x0011, 0,      0,     359000, kExifRational,  Plain},
    {"Direction of movement",                  0x000f, 0,      0,     359000, kExifRational,  Plain},
    {"Distance to destination",                0x001a, 0,      0,          0, kExifRational,  Plain},
    {"East or West longitude",                 0x0003, 0,      0,          0, kExifAscii,     Words, &kLongitudeWords},
    {"Geodetic survey data used",              0x0012, 0,      0,          0, kExifAscii,     Plain},
    {"GPS area",                               0x001c, 1,      0,          0, kExifUndefined, Plain},
    {"GPS date",                               0x001d, 0,      0,          0, kExifAscii,     Plain},
    {"GPS differential correction",            0x001e, 0,      0,          0, kExifShort,     Words, &kCorrectionWords},
    {"GPS measurement mode",                   0x000a, 0,      0,          0, kExifAscii,     Words, &kDimensionWords},
    {"GPS processing method",                  0x001b, 1,      0,          0, kExifUndefined, Plain},
    {"GPS receiver status",                    0x0009, 0,      0,          0, kExifAscii,     Words, &kReceiverWords},
    {"GPS satellites",                         0x0008, 0,      0,          0, kExifAscii,     Plain},
    {"GPS tag version",                        0x0000, 2,      1,         99, kExifByte,      GpsVersion},
    {"GPS time",                               0x0007, 0,      0,          0, kExifRational,  GpsTime},
    {"Horizontal positioning error",           0x001f, 0,      0,          0, kExifRational,  Plain},
    {"Latitude",                               0x0002, 0,      0,          0, kExifRational,  Plain},
    {"Latitude of destination",                0x0014, 0,      0,          0, kExifRational,  Plain},
    {"Longitude",                              0x0004, 0,      0,          0, kExifRational,  Plain},
    {"Longitude of destination",               0x0016, 0,      0,          0, kExifRational,  Plain},
    {"Measurement precision",                  0x000b, 0,      0,          0, kExifRational,  Plain},
    {"North or South latitude",                0x0001, 0,      0,          0, kExifAscii,     Words, &kLatitudeWords},
    {"Reference for bearing of destination",   0x0017, 0,      0,          0, kExifAscii,     Words, &kNorthWords},
    {"Reference for direction of image",       0x0010, 0,      0,          0, kExifAscii,     Words, &kNorthWords},
    {"Reference for direction of movement",    0x000e, 0,      0,          0, kExifAscii,     Words, &kNorthWords},
    {"Reference for distance to destination",  0x0019, 0,      0,          0, kExifAscii,     Words, &kNorthWords},
    {"Reference for latitude of destination",  0x0013, 0,      0,          0, kExifAscii,     Words, &kLatitudeWords},
    {"Reference for longitude of destination", 0x0015, 0,      0,          0, kExifAscii,     Words, &kLongitudeWords},
    {"Speed of GPS receiver",                  0x000d, 0,      0,          0, kExifRational,  Plain},
    {"Speed unit",                             0x000c, 0,      0,          0, kExifAscii,     Words, &kSpeedWords},
    {"Bytes per compressed strip",             0x0117, 1,      0,          0, kExifLong,      Plain},
    {"Bytes of JPEG data",                     0x0202, 1,      0,          0, kExifLong,      Plain},
    {"Chromaticities of primaries",            0x013f, 1,      0,          0, kExifRational,  Plain},
    {"Color space transformation matrix",      0x0211, 1,      0,          0, kExifRational,  Plain},
    {"Compression scheme",                     0x0103, 7,      0,          0, kExifShort,     Words, &kSchemeWords},
    {"File change date and time",              0x0132, 0,      0,          0, kExifAscii,     Plain},
    {"Image data arrangement",                 0x011c, 1,      0,          0, kExifShort,     Plain},
    {"Image data location",                    0x0111, 1,      0,          0, kExifLong,      Plain},
    {"Image height",                           0x0101, 1,      0,          0, kExifLong,      Plain},
    {"Image input equipment manufacturer",     0x010f, 0,      0,          0, kExifAscii,     Plain},
    {"Image input equipment model",            0x0110, 0,      0,          0, kExifAscii,     Plain},
    {"Image resolution for height",            0x011b, 0,      0,          0, kExifRational,  Plain},
    {"Image resolution for width",             0x011a, 0,      0,          0, kExifRational,  Plain},
    {"Image title",                            0x010e, 0,      0,          0, kExifAscii,     Plain},
    {"Image width",                            0x0100, 1,      0,          0, kExifLong,      Plain},
    {"Number of bits per component",           0x0102, 1,      0,          0, kExifShort,     Plain},
    {"Number of components",                   0x0115, 1,      0,          0, kExifShort,     Plain},
    {"Number of rows per strip",               0x0116, 1,      0,          0, kExifLong,      Plain},
    {"Offset to JPEG SOI",                     0x0201, 1,      0,          0, kExifLong,      Plain},
    {"Orientation of image",                   0x0112, 0,      0,          0, kExifShort,     Words, &kCornerWords},
    {"Pair of black and white reference",      0x0214, 1,      0,          0, kExifRational,  Plain},
    {"Person who created the image",           0x013b, 0,      0,          0, kExifAscii,     Plain},
    {"Pixel composition",                      0x0106, 1,      0,          0, kExifShort,     Plain},
    {"Software used",                          0x0131, 0,      0,          0, kExifAscii,     Plain},
    {"Subsampling ratio of Y to C",            0x0212, 1,      0,          0, kExifShort,     Plain},
    {"Transfer function",                      0x012d, 1,      0,          0, kExifShort,     Plain},
    {"Unit of X and Y resolution",             0x0128, 0,      0,          0, kExifShort,     Words, &kUnitWords},
    {"White point chromaticity",               0x013e, 1,      0,          0, kExifRational,  Plain},
    {"Y and C positioning",                    0x0213, 1,      0,          0, kExifShort,     Plain},
    {"Aperture",                               0x9202, 0,      0,          0, kExifRational,  Plain},
    {"Body serial number",                     0xa431, 0,      0,          0, kExifAscii,     Plain},
    {"Brightness",                             0x9203, 0, -99990,      99990, kExifSRational, Plain},
    {"CFA pattern",                            0xa302, 7,      0,          0, kExifUndefined, Plain},
    {"Color space information",                0xa001, 0,      0,          0, kExifShort,     Words, &kColorSpaceWords},
    {"Camera owner name",                      0xa430, 0,      0,          0, kExifAscii,     Plain},
    {"Contrast",                               0xa408, 0,      0,          0, kExifShort,     Words, &kHardnessWords},
    {"Copyright holder",                       0x8298, 0,      0,          0, kExifAscii,     Plain},
    {"Custom rendered",                        0xa401, 0,      0,          0, kExifShort,     Words, &kProcessWords},
    {"Device settings description",            0xa40b, 7,      0,          0, kExifUndefined, Plain},
    {"Digital zoom ratio",                     0xa404, 0,      0,          0, kExifRational,  Plain},
    {"Exif tag",                               0x8769, 7,      0,          0, kExifLong,      Plain},
    {"Exif version",                           0x9000, 2,      0,          0, kExifUndefined, Version},
    {"Exposure bias",                          0x9204, 0, -99990,      99990, kExifSRational, Plain},
    {"Exposure index",                         0xa215, 0,      0,          0, kExifRational,  Plain},
    {"Exposure mode",                          0xa402, 0,      0,          0, kExifShort,     Words, &kModeWords},
    {"Exposure time",                          0x829a, 0,      0,          0, kExifRational,  Plain},
    {"Exposure program",                       0x8822, 0,      0,          0, kExifShort,     Words, &kProgramWords},
    {"F number",                               0x829d, 0,      0,          0, kExifRational,  Plain},
    {"File source",                            0xa300, 0,      0,          0, kExifUndefined, Words, &kFileSourceWords},
    {"Flash",                                  0x9209, 0,      0,          0, kExifShort,     Flash},
    {"Flash energy",                           0xa20b, 0,   1000, 1000000000, kExifRational,  Plain},
    {"Focal length in 35 mm film",             0xa405, 0,      0,          0, kExifShort,     Plain},
    {"Focal plane resolution unit",            0xa210, 0,      0,          0, kExifShort,     Plain},
    {"Focal plane X resolution",               0xa20e, 0,      0,          0, kExifRational,  Plain},
    {"Focal plane Y resolution",               0xa20f, 0,      0,          0, kExifRational,  Plain},
    {"Gain control",                           0xa407, 0,      0,          0, kExifShort,     Words, &kGainWords},
    {"Gamma",                                  0xa500, 0,      0,          0, kExifRational,  Plain},
    {"GPS tag",                                0x8825, 7,      0,          0, kExifLong,      Plain},
    {"Image compression mode",                 0x9102, 0,      0,          0, kExifRational,  Plain},
    {"ISO speed rating",                       0x8827, 0,      1,      32767, kExifShort,     Plain},
    {"Lens focal length",                      0x920a, 0,   1000,  100000000, kExifRational,  Plain},
    {"Lens make",                              0xa433, 0,      0,          0, kExifAscii,     Plain},
    {"Lens model",                             0xa434, 0,      0,          0, kExifAscii,     Plain},
    {"Lens serial number",                     0xa435, 0,      0,          0, kExifAscii,     Plain},
    {"Lens specification",                     0xa432, 0,      0,          0, kExifRational,  Lens},
    {"Light source",                           0x9208, 0,      0,          0, kExifShort,     Words, &kLightWords},
    {"Manufacturer notes",                     0x927c, 7,      0,          0, kExifUndefined, Plain},
    {"Maximum lens aperture",                  0x9205, 0,      1,    1000000, kExifRational,  Plain},
    {"Meaning of each component",              0x9101, 7,      0,          0, kExifUndefined, Components, &kChannelWords},
    {"Metering mode",                          0x9207, 0,      0,          0, kExifShort,     Words, &kMeteringWords},
    {"Optoelectric conversion factor",         0x8828, 1,      0,          0, kExifUndefined, Plain},
    {"Saturation",                             0xa409, 0,      0,          0, kExifShort,     Words, &kSaturationWords},
    {"Scene capture type",                     0xa406, 0,      0,          0, kExifShort,     Words, &kSceneWords},
    {"Scene type",                             0xa301, 0,      0,          0, kExifUndefined, Words, &kSceneTypeWords},
    {"Sensing method",                         0xa217, 0,      0,          0, kExifShort,     Words, &kSensingWords},
    {"Sharpness",                              0xa40a, 0,      0,          0, kExifShort,     Words, &kHardnessWords},
    {"Shutter speed",                          0x9201, 0,      0,          0, kExifSRational, Plain},
    {"Spatial frequency response",             0xa20c, 7,      0,          0, kExifUndefined, Plain},
    {"Spectral sensitivity",                   0x8824, 0,      0,          0, kExifAscii,     Plain},
    {"Subject area",                           0x9214, 0,      0,          0, kExifShort,     SubjectArea},
    {"Subject distance",                       0x9206, 0,      0,          0, kExifRational,  Distance},
    {"Subject distance range",                 0xa40c, 0,      0,          0, kExifShort,     Words, &kRangeWords},
    {"Subject location",                       0xa214, 0,      0,          0, kExifShort,     SubjectLocation},
    {"Supported Flashpix version",             0xa000, 0,      0,          0, kExifUndefined, Version},
    {"White balance",                          0xa403, 0,      0,          0, kExifShort,     Words, &kBalanceWords},
    {"Unique image ID",                        0xa420, 0,      0,          0, kExifAscii,     Plain},
    {"Valid image height",                     0xa003, 0,     16,      32760, kExifLong,      Plain},
    {"Valid image width",                      0xa002, 0,     16,      32760, kExifLong,      Plain},
    {"User comments",                          0x9286, 0,      0,          0, kExifUndefined, Comment},
    {"Related audio file",                     0xa004, 0,      0,          0, kExifAscii,     Plain},
    {"DateTime of original data",              0x9003, 0,      0,          0, kExifAscii,     Plain},
    {"DateTime of digital data",               0x9004, 0,      0,          0, kExifAscii,     Plain},
    {"DateTime subseconds",                    0x9290, 0,      0,          0, kExifAscii,     Plain},
    {"DateTimeOriginal subseconds",            0x9291, 0,      0,          0, kExifAscii,     Plain},
    {"DateTimeDigitized subseconds",           0x9292, 0,      0,          0, kExifAscii,     Plain},
};
// clang-format on

constexpr size_t kTagCount = std::size(kTags);

// Hash table from tag to row: open addressing, built at compile time. A duplicate tag does not
// compile.
constexpr size_t kSlotCount = 512;
constexpr uint8_t kEmptySlot = 0xff;
static_assert(kTagCount < kEmptySlot && 2 * kTagCount < kSlotCount);
constexpr size_t FirstSlot(uint16_t tag) { return (tag * 0x9e3779b1u >> 16) % kSlotCount; }

consteval std::array<uint8_t, kSlotCount> MakeSlots() {
  std::array<uint8_t, kSlotCount> slots{};
  slots.fill(kEmptySlot);
  for (size_t row = 0; row < kTagCount; ++row) {
    size_t slot = FirstSlot(kTags[row].tag);
    for (; slots[slot] != kEmptySlot; slot = (slot + 1) % kSlotCount) {
      if (kTags[slots[slot]].tag == kTags[row].tag) throw "a tag stands in the dictionary twice";
    }
    slots[slot] = static_cast<uint8_t>(row);
  }
  return slots;
}
constexpr auto kSlots = MakeSlots();

static_assert(std::ranges::all_of(kTags,
                                  [](const ExifTag& row) {
                                    return (row.words != nullptr) ==
                                           (row.rule == Words || row.rule == Components);
                                  }),
              "word lists go with the rules that read them");

struct TypeFacts {
  std::string_view label;
  uint32_t size;
};
constexpr TypeFacts kTypes[] = {
    {"[BYTE]", 1},    {"[ASCII]", 1},     {"[SHORT]", 2},   {"[LONG]", 4},  {"[RATIONAL]", 8},
    {"[UNKNOWN]", 1}, {"[UNDEFINED]", 1}, {"[UNKNOWN]", 1}, {"[SLONG]", 4}, {"[SRATIONAL]", 8},
};

}  // namespace

uint32_t ExifTypeSize(uint16_t type) {
  return type >= kExifByte && type <= kExifSRational ? kTypes[type - 1].size : 1;
}

std::string_view ExifTypeLabel(uint16_t type) {
  return kTypes[std::clamp<int>(type, kExifByte, kExifSRational) - 1].label;
}

std::span<const ExifTag> ExifTags() { return kTags; }

int32_t ExifTagIndex(uint16_t tag) {
  for (size_t slot = FirstSlot(tag); kSlots[slot] != kEmptySlot; slot = (slot + 1) % kSlotCount) {
    if (kTags[kSlots[slot]].tag == tag) return kSlots[slot];
  }
  return kNoExifTag;
}

const ExifTag* FindExifTag(uint16_t tag) {
  const int32_t index = ExifTagIndex(tag);
  return index == kNoExifTag ? nullptr : &kTags[index];
}

std::string_view ExifTagName(uint16_t tag) { return CopyExifTag(tag).name; }

ExifTag CopyExifTag(uint16_t tag) {
  const ExifTag* row = FindExifTag(tag);
  return row != nullptr ? *row : ExifTag{"Unknown", tag, kExifOrdinary, 0, 0, kExifByte, Plain};
}

ExifRange ExifTagRange(uint16_t tag) {
  const ExifTag row = CopyExifTag(tag);
  return {row.minimum, row.maximum};
}

uint8_t ExifEditClass(uint16_t tag) { return CopyExifTag(tag).editClass; }

}  // namespace fotomill
