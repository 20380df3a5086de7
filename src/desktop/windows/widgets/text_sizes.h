#pragma once

#include <wx/font.h>

class wxWindow;

namespace fotomill {
struct EarlySettings;
}

namespace fotomill::desktop {

// Texts whose size is a setting.
enum class TextSize {
  Normal,         // NormalTextFontSize: lists and reports
  Small,          // SmallTextFontSize: notes
  ThumbnailName,  // NormalThumbFontSize: names below thumbnails
  LargeThumbnailName,  // LargeThumbFontSize: names below large ones
};

// Sets the sizes, once at startup. The default value of a key means the system's size, other values
// are relative to that.
void SetTextSizes(const EarlySettings& sizes);
// The window's font in this size.
wxFont FontOf(const wxWindow& window, TextSize size);

}  // namespace fotomill::desktop
