#include "desktop/windows/widgets/in_place_editor.h"

#include <wx/textctrl.h>

#include <string_view>
#include <utility>

namespace fotomill::desktop {

void InPlaceEditor::Begin(const wxRect& place, const wxString& name, const std::string& text,
                          size_t selected, Changed changed) {
  Finish(true);
  changed_ = std::move(changed);
  field_ = new wxTextCtrl(&window_, wxID_ANY, Shown(text), place.GetPosition(), place.GetSize(),
                          wxTE_PROCESS_ENTER, wxDefaultValidator, name);
  const auto finishLater = [this](bool accept) {
    window_.CallAfter([this, accept] { Finish(accept); });
  };
  field_->Bind(wxEVT_TEXT_ENTER, [finishLater](wxCommandEvent&) { finishLater(true); });
  field_->Bind(wxEVT_KILL_FOCUS, [finishLater](wxFocusEvent& event) {
    finishLater(true);
    event.Skip();
  });
  field_->Bind(wxEVT_KEY_DOWN, [finishLater](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    finishLater(false);
  });
  field_->SetFocus();
  const wxString shown = Shown(std::string_view(text).substr(0, selected));
  field_->SetSelection(0, static_cast<long>(shown.length()));
}

void InPlaceEditor::MoveTo(const wxRect& place) {
  if (field_ != nullptr) field_->SetSize(place);
}

void InPlaceEditor::Finish(bool accept) {
  if (field_ == nullptr) return;
  wxTextCtrl* field = std::exchange(field_, nullptr);
  const Changed changed = std::exchange(changed_, {});
  const std::string text = Utf8(field->GetValue());
  const bool hadFocus = field->HasFocus();
  const bool modified = field->IsModified();
  field->Hide();
  field->Destroy();
  if (hadFocus) window_.SetFocus();
  window_.Refresh();
  if (accept && modified && !text.empty()) changed(text);
}

}  // namespace fotomill::desktop
