#pragma once

#include <algorithm>
#include <cstdint>
#include <span>
#include <string_view>

#include "containers/walked_bytes.h"
#include "core/status.h"

namespace fotomill {

// PNG specification, section 5.2.
inline constexpr std::string_view kPngSignature("\x89PNG\r\n\x1a\n", 8);

// Position of a chunk in its file; its size may exceed the file.
struct PngPlace {
  std::string_view type;  // valid until the next chunk if the file is not in memory
  uint64_t data = 0, size = 0;
  uint64_t End() const { return data + size + 4; }  // after the CRC
};

// Iterates over the chunks of a file from its signature through IEND. CRCs are not checked.
class PngWalk {
 public:
  explicit PngWalk(WalkedBytes file);
  // The next chunk; false at the end.
  bool Next(PngPlace& chunk);
  // Why the walk ended: Ok after IEND; DamagedFile (2) at an invalid chunk; FileReadError (3) at
  // the end of the file.
  Status Outcome() const { return outcome_; }
  // Whether it ended because of a read error.
  bool ReadFailed() const { return file_.Failed(); }

 private:
  bool End(Status outcome);

  WalkedBytes file_;
  uint64_t next_ = 0;
  bool ended_ = false;
  Status outcome_ = Status::Ok;
};

// One chunk of a file in memory.
struct PngChunk {
  std::string_view type;
  std::span<const uint8_t> data;
};

// Iterates over the complete chunks of a file in memory.
class PngChunks {
 public:
  explicit PngChunks(std::span<const uint8_t> file) : file_(file), walk_(file) {}
  // The next chunk; false at the end.
  bool Next(PngChunk& chunk);

 private:
  std::span<const uint8_t> file_;
  PngWalk walk_;
};

}  // namespace fotomill
