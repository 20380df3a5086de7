// X bitmap (XBM): a black and white picture as C source.
//
//   #define NAME_width 16
//   #define NAME_height 2
//   static char NAME_text_bits[] = {
//   0x01, 0x80, 0xff, 0x7f}
//
// A value has eight pixels of a row, the leftmost in its lowest bit; a set bit is black.
//
// The sizes are read from lines that contain "#define" and "width" or "height" anywhere; if a line
// has both, because the picture's name contains one of them, the later word applies. The values
// start after the first line that contains "bits" but no "#define"; each is the two characters
// after the next lowercase x, where characters other than hex digits count as 0. Lines are read in
// pieces of at most 260 characters.
//
// If the width is not a multiple of 8, the picture is expected at the end of each row of values
// instead of at its start: reading drops the row's first pixels and shows its padding, writing puts
// black padding first. Files written by this program round-trip; pictures of other programs are
// shifted to the left.
//
// Writes twelve values per line, without a semicolon after the brace.
//
// Source: X Consortium, "Xlib - C Language X Interface", XReadBitmapFile (1988).
#include "formats/xbm/xbm.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <string>
#include <string_view>

#include "core/byte_writer.h"
#include "core/limits.h"
#include "core/text.h"
#include "formats/plain_codec.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr size_t kLineCharacters = 260;
constexpr size_t kValuesPerLine = 12;
constexpr size_t kValueBytes = 3;  // minimum text per value: x and two digits

struct XbmSize {
  int64_t width = 0;  // unchecked until CheckSize
  int64_t height = 0;
};

// The value of a hex digit, 0 for any other character.
constexpr std::array<uint8_t, 256> MakeDigitValues() {
  std::array<uint8_t, 256> values{};
  for (uint8_t i = 0; i < 10; ++i) values['0' + i] = i;
  for (uint8_t i = 0; i < 6; ++i) values['a' + i] = values['A' + i] = static_cast<uint8_t>(10 + i);
  return values;
}
constexpr std::array<uint8_t, 256> kDigitValues = MakeDigitValues();

// Reads a text sequentially. Searches stop at the limit for texts.
class XbmText {
 public:
  explicit XbmText(std::span<const uint8_t> bytes)
      : next_(reinterpret_cast<const char*>(bytes.data())),
        end_(next_ + bytes.size()),
        start_(next_) {}

  // The next line including its line ending, or the next piece of a long one. False at the end.
  bool Line(std::string_view& line) {
    const uint64_t scanned = static_cast<uint64_t>(next_ - start_);
    if (next_ == end_ || scanned >= limits.textScanBytes) return false;
    const size_t most = std::min(kLineCharacters, static_cast<size_t>(end_ - next_));
    const void* lineEnd = std::memchr(next_, '\n', most);
    const size_t size = lineEnd == nullptr
                            ? most
                            : static_cast<size_t>(static_cast<const char*>(lineEnd) + 1 - next_);
    line = {next_, size};
    next_ += size;
    return true;
  }

  // The next value. False if the text ends first.
  bool Value(uint8_t& value) {
    const char* const scanEnd =
        next_ + std::min(static_cast<uint64_t>(end_ - next_), limits.textScanBytes);
    while (next_ != scanEnd && *next_ != 'x') ++next_;
    if (end_ - next_ < 3 || next_ == scanEnd) return false;
    value = static_cast<uint8_t>(kDigitValues[static_cast<uint8_t>(next_[1])] << 4 |
                                 kDigitValues[static_cast<uint8_t>(next_[2])]);
    next_ += 3;
    return true;
  }

  uint64_t Position() const { return static_cast<uint64_t>(next_ - start_); }
  uint64_t Left() const { return static_cast<uint64_t>(end_ - next_); }

 private:
  const char* next_;
  const char* end_;
  const char* start_;
};

bool Contains(std::string_view text, std::string_view word) {
  return text.find(word) != std::string_view::npos;
}

