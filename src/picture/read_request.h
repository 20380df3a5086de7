#pragma once

#include <cstdint>
#include <string>

#include "core/choice_lists.h"
#include "core/progress.h"
#include "core/workers/stop_token.h"

namespace fotomill {

// Whether a file with the wrong extension is identified by its contents.
struct IdentifyOptions {
  bool on = true;  // IdentifyMysteryViewFiles
  // BatchIdentifyExceptions: extensions, separated by semicolons, that are never identified
  std::string exceptions = "EXE;THN;SCR;DLL;VBX;CPL;DB";
  int32_t mostSide = 32000;  // MaximumMysteryFileDimension: larger pictures are rejected, pixels
  bool operator==(const IdentifyOptions&) const = default;
};

// The settings that decoders use. The values here are the settings' defaults; a job copies the
// current ones once, with ReadOptionsFromSettings.
struct ReadOptions {
  bool alphaChannels = true;            // UseAlphaChannels: the fourth channel of bitmaps
  bool recognizeApng = true;            // RecognizeAPNG: count the frames of a PNG file
  // AlphaBackground, 0x00BBGGRR: initial `defaultColour` of the record
  uint32_t alphaBackground = 0xffffff;
  IdentifyOptions identify = {};
  // PhotoCDResolution: the largest size to read from a Photo CD file
  int32_t photoCdSize = choice::kPhotoCd3072;
  bool textInverted = false;     // InvertTextFiles: render text white on black
  bool relaxedUuencode = false;  // RelaxedUUE: skip truncated lines and stray text
  bool operator==(const ReadOptions&) const = default;
};

// What to read, and how.
struct ReadRequest {
  std::string fileName = {};
  int32_t page = 0;           // of a multi-page file, from 0
  int32_t thumbnailSide =
      0;  // above 0: the decoder may deliver a reduced picture, as long as it is at least twice the
          // size of the picture fitted into a square of this edge length; the record's `width` and
          // `height` remain the full size, `image` has its own
  bool signedOnly = false;  // for `info`: formats without a signature return UnsupportedFormat (8)
                            // without opening the file
  // Deliver a truncated picture as far as it could be decoded: Ok, with `shortfall` set in the
  // record. It has at least one row.
  bool partial = false;
  ProgressSink* progress = nullptr;  // not owned, may be null
  StopToken stop = {};               // checked between rows; then FunctionCancelled (4)
  ReadOptions options = {};
};

}  // namespace fotomill
