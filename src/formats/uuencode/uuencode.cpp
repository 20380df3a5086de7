#include "formats/uuencode/uuencode.h"

#include <algorithm>
#include <string_view>

#include "core/limits.h"
#include "picture/packed_image.h"

namespace fotomill {

namespace {

constexpr std::string_view kBegin = "begin ", kBase64 = "begin-base64 ", kEnd = "end";
constexpr size_t kBytesPerLine = 45;
constexpr size_t kMostExtra = 2;  // characters after the data of a line
constexpr size_t kFewestDigits = 3, kMostDigits = 4;

// Removes and returns the first line of `text`, without its line ending.
std::string_view TakeLine(std::string_view& text) {
  const size_t end = std::min(text.find('\n'), text.size());
  std::string_view line = text.substr(0, end);
  text.remove_prefix(std::min(end + 1, text.size()));
  if (line.ends_with('\r')) line.remove_suffix(1);
  return line;
}

// Whether a line starts a file; `name` is then its name without folders.
bool ParseBegin(std::string_view line, std::string& name) {
  if (!line.starts_with(kBegin)) return false;
  line.remove_prefix(kBegin.size());
  const size_t digits = std::min(line.find_first_not_of("01234567"), line.size());
  if (digits < kFewestDigits || digits > kMostDigits || line.size() <= digits ||
      line[digits] != ' ')
    return false;
  line.remove_prefix(digits + 1);
  const size_t folder = line.find_last_of("/\\:");
  name = folder == std::string_view::npos ? line : line.substr(folder + 1);
  return true;
}

bool IsCode(char c) { return c >= ' ' && c <= '`'; }
uint32_t ValueOf(char c) { return static_cast<uint32_t>(c - ' ') & 63; }
char CodeOf(uint32_t value) { return value == 0 ? '`' : static_cast<char>(' ' + value); }

constexpr size_t CharactersFor(size_t bytes) { return (bytes + 2) / 3 * 4; }

// Classification of a line.
enum class LineKind { Data, Cut, Stray };
LineKind KindOf(std::string_view line) {
  if (line.empty() || !std::ranges::all_of(line, IsCode)) return LineKind::Stray;
  const size_t needed = CharactersFor(ValueOf(line[0]));
  if (line.size() < 1 + needed) return LineKind::Cut;
  return line.size() <= 1 + needed + kMostExtra ? LineKind::Data : LineKind::Stray;
}

// Appends the bytes of a line; missing characters count as 0.
void DecodeLine(std::string_view line, std::vector<uint8_t>& bytes) {
  const size_t count = ValueOf(line[0]), end = bytes.size() + count;
  const auto value = [&](size_t i) { return i < line.size() ? ValueOf(line[i]) : 0; };
  for (size_t i = 1; i < 1 + CharactersFor(count); i += 4) {
    const uint32_t three = value(i) << 18 | value(i + 1) << 12 | value(i + 2) << 6 | value(i + 3);
    for (const int shift : {16, 8, 0}) bytes.push_back(static_cast<uint8_t>(three >> shift));
  }
  bytes.resize(end);
}

}  // namespace

Status DecodeUuencoded(std::span<const uint8_t> text, bool relaxed, UuencodedFile& file) {
  std::string_view rest(reinterpret_cast<const char*>(text.data()), text.size());
  const size_t size = rest.size();
  for (bool begun = false; !begun;) {
    if (rest.empty() || size - rest.size() > limits.garbageBytes) return Status::DamagedFile;
    const std::string_view line = TakeLine(rest);
    if (line.starts_with(kBase64)) return Status::UnsupportedFormat;
    begun = ParseBegin(line, file.name);
  }
  while (!rest.empty()) {
    const std::string_view line = TakeLine(rest);
    const LineKind kind = KindOf(line);
    if (line == kEnd) return Status::Ok;
    if (kind == LineKind::Data || (kind == LineKind::Cut && relaxed)) {
      if (ValueOf(line[0]) == 0 && line.size() <= 1 + kMostExtra) return Status::Ok;
      // Padded lines decode to more than their length; the buffer is copied when it grows.
      RETURN_IF_BAD(CheckFileMemory(3 * uint64_t{file.bytes.size()}));
      DecodeLine(line, file.bytes);
    } else if (!relaxed) {
      return kind == LineKind::Cut && rest.empty() ? Status::FileReadError : Status::DamagedFile;
    }
  }
  return relaxed ? Status::Ok : Status::FileReadError;
}

void EncodeUuencoded(std::span<const uint8_t> bytes, std::string_view name, ByteWriter& out) {
  std::string plain(name);
  for (char& c : plain) {
    const auto byte = static_cast<uint8_t>(c);
    if (byte < 0x20 || byte == 0x7f || c == '/' || c == '\\' || c == ':') c = '_';
  }
  out.Text("begin 644 ");
  out.Text(plain);
  out.Text("\n");
  while (!bytes.empty()) {
    const auto line = bytes.first(std::min(bytes.size(), kBytesPerLine));
    const auto byte = [&](size_t i) { return i < line.size() ? uint32_t{line[i]} : 0; };
    std::string code(1, CodeOf(static_cast<uint32_t>(line.size())));
    for (size_t i = 0; i < line.size(); i += 3) {
      const uint32_t three = byte(i) << 16 | byte(i + 1) << 8 | byte(i + 2);
      for (const int shift : {18, 12, 6, 0}) code += CodeOf(three >> shift & 63);
    }
    code += '\n';
    out.Text(code);
    bytes = bytes.subspan(line.size());
  }
  out.Text("`\nend\n");
}

}  // namespace fotomill
