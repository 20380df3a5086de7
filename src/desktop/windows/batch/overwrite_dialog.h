#pragma once

#include <wx/dialog.h>

#include "batch/prompts.h"
#include "desktop/models/batch/batch_thread.h"
#include "desktop/windows/widgets/background.h"

class wxCheckBox;
class wxTextCtrl;

namespace fotomill::desktop {

// The overwrite prompt: what is there beside what would take its place, a field for another name,
// and what to do.
class OverwriteDialog : public wxDialog {
 public:
  // The question must outlive it.
  OverwriteDialog(wxWindow* parent, const OverwriteQuestion& question,
                  OverwritePreviewMaker makePreview);
  // After ShowModal.
  OverwriteAnswer Answer() const;

 private:
  wxSizer* MakePanes(const OverwritePreview& preview);
  void ShowPreviews();
  void AddPanes();

  const OverwriteQuestion& question_;
  const OverwritePreviewMaker makePreview_;
  OverwritePreview preview_;
  wxTextCtrl* name_ = nullptr;
  wxCheckBox* notify_ = nullptr;
  wxCheckBox* keepBoth_ = nullptr;
  wxCheckBox* applyToRest_ = nullptr;
  wxCheckBox* recycle_ = nullptr;
  wxCheckBox* previews_ = nullptr;
  wxSizer* panes_ = nullptr;  // none until previews are wanted
  size_t panesPlace_ = 0;     // in the window's sizer
  bool skipRest_ = false;
  Background work_;  // last, so that it ends first
};

}  // namespace fotomill::desktop
