#include "support/bitmaps.h"

#include <initializer_list>

namespace fotomill::test {

std::vector<uint8_t> BitmapFile(int32_t width, int32_t height, int32_t bits) {
  const uint32_t stride = static_cast<uint32_t>(width * bits + 31) / 32 * 4;
  const uint32_t colors = bits == 24 ? 0 : 1u << bits;
  const uint32_t rows = stride * static_cast<uint32_t>(height), offset = 54 + 4 * colors;
  std::vector<uint8_t> file{'B', 'M'};
  const auto put = [&file](int bytes, uint32_t value) {
    for (int i = 0; i < bytes; ++i) file.push_back(static_cast<uint8_t>(value >> (8 * i)));
  };
  for (const uint32_t value : {offset + rows, 0u, offset, 40u, static_cast<uint32_t>(width),
                               static_cast<uint32_t>(height)}) {
    put(4, value);
  }
  put(2, 1);
  put(2, static_cast<uint32_t>(bits));
  for (const uint32_t value : {0u, rows, 0u, 0u, colors, 0u}) put(4, value);
  for (uint32_t i = 0; i < colors; ++i) put(4, i * (0xffffffu / (colors - 1)) & 0xffffffu);
  for (uint32_t i = 0; i < rows; ++i) file.push_back(i % 7 < 3 ? 0x00 : 0xff);
  return file;
}

}  // namespace fotomill::test
