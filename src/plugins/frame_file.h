#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "core/byte_writer.h"
#include "picture/picture_record.h"
#include "platform/file_view.h"
#include "platform/temporary_folder.h"
#include "plugins/fotomill_plugin.h"

namespace fotomill {

// The frames of an animation on their way to a module: in a temporary file, so that neither the
// program nor the worker process holds more than one. Each is a packed bitmap of 32 bits.

// What there is to know about the frames besides their pixels.
struct FrameFacts {
  std::string path;
  int32_t width = 0, height = 0;
  int32_t rounds = 0;           // 0 for endless
  bool transparent = false;     // any of them is
  std::vector<int32_t> delays;  // one for each frame, milliseconds
};

class FrameFileWriter {
 public:
  Status Create();
  // Appends a picture, which may be promoted to 24 bits. UnsuitableImage (13) if its size differs
  // from that of the first.
  Status Add(PictureRecord& picture, int32_t delayMs);
  // Completes the file, which is deleted with the writer.
  Status Finish();
  FrameFacts facts;

 private:
  platform::TemporaryFolder folder_;
  ByteWriter out_;
  std::vector<uint8_t> bitmap_;
};

// The frames as a module sees them.
class FrameFileReader {
 public:
  // The facts must outlive the reader. DamagedFile (2) if the file is shorter than they say.
  Status Open(const FrameFacts& facts);
  const FMW_FRAMES& Frames() const { return frames_; }

 private:
  struct SelfKnowing : FMW_FRAMES {
    FrameFileReader* reader = nullptr;
  };
  static FMW_HANDLE FMW_CALL FrameOf(const FMW_FRAMES* frames, int32_t index);
  FMW_HANDLE Frame(int32_t index);

  const FrameFacts* facts_ = nullptr;
  SelfKnowing frames_ = {};
  platform::FileView file_;
  std::vector<uint8_t> bitmap_, opaque_;
};

}  // namespace fotomill