// The number after the word at `position`: skips to the next blank or tab and past all
// that follow it.
int64_t NumberBehind(std::string_view line, size_t position) {
  constexpr std::string_view kBlanks = " \t";
  const size_t wordEnd = std::min(line.find_first_of(kBlanks, position), line.size());
  const size_t number = std::min(line.find_first_not_of(kBlanks, wordEnd), line.size());
  return LeadingInteger(line.substr(number));
}

XbmSize ParseSize(std::span<const uint8_t> bytes) {
  XbmSize size;
  XbmText text(bytes);
  std::string_view line;
  while ((size.width == 0 || size.height == 0) && text.Line(line)) {
    if (!Contains(line, "#define")) continue;
    // 0: not found
    const size_t lastWidth = line.rfind("width") + 1, lastHeight = line.rfind("height") + 1;
    if (lastWidth > lastHeight) size.width = NumberBehind(line, line.find("width"));
    if (lastHeight > lastWidth) size.height = NumberBehind(line, line.find("height"));
  }
  return size;
}

Status CheckSize(const XbmSize& size) {
  const bool fits =
      size.width > 0 && size.width <= INT32_MAX && size.height > 0 && size.height <= INT32_MAX;
  return fits ? Status::Ok : Status::DamagedFile;
}

bool SkipToValues(XbmText& text) {
  std::string_view line;
  while (text.Line(line)) {
    if (Contains(line, "bits") && !Contains(line, "#define")) return true;
  }
  return false;
}

constexpr std::array<uint8_t, 256> MakeMirrorTable() {
  std::array<uint8_t, 256> table{};
  for (unsigned i = 0; i < 256; ++i) {
    for (unsigned bit = 0; bit < 8; ++bit)
      table[i] |= static_cast<uint8_t>((i >> bit & 1) << (7 - bit));
  }
  return table;
}
constexpr std::array<uint8_t, 256> kMirrored = MakeMirrorTable();

// Reads one row of `width` pixels and clears its padding. False if the text ends first.
bool DecodeRow(XbmText& text, size_t width, std::span<uint8_t> row) {
  const size_t count = (width + 7) / 8;
  const size_t dropped = 8 * count - width;  // pixels
  unsigned previous = 0;
  for (size_t i = 0; i < count; ++i) {
    uint8_t value;
    if (!text.Value(value)) return false;
    const unsigned pixels = kMirrored[static_cast<uint8_t>(~value)];
    if (i > 0) row[i - 1] = static_cast<uint8_t>(previous << dropped | pixels >> (8 - dropped));
    previous = pixels;
  }
  row[count - 1] = static_cast<uint8_t>(previous << dropped);
  std::fill(row.begin() + static_cast<std::ptrdiff_t>(count), row.end(), uint8_t{0});
  return true;
}

// The values of a row of `width` pixels; `values` has the size of the result. Padding bits of `row`
// are undefined.
void EncodeRow(std::span<const uint8_t> row, size_t width, std::span<uint8_t> values) {
  const size_t padding = 8 * values.size() - width;  // pixels before the row
  unsigned previous = 0;
  for (size_t i = 0; i < values.size(); ++i) {
    const unsigned pixels = row[i];
    values[i] = kMirrored[static_cast<uint8_t>(~(previous << (8 - padding) | pixels >> padding))];
    previous = pixels;
  }
}

// Converts a file's name to a C identifier: characters not allowed in C become "_".
std::string IdentifierOf(std::string_view path) {
  std::string name = LowerCase(platform::SplitPath(path).base);
  for (char& c : name) {
    if (!IsLetter(c) && (c < '0' || c > '9')) c = '_';
  }
  return name;
}

void WriteLine(ByteWriter& out, std::string_view text) {
  out.Text(text);
  out.Text(platform::kLineEnd);
}

// Writes values separated by commas, twelve per line.
class XbmValueWriter {
 public:
  XbmValueWriter(ByteWriter& out, uint64_t total) : out_(out), left_(total) {}

  void Write(std::span<const uint8_t> values) {
    while (!values.empty()) {
      const size_t count = std::min(values.size(), kValuesPerLine - inLine_);
      WriteInLine(values.first(count));
      values = values.subspan(count);
    }
  }

 private:
  static constexpr size_t kTextBytes = 6;  // "0x1f, "

