#pragma once

#include <wx/bitmap.h>
#include <wx/bmpbndl.h>
#include <wx/timer.h>

#include <functional>
#include <map>
#include <string>
#include <vector>

#include "desktop/models/view/overlay_layout.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/widgets/key_commands.h"

class wxDC;
class wxGraphicsContext;

namespace fotomill::desktop {

class ViewCanvas;
class ViewFrame;

// The bar over the picture of a view window, with the main commands (ViewModeButtonList) and a film
// strip. It appears when the pointer moves, and fades away when it rests somewhere else.
class OverlayBar {
 public:
  using Command = KeyCommand<ViewFrame>;
  // Callbacks to the window.
  struct Events {
    std::function<void(const Command& command)> run;
    std::function<void(size_t file)> show;  // index in the list
  };

  // Handles the canvas's mouse events above the bar. All must outlive this object.
  OverlayBar(ViewCanvas& canvas, ThumbnailService& thumbnails, Events events);
  ~OverlayBar();

  // The files of the film strip, which stay with the caller, and the current one.
  void SetFiles(const std::vector<std::string>& files, size_t current);
  // Draws the bar, if it is visible.
  void Draw(wxDC& dc);
  // Whether the pointer is over the bar.
  bool Holds() const { return hit_.part != OverlayLayout::Part::Outside; }

 private:
  struct Button {
    const Command* command;
    wxBitmapBundle symbol;
  };
  void ReadButtons();
  void Arrange();
  void Move(const wxPoint& place);
  void Turn(bool shown);
  void FadeOn();
  bool Press(const wxPoint& place);    // whether it is on the bar
  bool Release(const wxPoint& place);  // likewise
  void WantThumbnails();
  void DrawCaption(wxGraphicsContext& context, wxDC& dc);
  void DrawButtons(wxGraphicsContext& context);
  void DrawCells(wxGraphicsContext& context);
  void DrawCell(wxGraphicsContext& context, size_t file);
  const wxBitmap* BitmapOfFile(const std::string& path);
  void Refresh();

  ViewCanvas& canvas_;
  ThumbnailService& thumbnails_;
  const Events events_;
  std::string letters_;  // of the buttons
  std::vector<Button> buttons_;
  const std::vector<std::string>* files_ = nullptr;
  size_t current_ = 0;
  OverlayLayout layout_;
  OverlayLayout::Hit hit_, pressed_;
  Fade fade_;
  wxTimer fadeTimer_, restTimer_;
  struct Drawn {
    ThumbnailPointer thumbnail;
    wxBitmap bitmap;
  };
  std::map<std::string, Drawn> bitmaps_;
};

}  // namespace fotomill::desktop
