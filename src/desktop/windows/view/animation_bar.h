#pragma once

#include <wx/bmpbuttn.h>
#include <wx/gauge.h>
#include <wx/panel.h>

#include <functional>

namespace fotomill::desktop {

// What is below an animation: a line that tells how far it is, with
// AnimationViewModeProgressBar, and buttons, with AnimationViewModeToolbar. Hidden until there is
// something to tell.
class AnimationBar : public wxPanel {
 public:
  // What its buttons do.
  struct Events {
    std::function<void()> toggle;  // play or pause
    std::function<void(int frames)> step;  // back below 0
  };

  AnimationBar(wxWindow* parent, Events events);

  // Shows what the settings want of it, if anything.
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
