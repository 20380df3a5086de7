#pragma once

#include <wx/frame.h>
#include <wx/sizer.h>

#include <functional>
#include <span>

class wxButton;

namespace fotomill::desktop {

// A button of the row; wxID_CLOSE is the one apart.
struct RowButton {
  wxWindowID id;
  const char* label;  // in English
  std::function<void()> run;  // when the button is pressed
};

// The buttons at the foot of a dialog, at the right: `answer`, which becomes its default, behind
// Cancel.
wxSizer* BuildAnswerRow(wxWindow& dialog, wxButton& answer);

// The buttons at the foot of a frame, on its panel, the one that closes it apart at the right. A
// button runs when it is pressed and when the frame's accelerators send its number, as long as it
// is enabled.
wxSizer* BuildButtonRow(wxFrame& frame, wxWindow& panel, std::span<const RowButton> rows);

}  // namespace fotomill::desktop
