#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "batch/batch_file.h"
#include "batch/fit_picture.h"
#include "batch/job.h"
#include "batch/output_target.h"

namespace fotomill {

// All pages: into one file if the format supports several, else into numbered files.
inline constexpr int32_t kAllPages = -1;

// How to process each file of a selection.
struct BatchFunction {
  // Changes the decoded picture; empty for plain conversion. Called concurrently on several
  // threads, with different pictures.
  std::function<Status(PictureRecord& picture)> transform = {};
  // ReadRequest::thumbnailSide for a picture without pixels yet; empty: full size needed
  std::function<int32_t(const PictureRecord& facts)> decodedSide = {};
  // created from a single decode; none: one output with the job's options
  std::vector<BatchOutput> outputs = {};
  // for jobs without format: if the source's format cannot be written
  FallbackFormat fallback = {};
  FileFunction history = FileFunction::Convert;  // recorded in the file history for the sources
  std::optional<std::string> prefix =
      {};  // of all names: at most 32 characters, without separators; none: the job's,
           // but no prefix for names chosen by an output
  // not empty: the full output path for a selection of one file
  std::string out = {};
  // `out` is the only possible output, such as a stream: several files fail with UnsuitableImage
  bool oneFile = false;
  // for files with several: from 1, or kAllPages; 0: all frames if an animation stays one, else the
  // first page
  int32_t page = 0;
  uint32_t jobs = 0;                             // number of parallel jobs; 0: one per core
  bool reduce = false;  // reduce colors if the format supports fewer; always done for formats
                        // kept from the source
  std::string reduceHint = {};                   // follows "Too many colors."
  // convert the readable part of truncated files, with a note
  bool salvage = false;
  std::string salvageHint = {};  // follows "File read error." if not set
  bool autoOrient = false;       // rotate pictures upright by EXIF orientation
  bool keepMetadata = true;      // copy EXIF, XMP and comments
  ProfileRequest profile = {};   // how to handle color profiles
  // also re-encode files that only lose metadata, as a quality was requested
  bool encodesAnew = false;
  // copy the modification times of the sources
  bool keepTimes = false;
  // recreate the folders of the selection in the destination folder
  bool keepTree = false;
  // write nothing; same outcomes as a run, as far as possible
  bool dryRun = false;
};

// Runs a function on a selection: opens the job's progress box, shows prompts, converts, reports
// every file in selection order, collects entries for the file history, and closes the box.
// Decoding, transforming and encoding run on several threads; everything else happens on the
// calling thread in selection order, so that outputs, names, prompts and lines are the same as with
// one thread; only a name entered at a prompt may be rejected because a later file already has it.
// After Abort no more files are started, and current files are finished or leave nothing behind.
// Ok, or FunctionCancelled if the user declined to start.
Status RunBatch(std::span<const BatchFile> files, const BatchFunction& function, BatchJob& job);

}  // namespace fotomill
