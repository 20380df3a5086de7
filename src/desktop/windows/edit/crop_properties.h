#pragma once

#include <wx/frame.h>

#include <functional>

#include "desktop/models/edit/crop_area.h"
#include "desktop/windows/edit/crop_canvas.h"

class wxButton;
class wxCheckBox;
class wxChoice;
class wxComboBox;
class wxSpinCtrl;
class wxSpinCtrlDouble;
class wxStaticText;

namespace fotomill::desktop {

// The floating panel of a Crop window: ratio, exact numbers, lines, angle. Its place is remembered
// (CropPropertiesLeft, Top, Width, Depth).
class CropProperties : public wxFrame {
 public:
  struct Events {
    std::function<void(const CropRatio& ratio)> ratio;
    std::function<void(const Rectangle& area)> area;
    std::function<void(bool exact)> exact;  // only move the rectangle
    std::function<void(CropLines lines)> lines;
    std::function<void(double angle)> angle;
    std::function<void()> drawLevel;
    std::function<void()> faces;
    std::function<void(bool on)> lossless;
    std::function<void(wxKeyEvent& event)> key;  // keys that the panel does not use
  };
  CropProperties(wxWindow* parent, Events events);

  void ShowArea(const CropArea& area, double angle);
  // How a lossless crop moves the rectangle; `possible` only for JPEG files.
  void ShowLossless(bool possible, const wxString& text);
  void KeepPlace();

 private:
  wxSizer* NewRatioRow(wxWindow* panel);
  wxSizer* NewNumbers(wxWindow* panel);
  wxSizer* NewAngleRow(wxWindow* panel);
  void PlaceBeside(wxWindow& parent);
  void RatioEntered();
  void NumbersEntered();

  const Events events_;
  wxComboBox* ratio_ = nullptr;
  wxSpinCtrl* numbers_[4] = {};  // left, top, width, height
  wxCheckBox* exact_ = nullptr;
  wxChoice* lines_ = nullptr;
  wxSpinCtrlDouble* angle_ = nullptr;
  wxButton* level_ = nullptr;
  wxButton* faces_ = nullptr;
  wxCheckBox* lossless_ = nullptr;
  wxStaticText* moves_ = nullptr;
};

}  // namespace fotomill::desktop
