#pragma once

#include <wx/font.h>

class wxWindow;

namespace fotomill {
struct EarlySettings;
}

namespace fotomill::desktop {

// Texts whose size a key sets.
enum class TextSize {
  Normal,         // NormalTextFontSize: lists and reports
  Small,          // SmallTextFontSize: notes
  ThumbnailName,  // NormalThumbFontSize: names below thumbnails
};

// Takes the sizes over, once at startup. A key at its default stands for the system's size, other
// values for proportionally larger or smaller texts.
void SetTextSizes(const EarlySettings& sizes);
// The window's font in such a size.
wxFont FontOf(const wxWindow& window, TextSize size);

}  // namespace fotomill::desktop
