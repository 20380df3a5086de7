// Radiance pictures (HDR), read and written.
//
//   "#?RADIANCE" or "#?RGBE", lines of variables and comments, an empty line
//   "-Y height +X width", or another order of the axes
//   scan lines of pixels: red, green, blue and their common exponent, a byte each
//
// A pixel is its bytes times 2 to the power of the exponent - 136. Scan lines are stored in three
// ways: flat; with runs of pixels, each "1 1 1 count" repeating the pixel before it; or, introduced
// by "2 2" and the length, as runs of bytes of one component after the other.
// Source: G. Ward, "Real Pixels", Graphics Gems II (1991); Radiance reference, "The RADIANCE
// Picture File Format".
#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "fotomill_plugin_exports.h"
#include "fotomill_plugin_light.h"

namespace {

constexpr size_t kMostHeader = 1 << 16;
constexpr uint32_t kLeastPacked = 8, kMostPacked = 32767;  // length of a scan line of packed bytes
constexpr int kBias = 136;

enum OptionPlace { kExposure, kHighlights, kOptions };
constexpr FMW_OPTION kOptionTable[] = {FMW_LIGHT_OPTIONS};
static_assert(std::size(kOptionTable) == kOptions);

struct Axis {
  char name = 0;
  bool backwards = false;
  uint32_t length = 0;
};

struct Header {
  Axis lines, pixels;  // along the scan lines, and within one
  bool xyz = false;    // CIE colors
  size_t start = 0;    // of the pixels
  uint32_t Width() const { return lines.name == 'X' ? lines.length : pixels.length; }
  uint32_t Height() const { return lines.name == 'Y' ? lines.length : pixels.length; }
};

// Takes "-Y 480" off a text.
bool TakeAxis(std::string_view& text, Axis& axis) {
  if (text.size() < 4 || (text[0] != '-' && text[0] != '+') || (text[1] != 'X' && text[1] != 'Y') ||
      text[2] != ' ')
    return false;
  axis.name = text[1];
  axis.backwards = text[0] == (axis.name == 'X' ? '-' : '+');
  text.remove_prefix(3);
  uint64_t length = 0;
  size_t digits = 0;
  for (; digits < text.size() && digits < 10 && text[digits] >= '0' && text[digits] <= '9';
       ++digits)
    length = 10 * length + static_cast<uint64_t>(text[digits] - '0');
  text.remove_prefix(digits);
  if (!text.empty() && text[0] == ' ') text.remove_prefix(1);
  axis.length = static_cast<uint32_t>(std::min<uint64_t>(length, INT32_MAX));
  return length > 0;
}

int32_t ParseHeader(const FmwFile& file, Header& header) {
  const std::string_view all(reinterpret_cast<const char*>(file.bytes),
                             std::min(file.size, kMostHeader));
  if (!all.starts_with("#?RADIANCE") && !all.starts_with("#?RGBE")) return FMW_ERROR_DAMAGED;
  for (size_t place = 0;;) {
    const size_t end = all.find('\n', place);
    if (end == all.npos) return file.size < kMostHeader ? FMW_ERROR_READ : FMW_ERROR_DAMAGED;
    const std::string_view line = all.substr(place, end - place);
    place = end + 1;
    if (line.starts_with("FORMAT=")) {
      header.xyz = line.find("xyze") != line.npos;
      if (!header.xyz && line.find("rgbe") == line.npos) return FMW_ERROR_FORMAT;
    }
    if (!line.empty()) continue;
    header.start = all.find('\n', place);
    if (header.start == all.npos) return FMW_ERROR_READ;
    std::string_view size = all.substr(place, header.start - place);
    ++header.start;
    const bool good = TakeAxis(size, header.lines) && TakeAxis(size, header.pixels) &&
                      header.lines.name != header.pixels.name;
    return good ? 0 : FMW_ERROR_DAMAGED;
  }
}

// ---- reading ----

// The scan lines of a file.
class ScanLines {
 public:
  ScanLines(const FmwFile& file, const Header& header)
      : next_(file.bytes + header.start),
        end_(file.bytes + file.size),
        line_(size_t{4} * header.pixels.length) {}

