#pragma once

#include <memory>
#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "operations/recipe.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "processing/faces/face_options.h"
#include "processing/palette/reduce.h"

namespace fotomill {

// The steps of an edit, and what they need besides the picture.
struct EditRequest {
  std::shared_ptr<const Recipe> recipe;  // only its common steps are applied
  std::string copyrightHolder;           // for the macro %N
  FaceOptions faces;
  ReduceOptions reduction;   // for results with more colors than the format supports
  bool turnsUpright = true;  // if the orientation tag gets lost
  uint32_t threads = 0;      // for each picture; 0: one per core
};

// Applies steps to a picture file and writes the result in the same format, replacing it or to
// another file; `options` say what to do if that exists. JPEG pictures keep the quality of the
// source; a crop between their blocks is lossless. EXIF, XMP and color profile are kept as far as
// the format supports them; the note names what was left out. UnsuitableImage (13), with a hint,
// for files of several pictures, with more than 8 bits a channel, or damaged, and for formats that
// cannot be written; TooManyColors (12) never. Nothing is written unless Ok.
RewrittenFile EditPictureFile(const std::string& source, const std::string& destination,
                              const EditRequest& edit, const RewriteRequest& request,
                              const ReadOptions& read, const WriteOptions& options);

// Copies a file beside itself, "beach.jpg.bak", or with a number if that exists: "beach.jpg.bak2".
// Times are kept. False if it could not be written; nothing is left then.
[[nodiscard]] bool KeepBackup(const std::string& path);

}  // namespace fotomill
