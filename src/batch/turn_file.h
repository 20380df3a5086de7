#pragma once

#include <string>

#include "core/status.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "processing/geometry/orient.h"

namespace fotomill {

// How pictures are to be turned.
struct TurnRequest {
  Orientation turn = Orientation::Upright;  // of the picture as it is seen
  bool seenByExif = true;                   // it is seen as its EXIF orientation says
  bool trim = false;                        // edges of JPEG pictures that cannot be turned without loss are cut off
  bool keepTime = false;                    // the new file has the time of the old one
};

// What became of one file.
struct TurnedFile {
  Status status = Status::Ok;
  std::string hint = {};  // to a failure, as a sentence
  std::string note = {};  // how it was turned where that is not as usual
  bool changed = false;   // false: nothing was written, the file is turned so already
};

// Writes a turned copy of a picture file, or takes its place; `options` say what becomes of a file of the destination's name.
// JPEG pictures turn without loss, or by their orientation alone. Others are decoded, turned and written in their own format,
// but only where the new file then holds every pixel as it was: UnsuitableImage (13), with a hint, where it does not. Nothing is
// written unless Ok.
TurnedFile TurnPictureFile(const std::string& source, const std::string& destination, const TurnRequest& request,
                           const ReadOptions& read, const WriteOptions& options);

}  // namespace fotomill
