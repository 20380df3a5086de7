#include "formats/text/text_lines.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "core/utf8.h"

namespace fotomill {

namespace {

constexpr size_t kTab = 8;
constexpr char32_t kUnknown = 0xfffd;
constexpr std::string_view kUtf8Mark = "\xef\xbb\xbf";

// Windows-1252 from 0x80 to 0x9F, where Latin-1 has control characters. Source: Unicode Consortium,
// mapping table CP1252.
constexpr char32_t kWindows[] = {0x20ac, 0xfffd, 0x201a, 0x0192, 0x201e, 0x2026, 0x2020, 0x2021,
                                 0x02c6, 0x2030, 0x0160, 0x2039, 0x0152, 0xfffd, 0x017d, 0xfffd,
                                 0xfffd, 0x2018, 0x2019, 0x201c, 0x201d, 0x2022, 0x2013, 0x2014,
                                 0x02dc, 0x2122, 0x0161, 0x203a, 0x0153, 0xfffd, 0x017e, 0x0178};

// Assembles characters into lines.
class LineBuilder {
 public:
  explicit LineBuilder(TextLines& text) : text_(text) {}
  // False when no more characters will be shown.
  bool Add(char32_t c) {
    const bool afterReturn = std::exchange(return_, c == '\r');
    if (c == '\n' && afterReturn) return true;
    if (c == '\n' || c == '\r' || c == '\f') return EndLine();
    if (c == '\t') {
      line_.resize(std::min((line_.size() / kTab + 1) * kTab, kMostTextColumns), ' ');
      return true;
    }
    if (TakesNoRoom(c)) return true;
    if (line_.size() == kMostTextColumns && !EndLine()) return false;
    line_.push_back(c);
    return true;
  }
  void End() {
    if (!line_.empty()) EndLine();
  }

 private:
  bool EndLine() {
    if (text_.lines.size() == kMostTextLines) {
      text_.cutShort = true;
      return false;
    }
    text_.columns = std::max(text_.columns, line_.size());
    text_.lines.push_back(std::move(line_));
    line_.clear();
    return true;
  }

  TextLines& text_;
  std::u32string line_;
  bool return_ = false;  // the last character was one
};

void ReadUtf16(std::span<const uint8_t> bytes, bool big, LineBuilder& lines) {
  const auto unit = [&](size_t i) {
    return static_cast<char32_t>(big ? bytes[i] << 8 | bytes[i + 1] : bytes[i + 1] << 8 | bytes[i]);
  };
  for (size_t i = 2; i + 1 < bytes.size(); i += 2) {
    char32_t c = unit(i);
    if (c >= 0xd800 && c < 0xe000) {
      const bool pair = c < 0xdc00 && i + 3 < bytes.size() && (unit(i + 2) & 0xfc00) == 0xdc00;
      c = pair ? 0x10000 + ((c & 0x3ff) << 10 | (unit(i + 2) & 0x3ff)) : kUnknown;
      i += pair ? 2 : 0;
    }
    if (!lines.Add(c)) return;
  }
  lines.End();
}

}  // namespace

char32_t WindowsCharacter(uint8_t byte) {
  return byte >= 0x80 && byte < 0xa0 ? kWindows[byte - 0x80] : byte;
}

bool TakesNoRoom(char32_t c) {
  return c < 0x20 || (c >= 0x7f && c < 0xa0) || (c >= 0x300 && c < 0x370) ||
         (c >= 0x200b && c < 0x2010) || (c >= 0xfe00 && c < 0xfe10) || c == 0xfeff;
}

bool ReadTextLines(std::span<const uint8_t> file, bool whole, TextLines& text) {
  text.cutShort = !whole;
  LineBuilder lines(text);
  const bool little = file.size() >= 2 && file[0] == 0xff && file[1] == 0xfe,
             big = file.size() >= 2 && file[0] == 0xfe && file[1] == 0xff;
  if (little || big) {
    text.coding = TextCoding::Utf16;
    ReadUtf16(file, big, lines);
    return true;
  }
  std::string_view rest(reinterpret_cast<const char*>(file.data()), file.size());
  if (rest.find('\0') != std::string_view::npos) return false;
  if (rest.starts_with(kUtf8Mark)) rest.remove_prefix(kUtf8Mark.size());
  // If only the head of a file was read, it may end within a character of up to four bytes.
  bool utf8 = IsUtf8(rest);
  for (size_t cut = 1; !utf8 && !whole && cut < std::min<size_t>(4, rest.size()); ++cut)
    utf8 = IsUtf8(rest.substr(0, rest.size() - cut));
  text.coding = utf8 ? TextCoding::Utf8 : TextCoding::Windows1252;
  while (!rest.empty()) {
    char32_t c;
    if (utf8) {
      c = NextCharacter(rest, kUnknown);
    } else {
      c = WindowsCharacter(static_cast<uint8_t>(rest.front()));
      rest.remove_prefix(1);
    }
    if (!lines.Add(c)) return true;
  }
  lines.End();
  return true;
}

}  // namespace fotomill
