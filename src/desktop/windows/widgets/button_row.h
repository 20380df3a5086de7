#pragma once

#include <wx/frame.h>
#include <wx/sizer.h>

#include <functional>
#include <span>

class wxButton;

namespace fotomill::desktop {

// A button; wxID_CLOSE is set apart.
struct RowButton {
  wxWindowID id;
  const char* label;  // in English
  std::function<void()> run;  // called when pressed
};

// The bottom row of a dialog: Cancel and `answer`,
// which becomes the default, on the right.
wxSizer* BuildAnswerRow(wxWindow& dialog, wxButton& answer);

// The bottom row of a frame, on its panel, with the close
// button set apart on the right. A button also runs when
// the frame's accelerators send its ID, if it is enabled.
wxSizer* BuildButtonRow(wxFrame& frame, wxWindow& panel, std::span<const RowButton> rows);

}  // namespace fotomill::desktop
