#pragma once

#include <wx/button.h>
#include <wx/colour.h>

#include <cstdint>
#include <optional>

namespace fotomill::desktop {

// The window class of the color selector.
inline constexpr const char* kColorSelectBox = "COMMONColourSelectBox";

// Asks for a color, beginning with one; both are 0x00BBGGRR. Nothing when the user cancels. Colors
// that were put aside stay until the program ends.
std::optional<int32_t> SelectColor(wxWindow* parent, int32_t color, const wxString& title);

// A button that shows the color of a setting; a click opens the color selector. Tells a change as a
// button event of its own id.
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
