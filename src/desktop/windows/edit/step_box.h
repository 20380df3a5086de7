#pragma once

#include <wx/checklst.h>

#include <functional>

#include "desktop/models/edit/step_list.h"

namespace fotomill::desktop {

// The list of steps: each can be switched off with its check box, moved by dragging or with Alt and
// the arrow keys, and removed with Delete.
class StepBox : public wxCheckListBox {
 public:
  // `steps` must outlive the box; `changed` is called after another step was selected, or after the
  // list was changed here.
  StepBox(wxWindow* parent, StepList& steps, std::function<void()> changed);

  void ShowSteps();  // call after other changes
  void RemoveCurrent();
  void MoveCurrent(int by);  // places down; up if negative

 private:
  void OnMouse(wxMouseEvent& event);
  void OnKey(wxKeyEvent& event);

  StepList& steps_;
  const std::function<void()> changed_;
  size_t dragged_ = StepList::kNone;
};

}  // namespace fotomill::desktop
