#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "core/choice_lists.h"

namespace fotomill {

// The default of TextCharacterLevels.
inline constexpr std::string_view kTextLevels = "\xff.:-+|=%o#&XOB@";

// What of the settings encoding depends on. The values here are the settings' defaults; a job takes
// those in force once, by EncodeOptionsFromSettings. Numbers may lie outside their ranges: writers
// clamp them.
struct EncodeOptions {
  bool preserveMetadata = true;  // PreserveEXIF: EXIF, XMP and comments go along
  int32_t resolution = 300;      // TiffResolution: dots per inch of pictures that have none

  bool bmpOs2 = false;                              // WriteOS2Bitmaps
  bool gifInterlaced = false;                       // WriteGIFInterlaced
  bool gif89 = true;                                // CreateGif89
  // HDPCompression: quantizer, 0 to 255; 0 loses nothing
  int32_t hdpCompression = 10;
  int32_t hdpBits = 0;                              // HDPWriteOptions
  int32_t iconCompression = choice::kIconPng256;    // ICOCompression
  bool iffCompressed = true;                         // CreateIffCompressed
  bool iffPacked = false;                            // CreateIffPBM
  int32_t jpegQuality = 75;                         // JpegCompression, 1 to 100
  int32_t jpegSubsampling = choice::kSubsample420;  // JpegSubsample
  // pictures from JPEG files keep their quantization and chroma sampling, whatever the two above
  // say
  bool jpegAsSource = false;
  bool jpegProgressive = false;                     // WriteJpegProgressive
  bool jpegStoresResolution = false;                // JpegStoreDPI
  bool macBinary = false;                           // CreateMacbinaryHeader
  int32_t pngCompression = 9;                       // PngCompression: level of deflate, 0 to 9
  bool targa16 = false;                             // CreateTarga16
  // TextCharacterLevels: characters from the least ink to the most
  std::string textLevels = std::string(kTextLevels);
  bool textInverted = false;                        // InvertTextFiles: light text on a dark screen
  int32_t tiffCompression = choice::kTiffLzw;       // TiffOptions
  bool webpLossless = false;                        // WebPLossless
  int32_t webpQuality = 75;                         // WebPQualityFactor, 0 to 100
  bool webpMixed = false;                           // WebPAllowMixed: the smaller file of both ways
  bool operator==(const EncodeOptions&) const = default;

  // A quality of 1 to 100 for all formats that compress with loss, which they then do.
  void SetQuality(int32_t quality) {
    jpegQuality = webpQuality = quality;
    webpLossless = webpMixed = jpegAsSource = false;
  }
};

}  // namespace fotomill
