#include <algorithm>
#include <string_view>

#include "containers/bare_file.h"
#include "containers/png_chunks.h"

namespace fotomill {

namespace {

// Chunks with the pixels, or that affect the picture's appearance or size.
constexpr std::string_view kPicture[] = {
    "IHDR", "PLTE", "IDAT", "IEND", "tRNS", "cHRM", "gAMA", "iCCP", "sBIT", "sRGB", "cICP", "mDCv",
    "mDCV", "cLLi", "cLLI", "bKGD", "hIST", "pHYs", "sPLT", "oFFs", "acTL", "fcTL", "fdAT"};

}  // namespace

Status MakeBarePng(std::span<const uint8_t> file, std::vector<uint8_t>& bare) {
  bare.assign(kPngSignature.begin(), kPngSignature.end());
  PngWalk walk(file);
  for (PngPlace chunk; walk.Next(chunk);) {
    if (chunk.End() > file.size()) return Status::FileReadError;
    const auto whole = file.subspan(chunk.data - 8, chunk.End() - chunk.data + 8);
    const bool belongs = std::ranges::find(kPicture, chunk.type) != std::end(kPicture);
    if (belongs) bare.insert(bare.end(), whole.begin(), whole.end());
  }
  return walk.Outcome();
}

}  // namespace fotomill
