#pragma once

#include <wx/frame.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/view/view_picture.h"
#include "desktop/windows/view/view_canvas.h"

class wxStaticText;

namespace fotomill::desktop {

class Shell;

// Two to four pictures beside each other, zoomed and moved together in parts of each. Commands go
// to the pane with the focus.
class CompareFrame : public wxFrame {
 public:
  // Whether that number of files can be compared.
  static constexpr bool CanShow(size_t files) { return files >= 2 && files <= 4; }

  // A pane for each file, for which CanShow holds; destroys itself when it is closed.
  CompareFrame(Shell& shell, const std::vector<std::string>& files);
  ~CompareFrame() override;

  // Files were written: panes whose files are others now load them again.
  void FilesChanged();
  // Commands, by keys and menu.
  ViewCanvas& Canvas() { return *panes_[focus_].canvas; }
  bool Joined() const { return joined_; }  // zoom and place are those of all panes
  void ToggleJoined();                     // joined, all take those of the pane with the focus
  void StepPane(int panes);                // moves the focus, around the ends
  void ToggleFullScreen();
  void SettingSwitched();  // one that says how pictures look: all are loaded again
  void ShowInfoWindow();   // of the pane with the focus
  void DeleteFile();  // to the trash, and its pane goes
  void Leave();       // full screen first, then the window

 private:
  struct Pane {
    std::string path;
    wxPanel* panel;  // its color is a frame around the pane with the focus
    ViewCanvas* canvas;
    wxStaticText* caption;
  };

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
  ViewPlace place_;  // of all panes while they are joined
  std::unique_ptr<ViewLoader> loader_;
};

// Functions > Compare: the selected files.
void CompareSelection(Shell& shell);

}  // namespace fotomill::desktop
