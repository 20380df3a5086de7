#pragma once

#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "processing/geometry/orient.h"

namespace fotomill {

// How to turn pictures.
struct TurnRequest {
  Orientation turn = Orientation::Upright;  // of the picture as it is seen
  bool seenByExif = true;                   // the EXIF orientation is applied first
  // JPEG edges that cannot be turned losslessly are cropped
  bool trim = false;
  bool keepTime = false;                    // the new file has the time of the old one
  bool dryRun = false;                      // nothing is written; the result is that of a run
  StopToken stop = {};                      // ends the work with FunctionCancelled (4)
};

// Writes a turned copy of a picture file, or replaces it; `options` say what to do if the
// destination exists. JPEG pictures are turned losslessly, or only their orientation is changed.
// Others are decoded, turned and written in their own format, but only if the new file has every
// pixel unchanged: otherwise UnsuitableImage (13), with a hint. Nothing is written unless Ok.
RewrittenFile TurnPictureFile(const std::string& source, const std::string& destination,
                              const TurnRequest& request, const ReadOptions& read,
                              const WriteOptions& options);

}  // namespace fotomill
