#pragma once

#include <wx/dialog.h>
#include <wx/timer.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/thumbnails/upkeep.h"
#include "desktop/windows/widgets/background.h"

class wxCheckBox;
class wxGauge;
class wxListBox;
class wxRadioBox;
class wxStaticText;

namespace fotomill::desktop {

// Compacts a thumbnail database: choice, progress, result.
class CompactionBox : public wxDialog {
 public:
  CompactionBox(wxWindow* parent, const std::string& folder);

 private:
  void Begin();
  void Look();  // updates the progress
  void UpdateControls();

  const std::string paths_[2];  // of the global and the folder's database
  wxRadioBox* which_ = nullptr;
  wxStaticText* facts_ = nullptr;
  wxCheckBox* purge_ = nullptr;
  wxGauge* gauge_ = nullptr;
  wxStaticText* outcome_ = nullptr;
  wxTimer timer_;
  std::unique_ptr<DatabaseCompaction> compaction_;
};

// Lists orphaned thumbnail files, and deletes them on request.
class CleanUpBox : public wxDialog {
 public:
  CleanUpBox(wxWindow* parent, const std::string& folder);

 private:
  void Search();
  void Found();
  void Delete();

  const std::string folder_;
  std::vector<std::string> orphans_;
  wxCheckBox* below_ = nullptr;
  wxListBox* list_ = nullptr;
  wxStaticText* outcome_ = nullptr;
  Background work_;  // must be last, so that it ends first
};

}  // namespace fotomill::desktop
