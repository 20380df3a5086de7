#pragma once

#include <wx/window.h>

#include <memory>

#include "desktop/models/drawing/histogram.h"

namespace fotomill {
class PackedImage;
}

namespace fotomill::desktop {

// Shows the levels of a picture.
class HistogramPanel : public wxWindow {
 public:
  explicit HistogramPanel(wxWindow* parent);

  void Show(const PackedImage& image);  // 24 bits
  void Clear();
  bool AcceptsFocus() const override { return false; }

 private:
  void OnPaint(wxPaintEvent&);

  std::unique_ptr<Histogram> histogram_;
};

}  // namespace fotomill::desktop
