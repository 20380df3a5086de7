#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "containers/walked_bytes.h"

namespace fotomill {

inline constexpr uint64_t kRiffHead = 12;  // bytes before the first chunk

// Whether a file is RIFF with that form type.
bool IsRiff(std::span<const uint8_t> head, std::string_view form);

// Position of a chunk in its file, cut at the end of the file.
struct RiffPlace {
  std::string_view name;  // valid until the next chunk if the file is not in memory
  uint64_t data = 0, size = 0;
};

// Iterates over the chunks of a RIFF file to the end of the file, ignoring the size in its header.
class RiffWalk {
 public:
  explicit RiffWalk(WalkedBytes file) : file_(file) {}
  // The next chunk; false at the end.
  bool Next(RiffPlace& chunk);
  // Whether it ended because of a read error.
  bool ReadFailed() const { return file_.Failed(); }

 private:
  WalkedBytes file_;
  uint64_t next_ = kRiffHead;
};

}  // namespace fotomill
