#pragma once

#include <cstdint>
#include <string>

#include "core/choice_lists.h"
#include "core/progress.h"
#include "core/workers/stop_token.h"

namespace fotomill {

// Whether a file whose name lies is opened by what it holds.
struct IdentifyOptions {
  bool on = true;  // IdentifyMysteryViewFiles
  // BatchIdentifyExceptions: extensions between semicolons whose files are never opened that way
  std::string exceptions = "EXE;THN;SCR;DLL;VBX;CPL;DB";
  int32_t mostSide = 32000;  // MaximumMysteryFileDimension: larger pictures are refused, pixels
  bool operator==(const IdentifyOptions&) const = default;
};

// What of the settings decoding depends on. The values here are the settings' defaults; a job takes
// those in force once, by ReadOptionsFromSettings.
struct ReadOptions {
  bool alphaChannels = true;            // UseAlphaChannels: the fourth channel of bitmaps is alpha
  bool recognizeApng = true;            // RecognizeAPNG: the frames of a PNG file are counted
  // AlphaBackground, 0x00BBGGRR: what the record's `defaultColour` becomes
  uint32_t alphaBackground = 0xffffff;
  IdentifyOptions identify = {};
  // PhotoCDResolution: the largest size that is taken out of a Photo CD file
  int32_t photoCdSize = choice::kPhotoCd3072;
  bool textInverted = false;     // InvertTextFiles: texts are white on black
  bool relaxedUuencode = false;  // RelaxedUUE: cut lines and stray text are passed over
  bool operator==(const ReadOptions&) const = default;
};

// What a reader is asked for; the record is its answer.
struct ReadRequest {
  std::string fileName = {};
  int32_t page = 0;           // of files with several, from 0
  int32_t thumbnailSide =
      0;  // above 0: a decoder may deliver any smaller size that is still twice that of the largest
          // picture inside this square, which is what its longer edge decides; the record's `width`
          // and `height` keep the full size, `image` tells its own
  bool signedOnly = false;  // of `info`: a format that knows its files by no signature answers
                            // UnsupportedFormat (8) without opening the file
  // A picture whose data end early is delivered as far as it goes: Ok, with `shortfall` in the
  // record. At least one row of it is there.
  bool partial = false;
  ProgressSink* progress = nullptr;  // not owned, may be null
  StopToken stop = {};               // asked between rows; the status is FunctionCancelled (4) then
  ReadOptions options = {};
};

}  // namespace fotomill
