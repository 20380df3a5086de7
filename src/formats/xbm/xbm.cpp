// X bitmap (XBM): a black and white picture as C source.
//
//   #define NAME_width 16
//   #define NAME_height 2
//   static char NAME_text_bits[] = {
//   0x01, 0x80, 0xff, 0x7f}
//
// A value holds eight pixels of a row, the leftmost in its lowest bit; a set bit is black.
//
// Reads the sizes from lines that contain "#define" and "width" or "height" anywhere; when a line
// has both, because the picture is named after one of them, the later word counts. The values begin
// behind the first line that contains "bits" but no "#define"; each is the two characters behind
// the next lower-case x, of which any that is no digit counts as 0. Lines are taken in pieces of at
// most 260 characters.
//
// Where the width is no multiple of 8, the picture is at the end of each row of values in place
// of its beginning: reading drops the row's first pixels and shows its padding, writing puts black
// padding in front. What this program wrote it reads back as it was; pictures of other programs
// appear moved to the left.
//
// Writes twelve values a line, without a semicolon behind the brace.
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
constexpr size_t kValueBytes = 3;  // the least a value takes: x and two digits

struct XbmSize {
  int64_t width = 0;  // as the file claims until CheckSize
  int64_t height = 0;
};

// The value of a hexadecimal digit, 0 for any other character.
constexpr std::array<uint8_t, 256> MakeDigitValues() {
  std::array<uint8_t, 256> values{};
  for (uint8_t i = 0; i < 10; ++i) values['0' + i] = i;
  for (uint8_t i = 0; i < 6; ++i) values['a' + i] = values['A' + i] = static_cast<uint8_t>(10 + i);
  return values;
}
constexpr std::array<uint8_t, 256> kDigitValues = MakeDigitValues();

// Reads a text front to back. A scan for something that is not there ends at the limit for texts.
class XbmText {
 public:
  explicit XbmText(std::span<const uint8_t> bytes)
      : next_(reinterpret_cast<const char*>(bytes.data())),
        end_(next_ + bytes.size()),
        start_(next_) {}

  // The next line with its line end, or the next piece of a long one. False at the end.
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

  // The next value. False when the text ends first.
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

// The number behind the word that starts at `position`: past the next blank or tab and all that
// follow it.
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
    // 0: not there
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

// Reads one row of `width` pixels and clears its padding. False when the text ends first.
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

// The values of a row of `width` pixels, `values` as long as they are many. Padding bits of `row`
// may hold anything.
void EncodeRow(std::span<const uint8_t> row, size_t width, std::span<uint8_t> values) {
  const size_t padding = 8 * values.size() - width;  // pixels in front
  unsigned previous = 0;
  for (size_t i = 0; i < values.size(); ++i) {
    const unsigned pixels = row[i];
    values[i] = kMirrored[static_cast<uint8_t>(~(previous << (8 - padding) | pixels >> padding))];
    previous = pixels;
  }
}

// A C identifier of a file's name: what C does not allow in one becomes "_".
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

// Writes values one after the other. A comma comes between two, and every twelfth ends its line.
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

// Parses the sizes and fills the record's facts.
Status DescribePicture(const platform::FileView& file, const ReadRequest&, XbmSize& size,
                       PictureRecord& picture) {
  size = ParseSize(file.Bytes());
  RETURN_IF_BAD(CheckSize(size));
  SetPlainFacts(picture, static_cast<int32_t>(size.width), static_cast<int32_t>(size.height), 1);
  MakeDefaultPalette(&picture.palette, nullptr, kBlackAndWhitePalette);
  // rows of other lengths mean another thing elsewhere
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
