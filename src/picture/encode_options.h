#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "core/choice_lists.h"

namespace fotomill {

// The default of TextCharacterLevels.
inline constexpr std::string_view kTextLevels = "\xff.:-+|=%o#&XOB@";

// The settings that encoders use. The values here are the settings' defaults; a job copies
// the current ones once, with EncodeOptionsFromSettings. Numbers may be out of range:
// writers clamp them.
struct EncodeOptions {
  int32_t quality = 0;  // set by SetQuality, for plug-ins: 1 to 100; 0: each format's setting
  bool preserveMetadata = true;  // PreserveEXIF: keep EXIF, XMP and comments
  int32_t resolution = 300;      // TiffResolution: dots per inch for pictures without a resolution

  bool bmpOs2 = false;                              // WriteOS2Bitmaps
  bool gifInterlaced = false;                       // WriteGIFInterlaced
  bool gif89 = true;                                // CreateGif89
  // HDPCompression: quantizer, 0 to 255; 0 is lossless
  int32_t hdpCompression = 10;
  int32_t hdpBits = 0;                              // HDPWriteOptions
  int32_t iconCompression = choice::kIconPng256;    // ICOCompression
  bool iffCompressed = true;                         // CreateIffCompressed
  bool iffPacked = false;                            // CreateIffPBM
  int32_t jpegQuality = 75;                         // JpegCompression, 1 to 100
  int32_t jpegSubsampling = choice::kSubsample420;  // JpegSubsample
  // pictures from JPEG files keep their quantization tables and chroma subsampling, overriding the
  // two above
  bool jpegAsSource = false;
  bool jpegProgressive = false;                     // WriteJpegProgressive
  bool jpegStoresResolution = false;                // JpegStoreDPI
  bool macBinary = false;                           // CreateMacbinaryHeader
  int32_t pngCompression = 9;                       // PngCompression: deflate level, 0 to 9
  bool targa16 = false;                             // CreateTarga16
  // TextCharacterLevels: characters ordered by ink, least first
  std::string textLevels = std::string(kTextLevels);
  bool textInverted = false;                        // InvertTextFiles: light text on a dark screen
  int32_t tiffCompression = choice::kTiffLzw;       // TiffOptions
  bool webpLossless = false;                        // WebPLossless
  int32_t webpQuality = 75;                         // WebPQualityFactor, 0 to 100
  bool webpMixed = false;                           // WebPAllowMixed: the smaller of both
  bool operator==(const EncodeOptions&) const = default;

  // Sets the quality, 1 to 100, of all lossy formats, and turns lossless modes off.
  void SetQuality(int32_t wanted) {
    quality = jpegQuality = webpQuality = wanted;
    webpLossless = webpMixed = jpegAsSource = false;
  }
};

}  // namespace fotomill
