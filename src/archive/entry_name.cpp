#include "archive/entry_name.h"

#include <algorithm>
#include <vector>

#include "archive/archive_limits.h"
#include "core/text.h"
#include "core/utf8.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr size_t kLongestPart = 255;  // limit of file systems, in bytes

// The upper half of code page 437, from 0x80 (Unicode, mapping table CP437.TXT).
constexpr std::u32string_view kCodePage437 =
    U"ÇüéâäàåçêëèïîìÄÅÉæÆôöòûùÿÖÜ¢£¥₧ƒáíóúñÑªº¿⌐¬½¼¡«»░▒▓│┤╡╢╖╕╣║╗╝╜╛┐└┴┬├─┼╞╟╚╔╩╦╠═╬╧╨╤╥╙╘╒╓╫╪┘┌█▄"
    U"▌▐▀"
    U"αßΓπΣσµτΦΘΩδ∞φε∩≡±≥≤⌠⌡÷≈°∙·√ⁿ²■\u00a0";
static_assert(kCodePage437.size() == 128);

// All characters are in the basic multilingual plane.
void AppendUtf8(std::string& text, char32_t c) {
  if (c < 0x800) {
    text += static_cast<char>(0xC0 | c >> 6);
  } else {
    text += static_cast<char>(0xE0 | c >> 12);
    text += static_cast<char>(0x80 | (c >> 6 & 0x3F));
  }
  text += static_cast<char>(0x80 | (c & 0x3F));
}

std::vector<std::string_view> PartsOf(std::string_view path, std::string_view separators) {
  std::vector<std::string_view> parts;
  for (;;) {
    const size_t end = path.find_first_of(separators);
    parts.push_back(path.substr(0, end));
    if (end == std::string_view::npos) return parts;
    path.remove_prefix(end + 1);
  }
}

bool IsSafePart(std::string_view part) {
  return !part.empty() && part != "." && part != ".." && part.size() <= kLongestPart &&
         std::ranges::none_of(part, [](char c) {
           return static_cast<unsigned char>(c) < 0x20 || c == 0x7F || c == '\\';
         });
}

}  // namespace

std::string ReadableEntryName(std::string_view bytes) {
  std::string name;
  if (IsUtf8(bytes)) {
    name = bytes;
  } else {
    for (const char c : bytes) {
      const auto byte = static_cast<unsigned char>(c);
      byte < 0x80 ? name += c : (AppendUtf8(name, kCodePage437[byte - 0x80u]), name);
    }
  }
  while (name.starts_with("./") && name.size() > 2) name.erase(0, 2);
  while (name.size() > 1 && name.ends_with('/')) name.pop_back();
  return name;
}

bool IsSafeEntryName(std::string_view name) {
  const bool drive = name.size() >= 2 && IsLetter(name[0]) && name[1] == ':';
  return !drive && name.size() <= kLongestEntryName &&
         std::ranges::all_of(PartsOf(name, "/"), IsSafePart);
}

std::string StoredEntryName(std::string_view path) {
  path.remove_prefix(platform::SplitPath(path).drive.size());
  std::string name;
  for (const std::string_view part : PartsOf(path, platform::kSeparator == '/' ? "/" : "/\\")) {
    if (part.empty() || part == ".") continue;
    if (part == "..") {
      name.clear();
    } else {
      name.append(name.empty() ? "" : "/").append(part);
    }
  }
  return name;
}

}  // namespace fotomill
