#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "core/status.h"

namespace fotomill {

struct PictureRecord;

// Facts about a multi-picture file that must be known before writing.
struct SequenceFacts {
  size_t count = 0;       // pictures, at least one
  bool animated = false;  // they are the frames of an animation, all of one size
  int32_t rounds = 0;     // number of times the animation plays, 0 for endless
};

// Writes a file with several pictures. Codecs derive from this. Without a successful Finish, no
// file is created.
class SequenceWriter {
 public:
  virtual ~SequenceWriter() = default;
  // Appends a picture; frames are shown for `delayMs`. UnsuitableImage (13) if a frame differs in
  // size from the first, else the statuses of writing a single picture.
  virtual Status Add(PictureRecord& picture, int32_t delayMs) = 0;
  // Completes the file and renames it to its final name, as the options say.
  virtual Status Finish() = 0;
};
using SequencePointer = std::unique_ptr<SequenceWriter>;  // null if there is none

}  // namespace fotomill
