#include "desktop/windows/view/animation_bar.h"

#include <wx/sizer.h>

#include <algorithm>

#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kLineHeight = 4;

}  // namespace

AnimationBar::AnimationBar(wxWindow* parent, Events events) : wxPanel(parent) {
  auto* column = new wxBoxSizer(wxVERTICAL);
  line_ = new wxGauge(this, wxID_ANY, 1, wxDefaultPosition, FromDIP(wxSize(-1, kLineHeight)),
                      wxGA_HORIZONTAL | wxGA_SMOOTH, wxDefaultValidator, Label("Frame"));
  buttons_ = new wxPanel(this);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->AddStretchSpacer();
  AddButton(*row, "previous", Label("Previous frame (,)"), [step = events.step] { step(-1); });
  toggle_ = AddButton(*row, "play", Label("Play (Space)"), events.toggle);
  AddButton(*row, "next", Label("Next frame (.)"), [step = events.step] { step(1); });
  row->AddStretchSpacer();
  buttons_->SetSizer(row);
  column->Add(line_, wxSizerFlags().Expand());
  column->Add(buttons_, wxSizerFlags().Expand().Border(wxTOP | wxBOTTOM, FromDIP(2)));
  SetSizer(column);
  Show(false);
}

wxBitmapButton* AnimationBar::AddButton(wxSizer& row, const char* symbol, const wxString& name,
                                        std::function<void()> action) {
  auto* button = new wxBitmapButton(buttons_, wxID_ANY, Symbol(symbol), wxDefaultPosition,
                                    wxDefaultSize, wxBU_EXACTFIT);
  button->SetToolTip(name);
  button->Bind(wxEVT_BUTTON, [action = std::move(action)](wxCommandEvent&) { action(); });
  row.Add(button, wxSizerFlags().Border(wxLEFT | wxRIGHT, FromDIP(2)));
  return button;
}

void AnimationBar::Open() {
  line_->Show(settings.AnimationViewModeProgressBar != 0);
  buttons_->Show(settings.AnimationViewModeToolbar != 0);
  Layout();
  Show(line_->IsShown() || buttons_->IsShown());
}

void AnimationBar::Report(bool playing, size_t frame, size_t count) {
  const int frames = static_cast<int>(std::max<size_t>(count, 1));
  if (line_->GetRange() != frames) line_->SetRange(frames);
  line_->SetValue(std::min(static_cast<int>(frame) + 1, frames));
  if (playing == playing_) return;
  playing_ = playing;
  toggle_->SetBitmap(Symbol(playing ? "pause" : "play"));
  const wxString name = playing ? Label("Pause (Space)") : Label("Play (Space)");
  toggle_->SetToolTip(name);
  ReportToScreenReader(*toggle_, name);
}

}  // namespace fotomill::desktop
