#pragma once

#include <wx/accel.h>
#include <wx/frame.h>

#include <initializer_list>
#include <span>

#include "desktop/windows/widgets/button_row.h"

class wxDataViewListCtrl;
class wxStaticText;

namespace fotomill::desktop {

// Base of windows over the main window: contents above a row of buttons.
class ToolFrame : public wxFrame {
 protected:
  ToolFrame(wxWindow* parent, const wxString& title, const wxString& name);

  // Lays out the window: `note`, if any, above the contents, below them the buttons. The windows
  // are children of Panel. Escape and Ctrl+W close the window in addition to `keys`. `size` is
  // device-independent.
  void LayOut(wxStaticText* note, wxSizer& contents, std::span<const RowButton> buttons,
              std::initializer_list<wxAcceleratorEntry> keys, const wxSize& size);
  wxWindow* Panel() const { return panel_; }

 private:
  wxWindow* panel_;
};

// A column of texts; its width is in device-independent pixels and grows with the font.
struct TextColumn {
  wxString title;
  int width;
};
// A list of rows of texts, one of which can be selected. `name` is for screen readers.
wxDataViewListCtrl* NewTextList(wxWindow* parent, const wxString& name,
                                std::initializer_list<TextColumn> columns);

}  // namespace fotomill::desktop
