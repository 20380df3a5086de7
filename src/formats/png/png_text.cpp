// Texts of PNG files:
//
//   tEXt  keyword, 0, text
//   zTXt  keyword, 0, method (0: deflate), text
//   iTXt  keyword, 0, flag (1: deflated), method, language, 0, translated keyword, 0, text in UTF-8
// Source: W3C, "Portable Network Graphics (PNG) Specification (Third Edition)", 2025.
#include "formats/png/png_text.h"

#include <libdeflate.h>

#include <algorithm>
#include <memory>

#include "platform/memory.h"

namespace fotomill {

namespace {

struct DecompressorDeleter {
  void operator()(libdeflate_decompressor* decompressor) const {
    libdeflate_free_decompressor(decompressor);
  }
};

// Retries with larger buffers, as the length of the text is not stored.
std::vector<uint8_t> Inflated(std::span<const uint8_t> data, uint64_t most) {
  constexpr uint64_t kFirst = 16 * 1024;
  const std::unique_ptr<libdeflate_decompressor, DecompressorDeleter> decompressor(
      libdeflate_alloc_decompressor());
  if (decompressor == nullptr) return {};
  for (uint64_t room = std::min(std::max<uint64_t>(kFirst, 4 * data.size()), most);;
       room = std::min(4 * room, most)) {
    platform::MemoryBlock text;
    if (!text.Allocate(room, platform::Fill::Unset)) return {};
    size_t size = 0;
    switch (libdeflate_zlib_decompress(decompressor.get(), data.data(), data.size(), text.Data(),
                                       room, &size)) {
      case LIBDEFLATE_SUCCESS: return {text.Data(), text.Data() + size};
      case LIBDEFLATE_INSUFFICIENT_SPACE: break;
      default: return {};
    }
    if (room == most) return {};
  }
}

// The bytes after the first NUL; empty if there is none.
std::span<const uint8_t> BehindZero(std::span<const uint8_t> data) {
  const auto zero = std::ranges::find(data, uint8_t{0});
  return zero == data.end() ? std::span<const uint8_t>()
                            : data.subspan(static_cast<size_t>(zero - data.begin()) + 1);
}

}  // namespace

std::string_view PngTextKeyword(const PngChunk& chunk) {
  constexpr size_t kMost = 79;
  const std::string_view start(reinterpret_cast<const char*>(chunk.data.data()),
                               std::min(chunk.data.size(), kMost + 1));
  return start.substr(0, start.find('\0'));
}

std::vector<uint8_t> PngTextOf(const PngChunk& chunk, uint64_t most) {
  std::span<const uint8_t> text = BehindZero(chunk.data);
  bool deflated = chunk.type == "zTXt";
  const size_t head = chunk.type == "iTXt" ? 2 : deflated ? 1 : 0;
  if (text.size() < head) return {};
  if (head > 0 && text[head - 1] != 0) return {};  // an unknown compression method
  if (chunk.type == "iTXt") deflated = text[0] != 0;
  text = text.subspan(head);
  if (chunk.type == "iTXt") text = BehindZero(BehindZero(text));
  if (deflated) return Inflated(text, most);
  return text.size() <= most ? std::vector<uint8_t>(text.begin(), text.end())
                             : std::vector<uint8_t>();
}

}  // namespace fotomill
