#pragma once

#include <wx/button.h>
#include <wx/colour.h>

#include <cstdint>
#include <optional>

namespace fotomill::desktop {

// The window class of the color selector.
inline constexpr const char* kColorSelectBox = "COMMONColourSelectBox";

// Asks for a color, with an initial one; both are 0x00BBGGRR. nullopt if canceled. Custom colors
// are remembered until the program exits.
std::optional<int32_t> SelectColor(wxWindow* parent, int32_t color, const wxString& title);

// A button that shows the color of a setting; a click opens the color selector. Sends a button
// event with its own ID when the color changes.
class ColorButton : public wxButton {
 public:
  ColorButton(wxWindow* parent, wxWindowID id, const wxString& title);

  void SetSetting(int32_t color);  // 0x00BBGGRR
  int32_t Setting() const { return color_; }  // likewise

 private:
  const wxString title_;
  int32_t color_ = 0;
};

}  // namespace fotomill::desktop
