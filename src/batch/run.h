#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "batch/fit_picture.h"
#include "batch/job.h"
#include "batch/output_target.h"

namespace fotomill {

// One file of the selection.
struct BatchFile {
  std::string name;
  // subfolder below the chosen folder, "" or "a/b": for outputs that keep the tree
  std::string below;
  // what is known to be wrong with it already; it is reported and not opened
  Status status = Status::Ok;
  std::string hint;            // what goes behind the message of such a failure
};

// Every page goes into an output: into one file where the format holds several, else into files
// with numbered names.
inline constexpr int32_t kAllPages = -1;

// What a function does to every file of its selection.
struct BatchFunction {
  // Changes the decoded picture; empty for plain conversion. Called on several threads at once,
  // with different pictures.
  std::function<Status(PictureRecord& picture)> transform = {};
  // ReadRequest::thumbnailSide for a picture whose facts are known; empty: every pixel is needed
  std::function<int32_t(const PictureRecord& facts)> decodedSide = {};
  // each file is decoded once for all of them; none: one, as the job says
  std::vector<BatchOutput> outputs = {};
  // for jobs without a format: of sources whose own cannot be written
  FallbackFormat fallback = {};
  FileFunction history = FileFunction::Convert;  // under which the sources go into the file history
  std::optional<std::string> prefix =
      {};  // in front of every name: at most 32 characters, a plain name; none: the job's,
           // but nothing in front of names that an output makes itself
  // not empty: the whole path of the output of a selection of one
  std::string out = {};
  // that path is all there is, such as a stream: pages in several files fail with UnsuitableImage
  bool oneFile = false;
  // of files with several, from 1, or kAllPages; 0: all frames where an animation becomes one, else
  // the first page
  int32_t page = 0;
  uint32_t jobs = 0;                             // number of parallel jobs; 0: one per core
  bool reduce = false;  // colors of pictures that are too deep for the format are reduced, as
                        // they always are for a format that was kept
  std::string reduceHint = {};                   // follows "Too many colors."
  // what can be read of files that end early is converted, with a note
  bool salvage = false;
  std::string salvageHint = {};                  // follows "File read error." without that
  bool autoOrient = false;                       // pictures are rotated upright by EXIF orientation
  bool keepMetadata = true;                      // EXIF, XMP and comments are copied
  ProfileRequest profile = {};                   // color profiles
  // files that only lose their metadata are encoded anyway, with a quality that was asked for
  bool encodesAnew = false;
  // outputs get the modification times of their sources
  bool keepTimes = false;
  // the folders of the selection are recreated in the destination folder
  bool keepTree = false;
  // nothing is written; outcomes are those of a run, as far as they can be told
  bool dryRun = false;
};

// Runs a function over a selection: opens the job's progress box, asks questions, converts, reports
// every file in selection order, collects entries for the file history, and finishes the box.
// Decoding, transforming and encoding run on several threads; everything else happens on the
// calling thread in the order of the selection, so that outputs, names, questions and lines are the
// same as with one thread; only a name typed into a question may be refused because a later file
// already has it. After Abort no more files are started, and current files are finished or leave
// nothing behind. Ok, or FunctionCancelled if the user declined to start.
Status RunBatch(std::span<const BatchFile> files, const BatchFunction& function, BatchJob& job);

}  // namespace fotomill
