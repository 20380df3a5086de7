#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "batch/run.h"
#include "batch/rewrite/turn_file.h"

namespace fotomill {

// What is done to every file of a selection that is turned.
struct TurnFunction {
  TurnRequest request;
  // each file is replaced; otherwise it is written to the job's destination folder under its own
  // name
  bool inPlace = false;
  std::string out = {};   // not empty: the whole path of the output of a selection of one
  bool keepTree = false;  // the folders of the selection are recreated there
  uint32_t jobs = 0;      // number of parallel jobs; 0: one per core
  // Called on any thread before a file is replaced in place; false: it is left alone, because no
  // copy could be kept.
  std::function<bool(const std::string& path)> keepPrevious = {};
  // called likewise as soon as that was done
  std::function<void(const std::string& path)> replaced = {};
};

// Turns a selection: opens the job's progress box, reports every file in selection order, finishes
// the box. Ok, or FunctionCancelled when the box cannot be shown.
Status RunTurn(std::span<const BatchFile> files, const TurnFunction& function, BatchJob& job);

}  // namespace fotomill
