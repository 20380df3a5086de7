#include "processing/palette/color_table.h"

#include <algorithm>
#include <charconv>
#include <optional>

namespace fotomill {

namespace {

constexpr size_t kActBytes = 768, kActTrailer = 4;
constexpr int32_t kMostColors = 256;
constexpr std::string_view kGimp = "GIMP Palette", kJasc = "JASC-PAL", kJascVersion = "0100";

// Removes and returns the first line of a text, without its line ending and surrounding blanks.
std::string_view TakeLine(std::string_view& text) {
  const size_t end = text.find('\n');
  std::string_view line = text.substr(0, end);
  text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
  constexpr std::string_view kBlanks = " \t\r";
  line.remove_prefix(std::min(line.find_first_not_of(kBlanks), line.size()));
  return line.substr(0, line.find_last_not_of(kBlanks) + 1);
}

// Parses and removes an integer from 0 to `most` at the start of a line, and the blanks after it.
std::optional<int32_t> TakeNumber(std::string_view& line, int32_t most) {
  int32_t number = 0;
  const auto [end, error] = std::from_chars(line.data(), line.data() + line.size(), number);
  if (error != std::errc() || number < 0 || number > most) return std::nullopt;
  line.remove_prefix(static_cast<size_t>(end - line.data()));
  if (!line.empty() && line[0] != ' ' && line[0] != '\t') return std::nullopt;
  line.remove_prefix(std::min(line.find_first_not_of(" \t"), line.size()));
  return number;
}

// The colors read so far.
struct Table {
  Palette palette{};
  int32_t count = 0;

  // Reads the three numbers at the start of a line. False if they are missing or the table is full.
  bool Add(std::string_view& line) {
    if (count == kMostColors) return false;
    for (size_t c = 0; c < 3; ++c) {
      const auto value = TakeNumber(line, 255);
      if (!value) return false;
      palette[3 * static_cast<size_t>(count) + c] = static_cast<uint8_t>(*value);
    }
    ++count;
    return true;
  }
};

bool ReadAct(std::string_view bytes, Table& table) {
  const auto byte = [&](size_t i) { return static_cast<uint8_t>(bytes[i]); };
  for (size_t i = 0; i < kActBytes; ++i) table.palette[i] = byte(i);
  table.count = kMostColors;
  if (bytes.size() == kActBytes) return true;
  const int32_t stored = byte(kActBytes) << 8 | byte(kActBytes + 1);
  if (stored > kMostColors) return false;
  if (stored > 0) table.count = stored;
  return true;
}

// Lines of colors; with `named`, numbers may be followed by anything.
bool ReadLines(std::string_view text, bool named, Table& table) {
  while (!text.empty()) {
    std::string_view line = TakeLine(text);
    if (line.empty() || line[0] == '#') continue;
    if (!table.Add(line)) return false;
    if (!named && !line.empty() && line[0] != '#') return false;
  }
  return true;
}

bool ReadGimp(std::string_view text, Table& table) {
  (void)TakeLine(text);
  while (!text.empty()) {  // headers
    std::string_view rest = text;
    const std::string_view line = TakeLine(rest);
    const bool header = line.starts_with("Name:") || line.starts_with("Columns:") ||
                        line.starts_with('#') || line.empty();
    if (!header) break;
    text = rest;
  }
  return ReadLines(text, true, table);
}

bool ReadJasc(std::string_view text, Table& table) {
  (void)TakeLine(text);
  if (TakeLine(text) != kJascVersion) return false;
  std::string_view counted = TakeLine(text);
  const auto count = TakeNumber(counted, kMostColors);
  return count && counted.empty() && ReadLines(text, false, table) && table.count == *count;
}

}  // namespace

Status ReadColorTable(std::string_view contents, Palette& palette, int32_t& count) {
  if (contents.size() > kMostColorTableBytes) return Status::DamagedFile;
  Table table;
  std::string_view rest = contents;
  const std::string_view first = TakeLine(rest);
  const bool act = contents.size() == kActBytes || contents.size() == kActBytes + kActTrailer;
  bool read = first == kGimp   ? ReadGimp(contents, table)
              : first == kJasc ? ReadJasc(contents, table)
                               : false;
  if (first != kGimp && first != kJasc) {
    read = ReadLines(contents, false, table);
    if (!read && act) {  // valid text of that length is text
      table = {};
      read = ReadAct(contents, table);
    }
  }
  if (!read || table.count == 0) return Status::DamagedFile;
  std::fill(table.palette.begin() + 3 * table.count, table.palette.end(), uint8_t{0});
  palette = table.palette;
  count = table.count;
  return Status::Ok;
}

}  // namespace fotomill