  void WriteInLine(std::span<const uint8_t> values) {
    constexpr char kDigits[] = "0123456789abcdef";
    uint8_t* place = out_.Reserve(values.size() * kTextBytes);
    for (const uint8_t value : values) {
      const char text[kTextBytes] = {'0', 'x', kDigits[value >> 4], kDigits[value & 15], ',', ' '};
      std::memcpy(place, text, kTextBytes);
      place += kTextBytes;
    }
    left_ -= values.size();
    out_.Used(values.size() * kTextBytes - (left_ == 0 ? 2 : 0));
    inLine_ += values.size();
    if (inLine_ == kValuesPerLine) {
      out_.Text(platform::kLineEnd);
      inLine_ = 0;
    }
  }

  ByteWriter& out_;
  uint64_t left_;
  size_t inLine_ = 0;
};

// Parses the sizes and fills in the record.
Status DescribePicture(const platform::FileView& file, const ReadRequest&, XbmSize& size,
                       PictureRecord& picture) {
  size = ParseSize(file.Bytes());
  RETURN_IF_BAD(CheckSize(size));
  SetPlainFacts(picture, static_cast<int32_t>(size.width), static_cast<int32_t>(size.height), 1);
  MakeDefaultPalette(&picture.palette, nullptr, kBlackAndWhitePalette);
  // other programs read rows of other widths differently
  picture.simplified = picture.width % 8 != 0 || picture.height % 8 != 0;
  return Status::Ok;
}

Status Decode(platform::FileView& file, const XbmSize&, const PictureRecord& picture,
              PackedImage& image) {
  XbmText text(file.Bytes());
  if (!SkipToValues(text) || text.Left() / kValueBytes < picture.imageBytes)
    return Status::DamagedFile;
  RETURN_IF_BAD(NewPackedImage(picture.width, picture.height, &picture.palette, 1, image,
                               platform::Fill::Unset));
  for (int32_t y = 0; y < picture.height; ++y) {
    if (!DecodeRow(text, static_cast<size_t>(picture.width), image.Row(y)))
      return Status::DamagedFile;
    file.DropBefore(text.Position());
    RETURN_IF_BAD(picture.ReportRow(y));
  }
  return file.Intact() ? Status::Ok : Status::DamagedFile;
}

PlainCodec<XbmSize> Codec() { return {limits.textScanBytes, DescribePicture, Decode}; }

}  // namespace

Status XbmInfo(PictureRecord& picture, const ReadRequest& request) {
  if (request.signedOnly) return Status::UnsupportedFormat;
  return PlainInfo(Codec(), picture, request);
}

Status XbmRead(PictureRecord& picture, const ReadRequest& request) {
  return PlainRead(Codec(), picture, request);
}

Status XbmWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  const PackedImage& image = picture.image;
  if (image.Empty()) return Status::MemoryAllocationError;
  if (image.Bits() != 1) return Status::TooManyColors;
  const size_t rowValues = (static_cast<size_t>(image.Width()) + 7) / 8;
  platform::MemoryBlock values;
  if (!values.Allocate(rowValues, platform::Fill::Unset)) return Status::MemoryAllocationError;
  ByteWriter out;
  if (!out.Create(picture.fileName.c_str())) return Status::ErrorCreatingFile;

  const std::string name = IdentifierOf(picture.fileName);
  WriteLine(out, "#define " + name + "_width " + std::to_string(image.Width()));
  WriteLine(out, "#define " + name + "_height " + std::to_string(image.Height()));
  WriteLine(out, "static char " + name + "_text_bits[] = {");
  XbmValueWriter writer(out, uint64_t{rowValues} * static_cast<uint64_t>(image.Height()));
  for (int32_t y = 0; y < image.Height() && !out.Failed(); ++y) {
    RETURN_IF_BAD(picture.ReportRow(y));
    EncodeRow(image.Row(y), static_cast<size_t>(image.Width()), values.Bytes());
    writer.Write(values.Bytes());
  }
  WriteLine(out, "}");
  return CommitOutput(out, options);
}

}  // namespace fotomill
