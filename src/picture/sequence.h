#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "core/status.h"

namespace fotomill {

struct PictureRecord;

// What is known of a file with several pictures before it is written.
struct SequenceFacts {
  size_t count = 0;       // of pictures, at least one
  bool animated = false;  // they are frames of one size, played in time
  int32_t rounds = 0;     // how often frames are to be played, 0 for ever
};

// A file with several pictures in the making. Codecs derive from this. Without a successful Finish
// the file never appears.
class SequenceWriter {
 public:
  virtual ~SequenceWriter() = default;
  // Appends a picture; frames are shown for `delayMs`. UnsuitableImage (13) for a frame of another
  // size than the first, else what writing a single picture returns.
  virtual Status Add(PictureRecord& picture, int32_t delayMs) = 0;
  // Completes the file and gives it its name, as the options say.
  virtual Status Finish() = 0;
};
using SequencePointer = std::unique_ptr<SequenceWriter>;  // null if there is none

}  // namespace fotomill
