#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "containers/walked_bytes.h"

namespace fotomill {

inline constexpr uint64_t kRiffHead = 12;  // bytes in front of the first chunk

// Whether a file is RIFF of that form.
bool IsRiff(std::span<const uint8_t> head, std::string_view form);

// Where a chunk is in its file, as far as the file goes.
struct RiffPlace {
  std::string_view name;  // until the next chunk, where the file is not in memory
  uint64_t data = 0, size = 0;
};

// Walks the chunks of a RIFF file to the end of the file, whatever length its header claims.
class RiffWalk {
 public:
  explicit RiffWalk(WalkedBytes file) : file_(file) {}
  // The next chunk; false at the end.
  bool Next(RiffPlace& chunk);
  // Whether it ended because reading failed.
  bool ReadFailed() const { return file_.Failed(); }

 private:
  WalkedBytes file_;
  uint64_t next_ = kRiffHead;
};

}  // namespace fotomill
