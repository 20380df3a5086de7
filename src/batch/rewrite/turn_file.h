#pragma once

#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "processing/geometry/orient.h"

namespace fotomill {

// Options for turning pictures.
struct TurnRequest {
  Orientation turn = Orientation::Upright;  // as displayed
  bool seenByExif = true;                   // apply the EXIF orientation first
  // crop JPEG edges that cannot be turned losslessly
  bool trim = false;
  bool keepTime = false;  // keep the modification time
  bool dryRun = false;    // write nothing; same result as a run
  StopToken stop = {};    // cancels with FunctionCancelled (4)
};

// Writes a turned copy of a picture file, or replaces it; `options` say what to do if the
// destination exists. JPEG pictures are turned losslessly, or only their orientation is changed.
// Others are decoded, turned and written in their own format, but only if the new file has every
// pixel unchanged: otherwise UnsuitableImage (13), with a hint. Nothing is written unless Ok.
RewrittenFile TurnPictureFile(const std::string& source, const std::string& destination,
                              const TurnRequest& request, const ReadOptions& read,
                              const WriteOptions& options);

}  // namespace fotomill
