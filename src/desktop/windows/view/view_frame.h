#pragma once

#include <wx/frame.h>
#include <wx/timer.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "desktop/models/view/view_list.h"
#include "desktop/models/view/view_picture.h"
#include "desktop/windows/view/view_canvas.h"
#include "desktop/windows/view/view_slideshow.h"
#include "desktop/windows/widgets/file_question.h"
#include "desktop/windows/widgets/window_calls.h"

namespace fotomill {
struct TagChanges;
}

namespace fotomill::desktop {

class AnimationBar;
class OverlayBar;
class Shell;
class ViewAnimation;

// A view window: shows one picture at a time,
// and decodes its neighbors in the list ahead.
class ViewFrame : public wxFrame {
 public:
  // Opens `file`; `list` contains it and its neighbors.
  ViewFrame(Shell& shell, const std::vector<std::string>& list, const std::string& file);
  ~ViewFrame() override;

  // Shows another file among other neighbors; no longer follows a folder.
  void ShowList(const std::vector<std::string>& list, const std::string& file);
  // Commands of keys and menu.
  void Step(int files);
  void GoTo(size_t place);  // index in the list, from 0
  void StepPage(int pages);  // or frames of an animation
  void StepFrame(int frames);  // pauses the animation; no-op without one
  void PlayOrNext();  // plays or pauses an animation; otherwise next picture
  void ToggleFullScreen();
  void ToggleSlideshow();  // starts with the last settings, at the current picture
  void ChooseSlideshow();  // asks for duration and order first
  void ToggleOverlay();    // file and camera facts on top of the picture
  void SettingSwitched();  // after a change of display settings
  void Leave();            // leaves full screen, or else closes the window
  void DeleteFile();       // moves it to the trash and shows the next one
  void Turn(Orientation turn);  // turns the view only; nothing is written
  void SaveTurned();            // saves the file as displayed
  void Undo();                  // undoes turning the view, or else the last file operation
  void Redo();  // of file operations
  // Call after files were written: reloads the picture if its file has changed.
  void FilesChanged();
  // Calls `shown` once, when the first picture is shown or the window is closed.
  void WhenShown(std::function<void()> shown);
  // Replaces the list of neighbors. False, with no change, if it does not contain the current file,
  // unless this window follows a folder: then its picture stays until another one is chosen.
  bool UseList(const std::vector<std::string>& list);
  // The folder whose whole list this window shows; empty: a selection.
  void FollowFolder(const std::string& folder) { folder_ = folder; }
  const std::string& FollowedFolder() const { return folder_; }
  // Call after a file or folder may have been renamed.
  void FollowRename(const std::string& from, const std::string& to);
  // Changes the tags of a file; the picture stays on the screen meanwhile.
  void TagFile(const std::string& path, const TagChanges& changes);
  Shell& Owner() { return shell_; }
  const std::string& File() const { return list_.File(); }  // the current one
  ViewPicturePointer Loaded() const;                        // that of the current file, or null
  size_t LastPlace() const { return list_.Count() - 1; }    // index in the list, from 0
  ViewCanvas& Canvas() { return *canvas_; }              // for zooming and moving

 private:
  void ShowPlace();
  bool AskForPicture();
  void ShowStandIn();
  void WantPictures();
  void Resized();
  void ReloadIfChanged();
  void Moved();
  void FileGone(const std::string& path);
  void PictureCame();
  void ShowProgress(const std::string& path, int percent);
  void ShowPicture(ViewPicturePointer picture);
  void ViewChanged();
  ViewRequest RequestOf(size_t place) const;
  bool IsCurrent(const ViewPicturePointer& picture) const;
  std::string StatusLine() const;
  std::string PlaceText() const;
  std::vector<std::string> OverlayLines() const;
  void HidePointerLater();
  void BuildCanvas();
  void BuildMenus();
  void ShowNote();
  void OnKey(wxKeyEvent& event);
  void ShowMenu(const wxPoint& place);
  void LogPaint();
  void StartAfresh();
  void ShowTurned();
  ViewPicturePointer Turned(const ViewPicturePointer& picture) const;

  Shell& shell_;
  ViewList list_;
  std::string folder_;  // of the list; empty if that is a selection
  int32_t page_ = 0;
  size_t screen_ = 0;                        // which shows this window
  Orientation turn_ = Orientation::Upright;  // of the view relative to the file
  ViewPicturePointer loaded_;                // unturned, as in the file
  bool saving_ = false;
  bool tagged_ = false;  // tags of the file are about to change, but not its pixels
  std::string note_;    // remark about turning the file
  double keyTime_ = 0;  // time of the request for the pending picture
  bool overlay_ = false;
  std::function<void()> shown_;
  std::string painted_;  // last logged text
  wxTimer pointerTimer_, noteTimer_;
  ViewCanvas* canvas_ = nullptr;
  AnimationBar* bar_ = nullptr;
  std::unique_ptr<OverlayBar> overlayBar_;
  std::unique_ptr<ViewAnimation> animation_;
  ViewSlideshow slideshow_;
  FileQuestion changes_;
  const WindowCalls calls_;  // of the loader
  std::unique_ptr<ViewLoader> loader_;
  int loadedPercent_ = 0;  // loading progress, if shown
};

}  // namespace fotomill::desktop
