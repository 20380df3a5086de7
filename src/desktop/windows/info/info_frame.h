#pragma once

#include <wx/timer.h>

#include <atomic>
#include <string>
#include <vector>

#include "desktop/models/info/info_report.h"
#include "desktop/windows/widgets/background.h"
#include "desktop/windows/widgets/tool_frame.h"

class wxListBox;

namespace fotomill::desktop {

class Shell;
class ReportTree;

// "Get info": information about one file, or about several with totals and differences. Files are
// read in the background.
class InfoFrame : public ToolFrame {
 public:
  InfoFrame(Shell& shell, wxWindow* parent, std::vector<std::string> paths);

 private:
  void LayOutWith(wxWindow& report);
  void Finished();
  void ShowChoice();  // of the selected list item
  std::string WholeText() const;

  Shell& shell_;
  const std::vector<std::string> paths_;
  std::vector<FileInfo> files_;  // written by the background task, then read here
  std::vector<InfoSection> summary_;
  std::atomic<size_t> read_{0};
  wxTimer timer_;
  wxListBox* list_ = nullptr;  // null for a single file
  wxStaticText* problem_ = nullptr;
  ReportTree* tree_ = nullptr;
  Background work_;  // must be last, so that it ends first
};

}  // namespace fotomill::desktop
