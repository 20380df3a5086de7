#pragma once

#include <wx/bmpbuttn.h>
#include <wx/gauge.h>
#include <wx/panel.h>

#include <functional>

namespace fotomill::desktop {

// The bar below an animation: progress, with
// AnimationViewModeProgressBar, and buttons, with
// AnimationViewModeToolbar. Hidden if not needed.
class AnimationBar : public wxPanel {
 public:
  // Actions of the buttons.
  struct Events {
    std::function<void()> toggle;  // play or pause
    std::function<void(int frames)> step;  // negative: back
  };

  AnimationBar(wxWindow* parent, Events events);

  // Shows the parts enabled in the settings, if any.
  void Open();
  void Close() { Show(false); }
  void Report(bool playing, size_t frame, size_t count);  // `frame` from 0, of `count` known so far

 private:
  wxBitmapButton* AddButton(wxSizer& row, const char* symbol, const wxString& name,
                            std::function<void()> action);

  wxGauge* line_ = nullptr;
  wxPanel* buttons_ = nullptr;
  wxBitmapButton* toggle_ = nullptr;
  bool playing_ = false;
};

}  // namespace fotomill::desktop
