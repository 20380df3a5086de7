// The text of a profile: "\n", a name, "\n", the number of bytes right-aligned in 8 columns, "\n",
// lines of up to 72 hexadecimal digits. Source: the ImageMagick project, whose programs introduced
// it; ExifTool, "PNG Tags", "Raw profile type".
#include "formats/png/png_raw_profile.h"

#include <zlib.h>

#include <algorithm>
#include <charconv>
#include <cstdio>

#include "core/limits.h"
#include "core/text.h"
#include "formats/png/png_text.h"

namespace fotomill {

namespace {

constexpr std::string_view kHead = "Raw profile type ";

int DigitOf(char c) {
  const char lower = LowerCase(c);
  return c >= '0' && c <= '9' ? c - '0' : lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : -1;
}

// Removes and returns the first word.
std::string_view TakeWord(std::string_view& text) {
  constexpr std::string_view kBlanks = " \t\r\n";
  text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
  const std::string_view word = text.substr(0, text.find_first_of(kBlanks));
  text.remove_prefix(word.size());
  return word;
}

}  // namespace

PngRawProfile PngRawProfileOf(std::string_view keyword) {
  if (!keyword.starts_with(kHead)) return PngRawProfile::None;
  const std::string_view name = keyword.substr(kHead.size());
  if (EqualIgnoringCase(name, "exif")) return PngRawProfile::Exif;
  // the name of the segment, which holds either
  if (EqualIgnoringCase(name, "APP1")) return PngRawProfile::Exif;
  if (EqualIgnoringCase(name, "xmp")) return PngRawProfile::Xmp;
  if (EqualIgnoringCase(name, "iptc") || EqualIgnoringCase(name, "8bim"))
    return PngRawProfile::Iptc;
  return PngRawProfile::Other;
}

std::vector<uint8_t> ReadPngRawProfile(const PngChunk& chunk) {
  const std::vector<uint8_t> stored = PngTextOf(chunk, limits.pngTextBytes);
  std::string_view text = TextOf(stored);
  (void)TakeWord(text);
  const std::string_view number = TakeWord(text);
  size_t size = 0;
  const auto [end, error] = std::from_chars(number.data(), number.data() + number.size(), size);
  if (error != std::errc{} || end != number.data() + number.size() || size > text.size() / 2)
    return {};
  std::vector<uint8_t> bytes;
  bytes.reserve(size);
  int high = -1;
  for (const char c : text) {
    const int digit = DigitOf(c);
    if (digit < 0 && c != '\n' && c != '\r' && c != ' ') return {};
    if (digit < 0) continue;
    if (high >= 0) bytes.push_back(static_cast<uint8_t>(high << 4 | digit));
    high = high >= 0 ? -1 : digit;
  }
  return bytes.size() == size ? bytes : std::vector<uint8_t>();
}

std::vector<uint8_t> MakePngRawProfile(std::string_view keyword, std::span<const uint8_t> bytes) {
  constexpr size_t kBytesPerLine = 36;
  constexpr char kDigits[] = "0123456789abcdef";
  const std::string_view name = keyword.starts_with(kHead) ? keyword.substr(kHead.size()) : keyword;
  char size[32];
  std::snprintf(size, sizeof size, "\n%8zu", bytes.size());
  std::string text = "\n";
  text.append(name).append(size);
  for (size_t i = 0; i < bytes.size(); ++i) {
    if (i % kBytesPerLine == 0) text += '\n';
    text += kDigits[bytes[i] >> 4];
    text += kDigits[bytes[i] & 15];
  }
  text += '\n';
  std::vector<uint8_t> data(keyword.begin(), keyword.end());
  data.resize(data.size() + 2);  // its end, and method 0
  const size_t head = data.size();
  uLongf room = compressBound(text.size());
  data.resize(head + room);
  const auto* source = static_cast<const Bytef*>(static_cast<const void*>(text.data()));
  // only fails if memory runs out or the room is too small
  if (compress2(data.data() + head, &room, source, text.size(), 9) != Z_OK) return {};
  data.resize(head + room);
  return data;
}

}  // namespace fotomill
