#pragma once

#include <wx/dialog.h>

#include <string>

#include "batch/prompts.h"

class wxTextCtrl;

namespace fotomill::desktop {

// The prompt for the name of an output (PromptForDestName): a field for the name, the format's
// extension beside it, and ways out of the question for this file, for all, and out of the batch.
class NameDialog : public wxDialog {
 public:
  NameDialog(wxWindow* parent, const NameQuestion& question);
  // After ShowModal.
  NameAnswer Answer() const;
  bool Aborts() const { return aborts_; }  // the batch is to end

 private:
  void Browse();

  const NameQuestion question_;
  const std::string folder_;  // of the name that is offered
  wxTextCtrl* name_ = nullptr;
  bool skipRest_ = false, aborts_ = false;
};

}  // namespace fotomill::desktop
