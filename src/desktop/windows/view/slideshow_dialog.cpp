#include "desktop/windows/view/slideshow_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/dialog.h>
#include <wx/sizer.h>
#include <wx/spinctrl.h>
#include <wx/stattext.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

std::optional<SlideshowChoices> AskForSlideshow(wxWindow& parent, const SlideshowChoices& choices) {
  wxDialog dialog(&parent, wxID_ANY, Label("Slideshow"), wxDefaultPosition, wxDefaultSize,
                  wxDEFAULT_DIALOG_STYLE, "SlideshowBox");
  const int gap = dialog.FromDIP(10);
  auto* grid = new wxFlexGridSizer(2, gap, gap);
  const auto label = [&](const wxString& text) {
    grid->Add(new wxStaticText(&dialog, wxID_ANY, text), wxSizerFlags().CenterVertical());
  };
  label(Label("&Seconds per picture:"));
  auto* seconds =
      new wxSpinCtrl(&dialog, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxSP_ARROW_KEYS, 1,
                     SlideshowChoices::kMostSeconds, choices.seconds);
  grid->Add(seconds);
  label(Label("&Order:"));
  const wxString orders[] = {Label("as listed"), Label("random")};
  auto* order = new wxChoice(&dialog, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                             static_cast<int>(std::size(orders)), orders);
  order->SetSelection(choices.random ? 1 : 0);
  grid->Add(order);
  auto* repeat = new wxCheckBox(&dialog, wxID_ANY, Label("&Repeat from the start"));
  repeat->SetValue(choices.repeat);
  auto* start = new wxButton(&dialog, wxID_OK, Label("S&tart"));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(grid, wxSizerFlags().Border(wxALL, gap));
  column->Add(repeat, wxSizerFlags().Border(wxLEFT | wxRIGHT, gap));
  column->Add(BuildAnswerRow(dialog, *start), wxSizerFlags().Expand().Border(wxALL, gap));
  dialog.SetSizerAndFit(column);
  dialog.CentreOnParent();
  seconds->SetFocus();
  LogEvent("prompt", "slideshow");
  if (dialog.ShowModal() != wxID_OK) return std::nullopt;
  return SlideshowChoices{seconds->GetValue(), order->GetSelection() == 1, repeat->GetValue()};
}

}  // namespace fotomill::desktop
