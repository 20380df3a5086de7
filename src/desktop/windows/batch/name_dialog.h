#pragma once

#include <wx/dialog.h>

#include <string>

#include "batch/prompts.h"

class wxTextCtrl;

namespace fotomill::desktop {

// The prompt for the name of an output (PromptForDestName): a field for the name, the format's
// extension beside it, and buttons to skip this file or all files, or to end the batch.
class NameDialog : public wxDialog {
 public:
  NameDialog(wxWindow* parent, const NameQuestion& question);
  // After ShowModal.
  NameAnswer Answer() const;
  bool Aborts() const { return aborts_; }  // end the batch

 private:
  void Browse();

  const NameQuestion question_;
  const std::string folder_;  // of the suggested name
  wxTextCtrl* name_ = nullptr;
  bool skipRest_ = false, aborts_ = false;
};

}  // namespace fotomill::desktop
