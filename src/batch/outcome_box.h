#pragma once

#include <vector>

#include "batch/job.h"
#include "batch/progress_box.h"

namespace fotomill {

// Records the outcomes of a run instead of showing them, such as those of a dry run.
class OutcomeBox : public ProgressBox {
 public:
  std::vector<FileOutcome> outcomes;
  bool Open(const ProgressModel&) override { return true; }
  void ShowLine(const ProgressLine&, const FileOutcome* outcome) override {
    if (outcome != nullptr) outcomes.push_back(*outcome);
  }
  void ShowStatus(const std::string&) override {}
  void StayOpen(const ProgressModel&) override {}
  void Close(const ProgressModel&) override {}
};

}  // namespace fotomill
