#pragma once

#include <wx/frame.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/edit/operation_memory.h"
#include "desktop/models/edit/preview_maker.h"
#include "desktop/models/edit/step_list.h"
#include "desktop/windows/edit/preview_canvas.h"
#include "desktop/windows/widgets/unsaved_work.h"

class wxButton;
class wxChoice;
class wxStaticText;

namespace fotomill::desktop {

class HistogramPanel;
class OperationTree;
class ParameterPanel;
class PictureStrip;
class PresetButton;
class Shell;
class StepBox;

// An Edit window: applies operations to one picture or a selection, with a preview of any of them.
// Nothing is written before Save copies or Change files, which start a batch and close the window.
class EditFrame : public wxFrame, public HoldsWork {
 public:
  // Starts with a step of `first`, or without steps if it is null. Deletes itself when closed.
  EditFrame(Shell& shell, const std::vector<std::string>& files, const Operation* first);
  ~EditFrame() override;

  // Commands of the menu.
  void OpenRecipe();
  void SaveRecipeAs();
  void ExportRecipe();
  void SaveCopies();
  void ChangeFiles();
  void Undo();
  void Redo();
  void AddChosen();  // a step of the operation selected in the tree
  void RemoveStep();
  void MoveStep(int by);
  void SetMode(PreviewMode mode);
  void StepPicture(int by);
  PreviewCanvas& Canvas() { return *canvas_; }
  bool HasSteps() const { return !steps_.Applied().empty(); }
  const StepList& Steps() const { return steps_; }
  // Loads a recipe; reports mistakes.
  void LoadRecipe(const std::string& name, const std::string& text);

 private:
  wxWindow* BuildSide(wxWindow* parent, const Operation* first);
  wxWindow* BuildOperations(wxWindow* parent, const Operation* first);
  wxSizer* BuildStepButtons(wxWindow* parent);
  wxWindow* BuildPreview(wxWindow* parent);
  wxSizer* BuildPreviewBar(wxWindow* parent);
  wxSizer* BuildButtons(wxWindow* parent);
  void BindKeys();
  void StepsChanged();  // the list or its selection
  RecordedText ChangeValue(const char* parameter, const std::string& text);
  void RequestPreview();
  void PreviewsCame();
  void ShowPicture(size_t place);
  void UpdateControls();
  std::string StatusLine() const;
  void WriteRecipe(const std::string& path);
  void OnCharHook(wxKeyEvent& event);
  void OnClose(wxCloseEvent& event);
  void Applied();

  Shell& shell_;
  const std::vector<std::string> files_;
  size_t place_ = 0;  // of the picture shown
  StepList steps_;
  OperationMemory memory_;
  std::string lastText_;  // the recipe that the preview shows
  uint64_t stepsNumber_ = 1, viewNumber_ = 0;
  bool originalCame_ = false;  // for the current view
  bool exactCame_ = false;     // for the current steps and view
  bool changed_ = false;       // steps were changed and not applied
  OperationTree* operations_ = nullptr;
  StepBox* stepBox_ = nullptr;
  wxButton *up_ = nullptr, *down_ = nullptr, *remove_ = nullptr;
  wxStaticText* valuesTitle_ = nullptr;  // the current operation
  PresetButton* presets_ = nullptr;
  ParameterPanel* values_ = nullptr;
  HistogramPanel* histogram_ = nullptr;
  PreviewCanvas* canvas_ = nullptr;
  wxChoice* mode_ = nullptr;
  wxStaticText* zoom_ = nullptr;
  PictureStrip* strip_ = nullptr;  // null for a single picture
  wxButton *copies_ = nullptr, *change_ = nullptr;
  std::unique_ptr<PreviewMaker> maker_;
};

// Functions of the frame's menu, for the selected files.
void EditSelection(Shell& shell);
// Starts with an operation, or with the one of a family that was chosen last.
void EditSelectionWith(Shell& shell, const Operation& operation);
void EditSelectionWith(Shell& shell, Family family);

}  // namespace fotomill::desktop
