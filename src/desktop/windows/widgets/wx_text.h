#pragma once

#include <wx/string.h>

#include <string>
#include <string_view>

#include "core/shown_text.h"

namespace fotomill::desktop {

// A text of the core as a window shows it; names may hold anything.
inline wxString Shown(std::string_view text) {
  const std::string safe = EscapeControls(text);
  return wxString::FromUTF8(safe.data(), safe.size());
}

// What the user typed, as the core keeps it.
inline std::string Utf8(const wxString& text) {
  const wxScopedCharBuffer bytes = text.utf8_str();
  return std::string(bytes.data(), bytes.length());
}

}  // namespace fotomill::desktop