  // The pixels of the next line, null if it is damaged or the file has ended.
  const uint8_t* Next() {
    const size_t pixels = line_.size() / 4;
    const bool packed = pixels >= kLeastPacked && pixels <= kMostPacked && Left() >= 4 &&
                        next_[0] == 2 && next_[1] == 2 && next_[2] < 128;
    if (!packed) return TakePixels() ? line_.data() : nullptr;
    if (FmwGetBe(next_ + 2, 2) != pixels) return nullptr;
    next_ += 4;
    for (size_t component = 0; component < 4; ++component) {
      if (!TakeComponent(component)) return nullptr;
    }
    return line_.data();
  }

 private:
  size_t Left() const { return static_cast<size_t>(end_ - next_); }

  bool TakePixels() {
    int shift = 0;
    for (size_t done = 0; done < line_.size(); next_ += 4) {
      if (Left() < 4) return false;
      if (next_[0] != 1 || next_[1] != 1 || next_[2] != 1) {
        std::copy_n(next_, 4, line_.begin() + static_cast<ptrdiff_t>(done));
        done += 4;
        shift = 0;
        continue;
      }
      const size_t count = size_t{next_[3]} << shift;
      if (done == 0 || shift > 16 || count > (line_.size() - done) / 4) return false;
      for (size_t i = 0; i < 4 * count; ++i, ++done) line_[done] = line_[done - 4];
      shift += 8;
    }
    return true;
  }

  bool TakeComponent(size_t component) {
    for (size_t place = component; place < line_.size();) {
      if (Left() < 2) return false;
      const bool run = next_[0] > 128;
      const size_t count = run ? next_[0] - 128u : next_[0];
      const size_t bytes = run ? 1 : count;
      if (count == 0 || bytes > Left() - 1 || count > (line_.size() - place + 3) / 4) return false;
      for (size_t i = 0; i < count; ++i, place += 4) line_[place] = next_[run ? 1 : 1 + i];
      next_ += 1 + bytes;
    }
    return true;
  }

