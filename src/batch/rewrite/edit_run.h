#pragma once

#include <functional>
#include <map>
#include <memory>
#include <span>
#include <string>

#include "batch/rewrite/edit_file.h"
#include "batch/run.h"

namespace fotomill {

// How to edit the files of a selection in place.
struct EditFunction {
  EditRequest request;
  // recipes of files that have their own; the others get that of the request
  std::map<std::string, std::shared_ptr<const Recipe>> recipes = {};
  bool backups = false;  // keep a copy of each file beside it (CreateBackups)
  uint32_t jobs = 0;     // number of parallel jobs; 0: one per core
  // Called on any thread before a file is replaced; return false to leave it unchanged, if no copy
  // could be kept.
  std::function<bool(const std::string& path)> keepPrevious = {};
  // called right after replacing it
  std::function<void(const std::string& path)> replaced = {};
};

// Edits a selection: opens the job's progress box, reports every file in selection order, closes
// the box. Ok, or FunctionCancelled if the box cannot be shown.
Status RunEdit(std::span<const BatchFile> files, const EditFunction& function, BatchJob& job);

}  // namespace fotomill
