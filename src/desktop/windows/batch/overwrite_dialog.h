#pragma once

#include <wx/dialog.h>

#include "batch/prompts.h"
#include "desktop/models/batch/batch_thread.h"
#include "desktop/windows/widgets/background.h"

class wxCheckBox;
class wxTextCtrl;

namespace fotomill::desktop {

// The overwrite prompt: the existing file beside the new one, a field for another name, and
// options.
class OverwriteDialog : public wxDialog {
 public:
  // `question` must outlive this object.
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
  wxSizer* panes_ = nullptr;  // null until previews are enabled
  size_t panesPlace_ = 0;     // index in the window's sizer
  bool skipRest_ = false;
  Background work_;  // must be last, so that it ends first
};

}  // namespace fotomill::desktop
