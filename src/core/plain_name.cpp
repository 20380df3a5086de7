#include "core/plain_name.h"

#include <algorithm>

#include "platform/paths.h"

namespace fotomill {

bool IsPlainName(std::string_view text) {
  if (text.find("..") != std::string_view::npos) return false;
  return std::ranges::none_of(text, [](char c) {
    const bool drive = c == ':' && platform::kSeparator == '\\';
    return static_cast<unsigned char>(c) < 0x20 || c == 0x7F || c == '/' || c == '\\' || drive;
  });
}

}  // namespace fotomill
