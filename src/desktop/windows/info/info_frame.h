#pragma once

#include <wx/frame.h>
#include <wx/timer.h>

#include <atomic>
#include <string>
#include <vector>

#include "desktop/models/info/info_report.h"
#include "desktop/windows/widgets/background.h"

class wxListBox;
class wxSizer;
class wxStaticText;

namespace fotomill::desktop {

class Shell;
class ReportTree;

// "Get info": the facts of one file, or of several with their totals and differences. Files are
// read apart.
class InfoFrame : public wxFrame {
 public:
  InfoFrame(Shell& shell, wxWindow* parent, std::vector<std::string> paths);

 private:
  wxSizer* BuildButtons(wxWindow& panel);
  void Finished();
  void ShowChoice();  // what the list at the left has selected
  std::string WholeText() const;

  Shell& shell_;
  const std::vector<std::string> paths_;
  std::vector<FileInfo> files_;  // written apart, then read here
  std::vector<InfoSection> summary_;
  std::atomic<size_t> read_{0};
  wxTimer timer_;
  wxListBox* list_ = nullptr;  // none for one file
  wxStaticText* problem_ = nullptr;
  ReportTree* tree_ = nullptr;
  Background work_;  // last, so that it ends first
};

}  // namespace fotomill::desktop
