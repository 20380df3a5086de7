#pragma once

#include <wx/string.h>

#include <string>
#include <string_view>

#include "core/shown_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

// Converts a core text for display; names may contain anything.
inline wxString Shown(std::string_view text) {
  const std::string safe = EscapeControls(text);
  return wxString::FromUTF8(safe.data(), safe.size());
}

// Converts user input for the core.
inline std::string Utf8(const wxString& text) {
  const wxScopedCharBuffer bytes = text.utf8_str();
  return std::string(bytes.data(), bytes.length());
}

// A translated text, as from Tr and
// TrCount; arguments may also be wxStrings.
inline wxString Label(const char* text) { return wxString::FromUTF8(Tr(text)); }
inline TextArgument LabelArgument(const wxString& text) { return Utf8(text); }
template <typename Argument>
TextArgument LabelArgument(const Argument& argument) {
  return argument;
}
template <typename... Arguments>
  requires(sizeof...(Arguments) > 0)
wxString Label(const char* text, const Arguments&... arguments) {
  return wxString::FromUTF8(TrArguments(text, {LabelArgument(arguments)...}));
}
template <typename... Arguments>
wxString LabelCount(const char* one, const char* many, uint64_t count,
                    const Arguments&... arguments) {
  return wxString::FromUTF8(TrCountArguments(one, many, count, {LabelArgument(arguments)...}));
}

}  // namespace fotomill::desktop
