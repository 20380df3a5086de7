// RIFF, little-endian: "RIFF", the size of the rest (4 bytes), a form type of four letters, then
// chunks.
//
//   offset size  field
//        0    4  name
//        4    4  size of the data
//        8       data, padded to an even size
// Source: IBM and Microsoft, "Multimedia Programming Interface and Data Specifications 1.0" (1991).
#include "containers/riff_chunks.h"

#include <algorithm>

#include "core/byte_reader.h"

namespace fotomill {

bool IsRiff(std::span<const uint8_t> head, std::string_view form) {
  ByteReader bytes(head);
  if (!bytes.Match("RIFF")) return false;
  bytes.Skip(4);
  return bytes.Match(form);
}

bool RiffWalk::Next(RiffPlace& chunk) {
  ByteReader head(file_.At(next_, 8));
  chunk.name = TextOf(head.Take(4));
  const uint64_t length = head.Le32();
  if (!head.Ok()) return false;
  chunk.data = next_ + 8;
  chunk.size = std::min(length, file_.Size() - chunk.data);
  next_ = chunk.data + length + length % 2;
  return true;
}

}  // namespace fotomill
