#include "desktop/windows/edit/step_box.h"

#include "desktop/models/edit/choice_text.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

StepBox::StepBox(wxWindow* parent, StepList& steps, std::function<void()> changed)
    : wxCheckListBox(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxArrayString(),
                     wxLB_SINGLE),
      steps_(steps),
      changed_(std::move(changed)) {
  SetName(Label("Steps"));
  Bind(wxEVT_LISTBOX, [this](wxCommandEvent& event) {
    steps_.Select(static_cast<size_t>(event.GetSelection()));
    changed_();
  });
  Bind(wxEVT_CHECKLISTBOX, [this](wxCommandEvent& event) {
    const auto place = static_cast<unsigned>(event.GetInt());
    steps_.Switch(place, IsChecked(place));
    changed_();
  });
  for (const auto type : {wxEVT_LEFT_DOWN, wxEVT_LEFT_UP, wxEVT_MOTION})
    Bind(type, &StepBox::OnMouse, this);
  Bind(wxEVT_KEY_DOWN, &StepBox::OnKey, this);
}

void StepBox::ShowSteps() {
  const auto& list = steps_.Steps();
  while (GetCount() > list.size()) Delete(GetCount() - 1);
  for (unsigned i = 0; i < list.size(); ++i) {
    const wxString text = Shown(StepText(list[i].step));
    if (i >= GetCount()) {
      Append(text);
    } else if (GetString(i) != text) {
      SetString(i, text);
    }
    if (IsChecked(i) != list[i].on) Check(i, list[i].on);
  }
  const size_t current = steps_.Current();
  SetSelection(current == StepList::kNone ? wxNOT_FOUND : static_cast<int>(current));
}

void StepBox::RemoveCurrent() {
  if (steps_.Current() == StepList::kNone) return;
  steps_.Remove(steps_.Current());
  changed_();
}

void StepBox::MoveCurrent(int by) {
  const size_t current = steps_.Current();
  const auto to = static_cast<size_t>(static_cast<std::ptrdiff_t>(current) + by);
  if (current == StepList::kNone || to >= steps_.Steps().size()) return;
  steps_.Move(current, to);
  changed_();
}

void StepBox::OnMouse(wxMouseEvent& event) {
  event.Skip();
  const int hit = HitTest(event.GetPosition());
  if (event.LeftDown()) dragged_ = hit == wxNOT_FOUND ? StepList::kNone : static_cast<size_t>(hit);
  if (event.Dragging() && dragged_ != StepList::kNone) SetCursor(wxCursor(wxCURSOR_HAND));
  if (!event.LeftUp()) return;
  SetCursor(wxNullCursor);
  const size_t from = std::exchange(dragged_, StepList::kNone);
  if (from == StepList::kNone || from >= steps_.Steps().size()) return;
  // Below the last step is the end of the list.
  const size_t to = hit == wxNOT_FOUND ? steps_.Steps().size() - 1 : static_cast<size_t>(hit);
  if (to == from) return;
  steps_.Move(from, to);
  changed_();
}

void StepBox::OnKey(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  if (key == WXK_DELETE) return RemoveCurrent();
  if (event.AltDown() && key == WXK_UP) return MoveCurrent(-1);
  if (event.AltDown() && key == WXK_DOWN) return MoveCurrent(1);
  event.Skip();
}

}  // namespace fotomill::desktop
