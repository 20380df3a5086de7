#include "desktop/windows/browser/folder_problem.h"

#include <wx/button.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

constexpr int kTextWidth = 420, kGap = 12;  // device-independent pixels

}  // namespace

FolderProblem::FolderProblem(wxWindow* parent, std::function<void()> up)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "FolderProblem"),
      text_(new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                             wxALIGN_CENTER_HORIZONTAL | wxST_NO_AUTORESIZE)),
      up_(new wxButton(this, wxID_ANY, Label("Go to the &parent folder"))) {
  Hide();
  const auto color = [this] { SetBackgroundColour(ToWx(CurrentPalette().background)); };
  color();
  Bind(wxEVT_SYS_COLOUR_CHANGED, [color](wxSysColourChangedEvent& event) {
    color();
    event.Skip();
  });
  up_->Bind(wxEVT_BUTTON, [up = std::move(up)](wxCommandEvent&) { up(); });
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->AddStretchSpacer(2);
  column->Add(text_, wxSizerFlags().Expand().Border(wxALL, FromDIP(kGap)));
  column->Add(up_, wxSizerFlags().Center());
  column->AddStretchSpacer(3);
  SetSizer(column);
}

void FolderProblem::ShowText(const wxString& text) {
  if (text_->GetLabel() == text) return;
  text_->SetLabel(text);
  text_->Wrap(FromDIP(kTextWidth));
  Layout();
}

void FolderProblem::FocusButton() { up_->SetFocus(); }

bool FolderProblem::HasButtonFocus() const { return up_->HasFocus(); }

}  // namespace fotomill::desktop
