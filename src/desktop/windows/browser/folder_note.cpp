#include "desktop/windows/browser/folder_note.h"

#include <wx/sizer.h>
#include <wx/stattext.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

FolderNote::FolderNote(wxWindow* parent)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "FolderNote"),
      text_(new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                             wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_END)) {
  Hide();
  SetBackgroundColour(BarColor());
  Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    SetBackgroundColour(BarColor());
    event.Skip();
  });
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(text_, wxSizerFlags(1).CenterVertical().Border(wxALL, FromDIP(6)));
  SetSizer(row);
}

void FolderNote::ShowText(const wxString& text) {
  if (text_->GetLabel() == text) return;
  text_->SetLabel(text);
  text_->SetToolTip(text);
  if (!text.empty()) LogEvent("folder-note", Utf8(text));
  Show(!text.empty());
  GetParent()->Layout();
}

}  // namespace fotomill::desktop
