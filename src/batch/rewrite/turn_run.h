#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "batch/run.h"
#include "batch/rewrite/turn_file.h"

namespace fotomill {

// How to process the files of a selection that are turned.
struct TurnFunction {
  TurnRequest request;
  // replace each file; otherwise write it to the
  // job's destination folder under the same name
  bool inPlace = false;
  std::string out = {};   // not empty: the full output path for a selection of one file
  bool keepTree = false;  // recreate the folders of the selection there
  uint32_t jobs = 0;      // number of parallel jobs; 0: one per core
  // Called on any thread before a file is replaced in place; return false to leave it unchanged, if
  // no copy could be kept.
  std::function<bool(const std::string& path)> keepPrevious = {};
  // called right after replacing it
  std::function<void(const std::string& path)> replaced = {};
};

// Turns a selection: opens the job's progress box, reports every file in selection order, closes
// the box. Ok, or FunctionCancelled if the box cannot be shown.
Status RunTurn(std::span<const BatchFile> files, const TurnFunction& function, BatchJob& job);

}  // namespace fotomill