  const uint8_t* next_;
  const uint8_t* end_;
  std::vector<uint8_t> line_;
};

struct Light {
  float red, green, blue;
};

// Linear light of sRGB's primaries. Source of the matrix: IEC 61966-2-1.
Light LightOf(const uint8_t* pixel, bool xyz) {
  const float scale = pixel[3] == 0 ? 0 : std::ldexp(1.0F, pixel[3] - kBias);
  const Light c = {scale * pixel[0], scale * pixel[1], scale * pixel[2]};
  if (!xyz) return c;
  return {3.2406F * c.red - 1.5372F * c.green - 0.4986F * c.blue,
          -0.9689F * c.red + 1.8758F * c.green + 0.0415F * c.blue,
          0.0557F * c.red - 0.2040F * c.green + 1.0570F * c.blue};
}

// The place of a pixel in the picture.
uint8_t* PlaceOf(const Header& header, uint32_t line, uint32_t pixel, const FmwBitmap& bitmap) {
  const uint32_t along = header.lines.backwards ? header.lines.length - 1 - line : line;
  const uint32_t within = header.pixels.backwards ? header.pixels.length - 1 - pixel : pixel;
  const bool rows = header.lines.name == 'Y';
  return FmwRow(&bitmap, rows ? along : within) + size_t{3} * (rows ? within : along);
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  FmwOwnedFile whole;
  Header header;
  int32_t error = FmwReadFile(fileName, UINT64_MAX, &whole.file);
  if (error == 0) error = ParseHeader(whole.file, header);
  if (error != 0) return error;
  // a line takes a pixel at least, and a pixel stands for 255 others at most before it costs more
  const uint64_t most = (whole.file.size - header.start) / 4;
  if (header.lines.length > most || header.pixels.length / 256 > most) return FMW_ERROR_READ;
  *bitmap = FmwNewBitmap(header.Width(), header.Height(), 24, request);
  if (bitmap->block == nullptr) return FMW_ERROR_MEMORY;
  FmwLight light;
  FmwInitLight(&light, request->options[kExposure], request->options[kHighlights]);
  ScanLines lines(whole.file, header);
  for (uint32_t i = 0; i < header.lines.length; ++i) {
    const uint8_t* pixel = lines.Next();
    if (pixel == nullptr) return FMW_ERROR_READ;
    for (uint32_t j = 0; j < header.pixels.length; ++j, pixel += 4) {
      const Light c = LightOf(pixel, header.xyz);
      FmwLightPixel(&light, c.red, c.green, c.blue, PlaceOf(header, i, j, *bitmap));
    }
  }
  return 0;
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  FmwOwnedFile start;
  Header header;
  int32_t error = FmwReadFile(fileName, kMostHeader, &start.file);
  if (error == 0) error = ParseHeader(start.file, header);
  if (error != 0) return error;
  info->width = static_cast<int32_t>(header.Width());
  info->height = static_cast<int32_t>(header.Height());
  info->bitsPerPixel = 24;
  snprintf(info->typeName, sizeof info->typeName, "Radiance HDR%s", header.xyz ? ", XYZ" : "");
  return 0;
}

int32_t ReadMetadata(const char*, const FMW_READ_REQUEST*, FMW_METADATA* metadata) {
  metadata->lost = FMW_LOST_DEPTH;
  return 0;
}

// ---- writing ----

void PutPixel(const uint8_t* rgb, const float* light, uint8_t* pixel) {
  const float most = light[std::max({rgb[0], rgb[1], rgb[2]})];
  int exponent = 0;
  (void)std::frexp(most, &exponent);
  float scale = std::ldexp(256.0F, -exponent);
  if (std::lround(most * scale) > 255) scale = std::ldexp(256.0F, -++exponent);
  for (int i = 0; i < 3; ++i) pixel[i] = static_cast<uint8_t>(std::lround(light[rgb[i]] * scale));
  pixel[3] = static_cast<uint8_t>(most > 0 ? exponent + 128 : 0);
}

// Packs one component of a line: runs of at least 4 equal bytes, the others as they are.
void PackComponent(const std::vector<uint8_t>& line, size_t component, std::string& out) {
  const size_t count = line.size() / 4;
  const auto at = [&](size_t i) { return static_cast<char>(line[4 * i + component]); };
  const auto runAt = [&](size_t from) {
    size_t end = from + 1;
    while (end < count && end - from < 127 && at(end) == at(from)) ++end;
    return end - from;
  };
  for (size_t i = 0; i < count;) {
    const size_t run = runAt(i);
    if (run >= 4) {
      out += static_cast<char>(128 + run);
      out += at(i);
      i += run;
      continue;
    }
    size_t end = i + run;
    while (end < count && end - i < 128 && runAt(end) < 4) ++end;
    out += static_cast<char>(end - i);
    for (; i < end; ++i) out += at(i);
  }
}

int32_t Write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST*) {
  float light[256];
  for (int i = 0; i < 256; ++i) light[i] = FmwLightOf(i);
  std::string out = "#?RADIANCE\nFORMAT=32-bit_rle_rgbe\n\n-Y " + std::to_string(given->height) +
                    " +X " + std::to_string(given->width) + "\n";
  std::vector<uint8_t> row(size_t{3} * given->width), line(size_t{4} * given->width);
  const bool packed = given->width >= kLeastPacked && given->width <= kMostPacked;
  for (uint32_t y = 0; y < given->height; ++y) {
    FmwGivenRow(given, y, 0, row.data());
    for (size_t x = 0; x < given->width; ++x) PutPixel(&row[3 * x], light, &line[4 * x]);
    if (!packed) {
      out.append(line.begin(), line.end());
      continue;
    }
    const auto width = static_cast<char16_t>(given->width);
    out.append({2, 2, static_cast<char>(width >> 8), static_cast<char>(width & 255)});
    for (size_t component = 0; component < 4; ++component) PackComponent(line, component, out);
  }
  return FmwWriteFile(fileName, out.data(), out.size());
}

constexpr FmwModule kModule = {
    .name = "Radiance HDR",
    .extensions = "hdr;rgbe;xyze",
    .description = "Radiance HDR",
    .bits = 24,
    .flags = FMW_FORMAT_BITMAP,
    .options = kOptionTable,
    .optionCount = kOptions,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
FMW_MODULE_WRITES(Write)
