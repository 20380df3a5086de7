// WebP chunks: "VP8X" with flags (1 byte) and canvas size, in files with more than one chunk,
// "ICCP" the profile, "ANIM" and "ANMF" frames, "ALPH", "VP8 " and "VP8L" pixels; "EXIF" and "XMP
// ".
// Source: RFC 9649, section 2.7.
#include <algorithm>
#include <string_view>

#include "containers/bare_file.h"
#include "containers/riff_chunks.h"
#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr std::string_view kPicture[] = {"VP8X", "ICCP", "ANIM", "ANMF", "ALPH", "VP8 ", "VP8L"};
constexpr uint8_t kExifFlag = 0x08, kXmpFlag = 0x04, kProfileFlag = 0x20;

}  // namespace

Status MakeBareWebp(std::span<const uint8_t> file, std::vector<uint8_t>& bare) {
  return MakeBareWebp(file, {}, bare);
}

Status MakeBareWebp(std::span<const uint8_t> file, const BareOptions& options,
                    std::vector<uint8_t>& bare) {
  bare.clear();
  if (!IsRiff(file, "WEBP")) return Status::DamagedFile;
  bare.assign(file.begin(), file.begin() + kRiffHead);
  RiffWalk walk(file);
  bool pixels = false;
  for (RiffPlace chunk; walk.Next(chunk);) {
    const uint64_t end = chunk.data + chunk.size;
    if (std::ranges::find(kPicture, chunk.name) == std::end(kPicture)) continue;
    if (chunk.name == "ICCP" && !options.profile) continue;
    ByteReader length(file.subspan(chunk.data - 4));
    if (length.Le32() != chunk.size) return Status::FileReadError;  // the file is truncated
    const size_t place = bare.size() + 8;
    bare.insert(bare.end(), file.begin() + static_cast<ptrdiff_t>(chunk.data - 8),
                file.begin() + static_cast<ptrdiff_t>(end));
    if (chunk.size % 2 != 0) bare.push_back(0);
    if (chunk.name == "VP8X" && chunk.size > 0)
      bare[place] &= static_cast<uint8_t>(
          ~(kExifFlag | kXmpFlag | (options.profile ? 0 : kProfileFlag)));
    pixels = pixels || chunk.name == "VP8 " || chunk.name == "VP8L" || chunk.name == "ANMF";
  }
  const uint64_t rest = bare.size() - 8;
  for (size_t i = 0; i < 4; ++i) bare[4 + i] = static_cast<uint8_t>(rest >> 8 * i);
  return pixels ? Status::Ok : Status::FileReadError;
}

}  // namespace fotomill
