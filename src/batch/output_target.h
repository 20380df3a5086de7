#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "picture/picture_record.h"

namespace fotomill {

struct BatchJob;

// One of the outputs that a function creates for every file. Unset fields default to the job's.
struct BatchOutput {
  // name in reports; also appended to the base name if `name` is empty. May be empty
  std::string label = {};
  // Processes the picture after the function's own transform. Called concurrently on several
  // threads, with different pictures.
  std::function<Status(PictureRecord& picture)> transform = {};
  int32_t formatIndex = kNoFormat;
  std::string extension = {};  // as spelled by the format
  // absolute, or relative to the job's destination folder, else to the source's
  std::string folder = {};
  // The name without folder and extension. `picture`
  // is the final one, or null if not needed.
  std::function<std::string(const std::string& source, const PictureRecord* picture)> name = {};
  bool nameNeedsPicture = false;
  int32_t quality = 0;     // 1 to 100, for lossy formats; 0: use settings
  uint64_t mostBytes = 0;  // maximum file size, 0: none; the best quality is found by trial
};

// The destination of one output of one file.
struct OutputTarget {
  const BatchOutput* output = nullptr;
  int32_t formatIndex = kNoFormat;
  std::string extension;
  bool kept = false;            // the source's own format, not a requested one
  std::string path;             // empty until the picture is available, if the name needs it
  bool sequence = false;        // write all pictures of the source to one file
  int32_t page = 0, pages = 0;  // one of several numbered outputs, from 1; 0: the only one
};

// Formats for outputs that keep the source's format, if that cannot be written.
struct FallbackFormat {
  int32_t formatIndex = kNoFormat;
  std::string extension;
};

// The format of an output of `source`; the path is left empty.
OutputTarget TargetOf(const std::string& source, const BatchOutput& output, const BatchJob& job,
                      const FallbackFormat& fallback);

// All plug-ins share a row of the format table, a row of its own on each thread, and reading a
// source may bind it to the source's format. Binds it to the target's, if that is a plug-in's.
void BindPluginRow(const OutputTarget& target);

// Writes a picture in the best quality, 1 to 100, with a file size of at most `most` bytes; `write`
// does a trial or writes the output. UnsuitableImage (13) if even the lowest quality is too large,
// with its size in `smallest`; else the status of `write`.
Status FindQuality(uint64_t most,
                   const std::function<Status(int32_t quality, uint64_t& bytes)>& trial,
                   int32_t& quality, uint64_t& smallest);

}  // namespace fotomill
