#pragma once

#include <wx/dialog.h>

#include "batch/prompts.h"
#include "desktop/models/batch/batch_thread.h"

class wxCheckBox;
class wxTextCtrl;

namespace fotomill::desktop {

// The overwrite prompt: what is there beside what would take its place, a field for another name,
// and what to do.
class OverwriteDialog : public wxDialog {
 public:
  OverwriteDialog(wxWindow* parent, const OverwriteQuestion& question,
                  const OverwritePreview& preview);
  // After ShowModal.
  OverwriteAnswer Answer() const;

 private:
  wxSizer* MakePreviews(const OverwriteQuestion& question, const OverwritePreview& preview);

  wxTextCtrl* name_ = nullptr;
  wxCheckBox* notify_ = nullptr;
  wxCheckBox* keepBoth_ = nullptr;
  wxCheckBox* applyToRest_ = nullptr;
  wxCheckBox* recycle_ = nullptr;
  wxCheckBox* previews_ = nullptr;
  wxSizer* panes_ = nullptr;
  bool skipRest_ = false;
};

}  // namespace fotomill::desktop
