#pragma once

#include <wx/frame.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "desktop/models/edit/crop_area.h"
#include "desktop/models/edit/preview_maker.h"
#include "desktop/windows/edit/apply_steps.h"
#include "desktop/windows/edit/crop_canvas.h"
#include "desktop/windows/widgets/background.h"
#include "desktop/windows/widgets/unsaved_work.h"
#include "files/cropped_jpeg.h"

class wxButton;
class wxStaticText;

namespace fotomill::desktop {

class CropProperties;
class PictureStrip;
class Shell;

// A Crop window: a rectangle for one picture, or for each of a selection in turn. Enter takes the
// rectangle and goes on, Backspace goes back; one batch then crops all pictures that were taken.
class CropFrame : public wxFrame, public HoldsWork {
 public:
  // Deletes itself when closed.
  CropFrame(Shell& shell, const std::vector<std::string>& files);
  ~CropFrame() override;

  // Commands of buttons, keys and the context menu.
  void Take();  // and go on to the next picture
  void GoBack();
  void Skip();  // leaves the picture as it is
  void SaveCopies();
  void ChangeFiles();
  void UseWhole();  // the suggested rectangle
  void CropToFaces();
  void DrawLevel();
  void ToggleProperties();

 private:
  // What a lossless crop needs to know about a JPEG file.
  struct JpegFacts {
    JpegGrid grid;
    Orientation orientation = Orientation::Upright;
  };
  // The choice for a picture.
  struct Choice {
    bool seen = false;  // it has a rectangle
    bool taken = false;
    Rectangle area;    // in the picture after straightening
    Size size{0, 0};   // of that picture
    double angle = 0;  // degrees clockwise
    std::optional<JpegFacts> jpeg;  // if it is a JPEG file that was shown
  };
  wxSizer* BuildButtons(wxWindow* parent);
  void BuildProperties();
  void ShowProperties(wxPaintEvent& event);
  void ShowPicture(size_t place);
  void RequestPreview();
  void PreviewsCame();
  void PictureKnown(Size size);
  void AreaChanged();
  void SetAngle(double angle);
  void FacesFound(Status status, const std::vector<Rectangle>& faces, Size size);
  void UpdateControls();
  std::string LosslessText();
  FileRecipes Recipes() const;  // of the pictures taken
  void OnKey(wxKeyEvent& event);
  void ShowMenu(const wxPoint& place);
  void OnClose(wxCloseEvent& event);
  void Applied();

  Shell& shell_;
  const std::vector<std::string> files_;
  std::vector<Choice> choices_;
  size_t place_ = 0;
  CropArea area_;
  bool known_ = false;  // area_ is of this picture
  bool lossless_ = false;
  uint64_t stepsNumber_ = 0;
  CropCanvas* canvas_ = nullptr;
  PictureStrip* strip_ = nullptr;  // null for a single picture
  CropProperties* properties_ = nullptr;
  wxButton *back_ = nullptr, *skip_ = nullptr, *take_ = nullptr;
  wxButton *copies_ = nullptr, *change_ = nullptr;
  std::unique_ptr<PreviewMaker> maker_;
  Background faces_;  // must be last: its work uses the other members
};

// The function Crop, for the selected files.
void CropSelection(Shell& shell);

}  // namespace fotomill::desktop
