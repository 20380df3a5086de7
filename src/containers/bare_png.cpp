#include <algorithm>
#include <string_view>

#include "containers/bare_file.h"
#include "containers/png_chunks.h"
#include "core/byte_reader.h"

namespace fotomill {

namespace {

// Chunks with the pixels, or that affect the picture's appearance or size.
constexpr std::string_view kPicture[] = {
    "IHDR", "PLTE", "IDAT", "IEND", "tRNS", "cHRM", "gAMA", "iCCP", "sBIT", "sRGB", "cICP", "mDCv",
    "mDCV", "cLLi", "cLLI", "bKGD", "hIST", "pHYs", "sPLT", "oFFs", "acTL", "fcTL", "fdAT"};

constexpr std::string_view kTexts[] = {"tEXt", "zTXt", "iTXt"};
constexpr std::string_view kXmp = "XML:com.adobe.xmp", kRawProfile = "Raw profile type ";
constexpr std::string_view kRawIptc("Raw profile type iptc\0", 22);

bool Belongs(const PngPlace& chunk, std::span<const uint8_t> file, const BareOptions& options) {
  if (chunk.type == "iCCP" && !options.profile) return false;
  if (std::ranges::find(kPicture, chunk.type) != std::end(kPicture)) return true;
  if (std::ranges::find(kTexts, chunk.type) == std::end(kTexts)) return false;
  ByteReader text(file.subspan(chunk.data, chunk.size));
  if (options.iptc && text.Match(kRawIptc)) return true;
  return options.texts && !text.Match(kXmp) &&
         !text.Match(kRawProfile);  // metadata blocks stored as texts
}

}  // namespace

Status MakeBarePng(std::span<const uint8_t> file, std::vector<uint8_t>& bare) {
  return MakeBarePng(file, {}, bare);
}

Status MakeBarePng(std::span<const uint8_t> file, const BareOptions& options,
                   std::vector<uint8_t>& bare) {
  bare.assign(kPngSignature.begin(), kPngSignature.end());
  PngWalk walk(file);
  for (PngPlace chunk; walk.Next(chunk);) {
    if (chunk.End() > file.size()) return Status::FileReadError;
    const auto whole = file.subspan(chunk.data - 8, chunk.End() - chunk.data + 8);
    if (Belongs(chunk, file, options)) bare.insert(bare.end(), whole.begin(), whole.end());
  }
  return walk.Outcome();
}

}  // namespace fotomill
