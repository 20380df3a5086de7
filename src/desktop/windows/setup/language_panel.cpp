#include "desktop/windows/setup/language_panel.h"

#include <wx/choice.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include "desktop/models/setup/language_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

LanguagePanel::LanguagePanel(wxWindow* parent) : wxPanel(parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("&Language:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(6)));
  choice_ = new wxChoice(this, wxID_ANY);
  choice_->SetName(Label("Language"));
  choice_->Append(Label("Language of the system"));
  codes_.emplace_back();
  for (const Language& language : Languages()) {
    choice_->Append(wxString::FromUTF8(language.name));
    codes_.push_back(language.code);
  }
  const std::string stored = StoredLanguage();
  for (size_t i = 0; i < codes_.size(); ++i) {
    if (codes_[i] == stored) choice_->SetSelection(static_cast<int>(i));
  }
  if (choice_->GetSelection() == wxNOT_FOUND) choice_->SetSelection(0);
  row->Add(choice_);
  SetSizer(row);
}

std::string LanguagePanel::Chosen() const {
  return codes_[static_cast<size_t>(choice_->GetSelection())];
}

void LanguagePanel::Store() {
  const std::string code = Chosen();
  if (code == StoredLanguage()) return;
  const bool stored = StoreLanguage(code);
  LogEvent("language", code.empty() ? "system" : code);
  wxMessageBox(stored ? Label("The language changes at the next start of the program.")
                      : Label("The language could not be saved."),
               Label("Setup"), wxOK | (stored ? wxICON_INFORMATION : wxICON_WARNING), this);
}

}  // namespace fotomill::desktop
