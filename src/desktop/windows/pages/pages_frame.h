#pragma once

#include <wx/cmndata.h>
#include <wx/frame.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/pages/page_order.h"
#include "desktop/models/pages/page_preview.h"

class wxButton;
class wxCheckBox;
class wxListBox;
class wxStaticText;

namespace fotomill::desktop {

class OptionPanel;
class PageCanvas;
class Shell;

// The Print and pages window: puts pictures on pages of any kind, shows them as they are printed,
// prints them or saves them as PDF.
class PagesFrame : public wxFrame {
 public:
  // Starts with a kind of pages. Deletes itself when closed.
  PagesFrame(Shell& shell, const std::vector<std::string>& files, const char* kind);
  ~PagesFrame() override;

 private:
  wxWindow* BuildSide(wxWindow* parent);
  wxWindow* BuildPreview(wxWindow* parent);
  wxSizer* BuildButtons(wxWindow* parent);
  void ShowKind();
  void OrderChanged();
  void RequestPage();
  void PageCame();
  void GoTo(size_t page);
  void StepPage(int by);
  void UpdateControls();
  wxString StatusLine() const;
  void SetPreview(bool on);
  void AskPaper();
  void Print();
  void Save();
  void SavePdf();
  void BuildGallery();
  bool MakePlan(PagePlan& plan);  // false after a message
  void OnCharHook(wxKeyEvent& event);
  bool PageKey(int key, bool control);

  Shell& shell_;
  const std::vector<BatchFile> files_;
  PageOrder order_;
  wxPrintData printData_;
  PageRunOptions options_;    // of the latest order without mistakes
  uint64_t orderNumber_ = 0;  // of these options; 0: none yet
  size_t page_ = 0;
  bool waits_ = false;    // for a page
  std::string problems_;  // the last ones in the log
  wxListBox* kinds_ = nullptr;
  OptionPanel* values_ = nullptr;
  PageCanvas* canvas_ = nullptr;
  wxStaticText* place_ = nullptr;
  wxButton *first_ = nullptr, *previous_ = nullptr, *next_ = nullptr, *last_ = nullptr;
  wxCheckBox* preview_ = nullptr;
  wxButton *setup_ = nullptr, *save_ = nullptr, *print_ = nullptr;
  std::unique_ptr<PagePreview> maker_;
};

// Commands of the frame: the window for its selection, with a kind of pages.
void PrintSelection(Shell& shell, const char* kind);

}  // namespace fotomill::desktop
