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

// Compaction of a thumbnail database: which one, how far it is, what became of it.
class CompactionBox : public wxDialog {
 public:
  CompactionBox(wxWindow* parent, const std::string& folder);

 private:
  void Begin();
  void Look();  // how far it is
  void UpdateControls();

  const std::string paths_[2];  // of the global and the folder's own database
  wxRadioBox* which_ = nullptr;
  wxStaticText* facts_ = nullptr;
  wxCheckBox* purge_ = nullptr;
  wxGauge* gauge_ = nullptr;
  wxStaticText* outcome_ = nullptr;
  wxTimer timer_;
  std::unique_ptr<DatabaseCompaction> compaction_;
};

// Thumbnail files whose pictures are gone: lists them, and deletes them when told to.
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
  Background work_;  // last, so that it ends first
};

}  // namespace fotomill::desktop
