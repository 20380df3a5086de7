#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "picture/picture_record.h"

namespace fotomill {

struct BatchJob;

// One of the outputs that a function makes of every file. What it leaves open is as the job says.
struct BatchOutput {
  // its name in reports; also behind the base name where `name` is missing. May be empty
  std::string label = {};
  // Works on the picture behind the function's own transform. Called on several threads at once, on
  // a picture each.
  std::function<Status(PictureRecord& picture)> transform = {};
  int32_t formatIndex = kNoFormat;
  std::string extension = {};  // as the format has it
  // beneath the job's destination folder, else beneath the source's; or an absolute one
  std::string folder = {};
  // The name without folder and extension. `picture` is the finished one, or null where it is not
  // needed.
  std::function<std::string(const std::string& source, const PictureRecord* picture)> name = {};
  bool nameNeedsPicture = false;
  int32_t quality = 0;     // 1 to 100, of formats with lossy compression; 0: as configured
  uint64_t mostBytes = 0;  // 0, or the largest file: the best quality that fits is found by trial
};

// Where one output of one file goes.
struct OutputTarget {
  const BatchOutput* output = nullptr;
  int32_t formatIndex = kNoFormat;
  std::string extension;
  bool kept = false;  // the source's own format, not one that was requested
  std::string path;   // empty until the picture is there, where the name needs it
  bool sequence = false;        // all pictures of the source go into one file
  int32_t page = 0, pages = 0;  // one of several numbered outputs, from 1; 0: the only one
};

// Formats for files whose outputs keep the format of their sources where it can be written.
struct FallbackFormat {
  int32_t formatIndex = kNoFormat;
  std::string extension;
};

// The format of an output of `source`; its path is left empty.
OutputTarget TargetOf(const std::string& source, const BatchOutput& output, const BatchJob& job,
                      const FallbackFormat& fallback);

// Writes a picture in the best quality, 1 to 100, whose file has at most `most` bytes; `write` does
// a trial or the real thing. UnsuitableImage (13) when even the lowest quality gives a larger one,
// with its size in `smallest`; else as `write`.
Status FindQuality(uint64_t most,
                   const std::function<Status(int32_t quality, uint64_t& bytes)>& trial,
                   int32_t& quality, uint64_t& smallest);

}  // namespace fotomill
