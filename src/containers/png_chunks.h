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

// Where a chunk is in its file; it may claim more than there is.
struct PngPlace {
  std::string_view type;  // until the next chunk, where the file is not in memory
  uint64_t data = 0, size = 0;
  uint64_t End() const { return data + size + 4; }  // behind the CRC
};

// Walks the chunks of a file from its signature to IEND, the last one. CRCs are not checked.
class PngWalk {
 public:
  explicit PngWalk(WalkedBytes file);
  // The next chunk; false at the end.
  bool Next(PngPlace& chunk);
  // Why the walk ended: Ok behind IEND; DamagedFile (2) at what is no chunk; FileReadError (3)
  // where the file ends.
  Status Outcome() const { return outcome_; }
  // Whether it ended because reading failed.
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

// Walks the chunks of a file in memory as far as they are whole.
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
