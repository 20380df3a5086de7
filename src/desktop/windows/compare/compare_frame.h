#pragma once

#include <wx/frame.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/view/view_picture.h"
#include "desktop/windows/view/view_canvas.h"
#include "desktop/windows/widgets/file_question.h"
#include "desktop/windows/widgets/window_calls.h"

class wxStaticText;

namespace fotomill::desktop {

class Shell;

// Compares two to four pictures side by side, zoomed and moved together relative to their sizes.
// Commands apply to the pane with the focus.
class CompareFrame : public wxFrame {
 public:
  // Whether this number of files can be compared.
  static constexpr bool CanShow(size_t files) { return files >= 2 && files <= 4; }

  // One pane per file; CanShow must be true. Deletes itself when closed.
  CompareFrame(Shell& shell, const std::vector<std::string>& files);
  ~CompareFrame() override;

  // Call after files were written: reloads panes whose files have changed.
  void FilesChanged();
  // Commands of keys and menu.
  ViewCanvas& Canvas() { return *panes_[focus_].canvas; }
  bool Joined() const { return joined_; }  // all panes share zoom and position
  void ToggleJoined();                     // when joining, all use those of the focused pane
  void StepPane(int panes);                // moves the focus, wrapping around
  void ToggleFullScreen();
  void SettingSwitched();  // after a change of display settings: reloads all
  void ShowInfoWindow();   // for the focused pane
  void DeleteFile();  // moves it to the trash and closes the pane
  void Leave();       // leaves full screen, or else closes the window

 private:
  struct Pane {
    std::string path;
    wxPanel* panel;  // its color frames the focused pane
    ViewCanvas* canvas;
    wxStaticText* caption;
  };

  void FileGone(const std::string& path);
  Pane BuildPane(const std::string& path);
  void ArrangePanes();
  size_t PaneOf(const ViewCanvas* canvas) const;
  void WantPictures();
  void PicturesCame();
  void ShowPicture(Pane& pane, ViewPicturePointer picture);
  void Placed(const ViewCanvas* canvas);
  void Focused(size_t pane);
  void ShowFacts(const ViewCanvas* canvas);
  ViewRequest RequestOf(const Pane& pane) const;
  void OnKey(wxKeyEvent& event);

  Shell& shell_;
  std::vector<Pane> panes_;
  size_t focus_ = 0;
  bool joined_ = true;
  ViewPlace place_;  // of all panes while joined
  FileQuestion changes_;
  const WindowCalls calls_;  // of the loader
  std::unique_ptr<ViewLoader> loader_;
};

// Functions > Compare: for the selected files.
void CompareSelection(Shell& shell);

}  // namespace fotomill::desktop
