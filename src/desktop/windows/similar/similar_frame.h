#pragma once

#include <wx/frame.h>

#include <string>
#include <vector>

#include "core/workers/stop_token.h"
#include "desktop/models/similar/group_list.h"
#include "desktop/windows/widgets/file_question.h"
#include "desktop/windows/widgets/loose_work.h"

class wxButton;
class wxCheckBox;
class wxChoice;
class wxGauge;
class wxSlider;
class wxStaticText;
class wxTextCtrl;

namespace fotomill::desktop {

class GroupCanvas;
class Shell;

// The Find similar window: searches folders in the background and shows groups of similar pictures,
// of which some can be moved to the trash.
class SimilarFrame : public wxFrame {
 public:
  // Deletes itself when closed.
  SimilarFrame(Shell& shell, const std::vector<std::string>& folders);
  ~SimilarFrame() override;

  // Other folders to search, unless a search is running.
  void SetFolders(const std::vector<std::string>& folders);
  // Call after files were changed: finds out what has become of the pictures.
  void FilesChanged();
  // Commands of keys and menu.
  void Compare();  // the group of the focused picture
  void View();     // the focused picture, with its group as neighbors
  void ToggleTick();
  void TickAllButBest();
  void UntickAll();
  void TrashTicked();  // asks first if all pictures of a group are ticked
  void Undo();
  void Redo();
  void Leave();  // stops the search, or else closes the window

 private:
  wxSizer* BuildFolders(wxWindow* parent);
  wxSizer* BuildOptions(wxWindow* parent);
  wxSizer* BuildStatus(wxWindow* parent);
  wxSizer* BuildButtons(wxWindow* parent);
  void Browse();
  void ShowDistance();
  SimilarQuestion Question() const;
  void StoreOptions() const;
  void Begin();
  void Measure();  // the sharpness of the pictures found
  void Start(
      const std::function<void(const StopToken& halt, const LooseWork::Report& report)>& work);
  void ShowProgress(const SimilarProgress& progress);
  void Found(const SimilarFindings& findings);
  void Ended();
  void RuleChosen();
  void ShowStates(const std::vector<FileNow>& states);
  void TrashUnlessChanged(size_t ticked, const std::vector<FileNow>& states);
  void ShowProblems();
  void UpdateControls();
  void OnKey(wxKeyEvent& event);

  Shell& shell_;
  GroupList list_;
  std::vector<std::string> folders_;  // in the field
  std::vector<std::string> problems_;
  SimilarQuestion question_;  // of the last search
  LooseWork work_;
  StopSource halt_;  // ends the search but keeps what it found
  bool halted_ = false;
  SimilarStage stage_ = SimilarStage::Listing;
  double stageBegan_ = 0;
  FileQuestion states_, beforeTrash_;
  GroupCanvas* canvas_ = nullptr;
  wxTextCtrl* place_ = nullptr;
  wxCheckBox* subfolders_ = nullptr;
  wxChoice* kind_ = nullptr;
  wxSlider* distance_ = nullptr;
  wxStaticText* distanceText_ = nullptr;
  wxChoice* rule_ = nullptr;
  wxStaticText* status_ = nullptr;
  wxGauge* gauge_ = nullptr;
  wxButton *search_ = nullptr, *tick_ = nullptr, *untick_ = nullptr, *compare_ = nullptr,
           *problemsButton_ = nullptr, *trash_ = nullptr;
};

// Tools > Find similar: shows the window for the selected folders, else for the current one. There
// is one at most.
void FindSimilarInBrowser(Shell& shell);
// Call after files were written, renamed or deleted.
void RefreshSimilar();

}  // namespace fotomill::desktop
