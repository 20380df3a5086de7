#pragma once

#include <functional>
#include <string>

#include "desktop/windows/widgets/wx_text.h"

class wxTextCtrl;

namespace fotomill::desktop {

// A field over a part of a window, to edit a text where it is shown. Enter and another focus accept
// the text, Escape does not.
class InPlaceEditor {
 public:
  // Called with a text that was changed and accepted, once the field is gone.
  using Changed = std::function<void(const std::string& text)>;

  // `window` must outlive the editor.
  explicit InPlaceEditor(wxWindow& window) : window_(window) {}

  // Shows the field, named `name` for screen readers, with the first `selected` bytes of the text
  // selected.
  void Begin(const wxRect& place, const wxString& name, const std::string& text, size_t selected,
             Changed changed);
  bool Open() const { return field_ != nullptr; }
  // Moves the field, if there is one, with the text typed so far.
  void MoveTo(const wxRect& place);
  // Removes the field, if there is one.
  void Finish(bool accept);

 private:
  wxWindow& window_;
  wxTextCtrl* field_ = nullptr;
  Changed changed_;
};

}  // namespace fotomill::desktop
