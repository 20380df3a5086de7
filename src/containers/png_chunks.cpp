// PNG, big-endian: the signature 89 50 4E 47 0D 0A 1A 0A, then chunks up to IEND.
//
//   offset size  field
//        0    4  length of the data
//        4    4  type, four letters
//        8       data
//             4  CRC of type and data
// Source: W3C, "Portable Network Graphics (PNG) Specification (Third Edition)", 2025, section 5.
#include "containers/png_chunks.h"

#include <algorithm>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

bool IsLetter(char c) { return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z'); }

}  // namespace

PngWalk::PngWalk(WalkedBytes file) : file_(file) {
  const std::string_view signature = TextOf(file_.At(0, kPngSignature.size()));
  if (signature.empty() || !kPngSignature.starts_with(signature)) End(Status::DamagedFile);
  next_ = kPngSignature.size();
}

bool PngWalk::Next(PngPlace& chunk) {
  if (ended_) return false;
  ByteReader head(file_.At(next_, 8));
  const uint32_t size = head.Be32();
  chunk = {TextOf(head.Take(4)), next_ + 8, size};
  if (!head.Ok()) return End(Status::FileReadError);
  if (!std::ranges::all_of(chunk.type, IsLetter)) return End(Status::DamagedFile);  // maybe a hole
  next_ = chunk.End();
  ended_ = chunk.type == "IEND";
  return true;
}

bool PngWalk::End(Status outcome) {
  ended_ = true;
  outcome_ = outcome;
  return false;
}

bool PngChunks::Next(PngChunk& chunk) {
  PngPlace place;
  if (!walk_.Next(place) || place.End() > file_.size()) return false;
  chunk = {place.type, file_.subspan(place.data, place.size)};
  return true;
}

}  // namespace fotomill
