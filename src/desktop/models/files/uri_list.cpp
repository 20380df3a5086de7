#include "desktop/models/files/uri_list.h"

#include "core/text.h"

namespace fotomill::desktop {

namespace {

constexpr std::string_view kScheme = "file:";
constexpr std::string_view kDigits = "0123456789ABCDEF";

bool IsPlain(char c) {
  return IsLetter(c) || (c >= '0' && c <= '9') ||
         std::string_view("-._~/").find(c) != std::string_view::npos;
}

// Decodes escapes; empty if one is invalid or a NUL, which paths cannot have.
std::string Unescaped(std::string_view text) {
  std::string result;
  for (size_t i = 0; i < text.size(); ++i) {
    if (text[i] != '%') {
      result += text[i];
      continue;
    }
    const size_t high = i + 2 < text.size() ? kDigits.find(UpperCase(text[i + 1])) : kDigits.npos;
    const size_t low = i + 2 < text.size() ? kDigits.find(UpperCase(text[i + 2])) : kDigits.npos;
    if (high == kDigits.npos || low == kDigits.npos || (high == 0 && low == 0)) return {};
    result += static_cast<char>(high * 16 + low);
    i += 2;
  }
  return result;
}

// The path of a URI; empty if it is not a local file.
std::string PathOfUri(std::string_view uri) {
  if (!EqualIgnoringCase(uri.substr(0, kScheme.size()), kScheme)) return {};
  uri.remove_prefix(kScheme.size());
  if (uri.starts_with("//")) {
    const size_t slash = uri.find('/', 2);
    const std::string_view host = uri.substr(2, slash == uri.npos ? uri.npos : slash - 2);
    if (slash == uri.npos || (!host.empty() && !EqualIgnoringCase(host, "localhost"))) return {};
    uri.remove_prefix(slash);
  }
  return uri.starts_with('/') ? Unescaped(uri) : std::string();
}

}  // namespace

std::string UriOf(std::string_view path) {
  std::string uri = "file://";
  for (const char c : path) {
    if (IsPlain(c)) {
      uri += c;
      continue;
    }
    const auto byte = static_cast<uint8_t>(c);
    uri += {'%', kDigits[byte >> 4], kDigits[byte & 15]};
  }
  return uri;
}

std::string UriList(std::span<const std::string> paths) {
  std::string list;
  for (const std::string& path : paths) list += UriOf(path) + "\r\n";
  return list;
}

std::vector<std::string> PathsOfUriList(std::string_view list) {
  std::vector<std::string> paths;
  while (!list.empty()) {
    const size_t end = list.find_first_of(std::string_view("\r\n\0", 3));
    if (std::string path = PathOfUri(list.substr(0, end)); !path.empty())
      paths.push_back(std::move(path));
    list.remove_prefix(end == list.npos ? list.size() : end + 1);
  }
  return paths;
}

}  // namespace fotomill::desktop
