#pragma once

#include <wx/frame.h>
#include <wx/timer.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "desktop/models/view/view_picture.h"
#include "desktop/windows/view/view_canvas.h"
#include "desktop/windows/view/view_slideshow.h"

namespace fotomill::desktop {

class AnimationBar;
class Shell;
class ViewAnimation;

// A view window: one picture at a time, with its neighbors of the list that it was opened from
// decoded ahead.
class ViewFrame : public wxFrame {
 public:
  // Opens on `file`; `list` has its neighbors, and the file itself.
  ViewFrame(Shell& shell, const std::vector<std::string>& list, const std::string& file);
  ~ViewFrame() override;

  // Commands, by keys and menu.
  void Step(int files);
  void GoTo(size_t place);  // in the list, from 0
  void StepPage(int pages);  // or frames of an animation
  void StepFrame(int frames);  // pauses the animation; without one nothing happens
  void PlayOrNext();  // plays or pauses an animation; without one, the next picture
  void ToggleFullScreen();
  void ToggleSlideshow();  // begins as chosen last, with the picture shown
  void ChooseSlideshow();  // asks for seconds and order first
  void ToggleOverlay();    // file and camera facts on the picture
  void SettingSwitched();  // one that says how pictures look or stay
  void Leave();            // full screen first, then the window
  void CopyPicture();  // to the clipboard; alpha on the background of view windows
  void DeleteFile();  // to the trash; the next one is shown
  void ShowInfoWindow();        // of the file shown
  void Turn(Orientation turn);  // the view; nothing is written
  void SaveTurned();            // the file, as it is seen
  void Undo();                  // the view's turn, else what was done to files
  void Redo();  // of what was done to files
  // Files were written: a picture whose file is another one now is loaded again.
  void FilesChanged();
  // Calls once when the first picture is there, or the window goes without.
  void WhenShown(std::function<void()> shown);
  // The files that neighbor the picture from here on. False when it is not among them; they are as
  // before then.
  bool UseList(const std::vector<std::string>& list);
  size_t LastPlace() const { return list_.size() - 1; }  // in the list, from 0
  ViewCanvas& Canvas() { return *canvas_; }              // for zoom and movement

 private:
  void ShowPlace();
  bool AskForPicture();
  void ShowStandIn();
  void WantPictures();
  void Resized();
  void PictureCame();
  void ShowProgress(const std::string& path, int percent);
  void ShowPicture(ViewPicturePointer picture);
  void ViewChanged();
  ViewRequest RequestOf(size_t place) const;
  bool IsCurrent(const ViewPicturePointer& picture) const;
  std::string StatusLine() const;
  std::vector<std::string> OverlayLines() const;
  void HidePointerLater();
  void OnKey(wxKeyEvent& event);
  void ShowMenu(const wxPoint& place);
  void LogPaint();
  void StartAfresh();
  void ShowTurned();
  ViewPicturePointer Turned(const ViewPicturePointer& picture) const;

  Shell& shell_;
  std::vector<std::string> list_;
  size_t place_ = 0;
  int32_t page_ = 0;
  Orientation turn_ = Orientation::Upright;  // how the view is turned against the file
  ViewPicturePointer loaded_;                // as the file has it
  bool saving_ = false;
  std::string note_;    // how the file was turned, where that is not as usual
  double keyTime_ = 0;  // when the picture that is awaited was asked for
  bool overlay_ = false;
  std::function<void()> shown_;
  std::string painted_;  // what the log was told of
  wxTimer pointerTimer_;
  ViewCanvas* canvas_ = nullptr;
  AnimationBar* bar_ = nullptr;
  std::unique_ptr<ViewAnimation> animation_;
  ViewSlideshow slideshow_;
  std::unique_ptr<ViewLoader> loader_;
  int loadedPercent_ = 0;  // of the picture that is being loaded, if that is shown
};

}  // namespace fotomill::desktop
