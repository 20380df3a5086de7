#pragma once

#include "formats/gif/gif_blocks.h"
#include "picture/animation.h"
#include "platform/memory.h"

namespace fotomill {

// Composes the frames of a GIF in order on the logical screen, applying each frame's disposal
// before the next one.
class GifDrawing {
 public:
  // Starts with a transparent canvas of the screen's size. Statuses as NewCanvas.
  Status Begin(const GifScreen& screen, Canvas& canvas);
  // Draws a frame from the data at `bytes`, and advances past them. Statuses as DecodeFrame;
  // DamagedFile for an empty frame. With `rows`, which receives the number of complete rows, a
  // truncated frame is drawn as far as possible.
  Status Draw(ByteReader& bytes, const GifFrame& frame, Canvas& canvas, int32_t* rows = nullptr);

 private:
  Status KeepBeneath(const GifFrame& frame, const Canvas& canvas);
  void Dispose(Canvas& canvas);

  GifFrame last_;                  // the frame to be disposed of
  platform::MemoryBlock beneath_;  // the area below it, if it must be restored
};

// The number of frames in a file, with the reader after the header of the first one. Counts up
// to a truncation.
int32_t CountGifFrames(ByteReader bytes, GifScreen screen);

}  // namespace fotomill
