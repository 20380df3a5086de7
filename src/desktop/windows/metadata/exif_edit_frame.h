#pragma once

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/metadata/exif_editor.h"
#include "desktop/windows/widgets/background.h"
#include "desktop/windows/widgets/tool_frame.h"
#include "desktop/windows/widgets/unsaved_work.h"

class wxCheckBox;
class wxHyperlinkCtrl;
class wxSearchCtrl;

namespace fotomill::desktop {

class ExifValuePanel;
class Shell;

// The EXIF editor: changes values, times and place of one or several files, and writes them in the
// background. Deletes itself when closed.
class ExifEditFrame : public ToolFrame, public HoldsWork {
 public:
  ExifEditFrame(Shell& shell, wxWindow* parent, std::vector<std::string> files);

 private:
  friend void RefreshExifEditors();
  wxSizer* BuildSearch();
  wxSizer* BuildSide();
  void LayOutWith(wxSizer& contents);
  void Read();
  void ReadIfChanged();
  void FilesRead();
  void ShowRows();
  void UpdateRow(size_t place);
  void ShowSelected();
  void ShowPlace();
  void UpdateControls();
  void Entered(const std::string& text);
  void ChangeSelected(void (ExifEditor::*change)(uint16_t tag));
  void ShiftTimes();
  void SetPlace();
  void SetOwner();
  void Write();
  bool ConfirmWrite();
  bool ConfirmAdding(bool& addNew);
  void Written(bool errors);
  void OnClose(wxCloseEvent& event);

  Shell& shell_;
  const std::vector<std::string> paths_;
  std::vector<ExifFileTexts> read_;  // written by the background task
  ExifEditor editor_;
  std::vector<ExifEditRow> rows_;  // of the list
  bool invalid_ = false;           // the value in the panel
  bool writing_ = false;
  wxStaticText* problem_ = nullptr;
  wxSearchCtrl* search_ = nullptr;
  wxCheckBox* all_ = nullptr;
  wxDataViewListCtrl* list_ = nullptr;
  ExifValuePanel* value_ = nullptr;
  wxStaticText* place_ = nullptr;
  wxHyperlinkCtrl* map_ = nullptr;
  const std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
  Background work_;  // must be last, so that it ends first
};

// The command: edits the frame's selected files.
void EditExifOfSelection(Shell& shell);
// Call after files were written: open editors show their new values.
void RefreshExifEditors();

}  // namespace fotomill::desktop
