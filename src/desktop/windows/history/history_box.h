#pragma once

#include <wx/dialog.h>

#include <string>

#include "desktop/models/history/file_history_list.h"
#include "desktop/windows/history/history_thumbnails.h"

class wxDataViewCtrl;
class wxStaticText;

namespace fotomill::desktop {

class Shell;

// The file history: recently used files, with function and time.
class FileHistoryBox : public wxDialog {
 public:
  explicit FileHistoryBox(Shell& shell);
  ~FileHistoryBox() override;

 private:
  class Lines;
  void BuildList();
  wxSizer* BuildButtons();
  void AddColumns();
  void Refill();
  void UpdateControls();
  std::vector<size_t> SelectedRows() const;
  void ViewFile();
  void ShowFolder();
  void RemoveSelected();
  void ClearAll();
  void Options();
  bool Confirm(const wxString& question, const wxString& verb);
  void KeepPlaces();

  Shell& shell_;
  FileHistoryList history_;
  bool readable_ = true;
  HistoryThumbnails thumbnails_;
  wxDataViewCtrl* list_ = nullptr;
  wxStaticText* count_ = nullptr;
  wxObjectDataPtr<Lines> lines_;
};

// Shows the settings of the file history in a dialog. True if confirmed.
bool ShowFileHistorySetup(wxWindow* parent);

}  // namespace fotomill::desktop
