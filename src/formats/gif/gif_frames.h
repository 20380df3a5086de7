#pragma once

#include "formats/gif/gif_blocks.h"
#include "picture/animation.h"
#include "platform/memory.h"

namespace fotomill {

// Draws the frames of a GIF in their order on the logical screen, each disposed of as it asks
// before the next one.
class GifDrawing {
 public:
  // Begins with a transparent canvas of the screen's size. Statuses as NewCanvas.
  Status Begin(const GifScreen& screen, Canvas& canvas);
  // Draws a frame from the data behind `bytes`, which are left behind it. Statuses as DecodeFrame;
  // DamagedFile for a frame without size. With `rows`, which gets how many are there in full, a
  // frame that ends early is drawn as far as it goes.
  Status Draw(ByteReader& bytes, const GifFrame& frame, Canvas& canvas, int32_t* rows = nullptr);

 private:
  Status KeepBeneath(const GifFrame& frame, const Canvas& canvas);
  void Dispose(Canvas& canvas);

  GifFrame last_;                  // what is to be disposed of
  platform::MemoryBlock beneath_;  // what was there before it, if it wants that back
};

// The number of frames in a file of which the reader is behind the head of the first one.
// Counted as far as the file is whole.
int32_t CountGifFrames(ByteReader bytes, GifScreen screen);

}  // namespace fotomill
