#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "batch/run.h"
#include "batch/turn_file.h"

namespace fotomill {

// What is done to every file of a selection that is turned.
struct TurnFunction {
  TurnRequest request;
  bool inPlace = false;   // each file is replaced; otherwise it goes into the job's destination folder under its own name
  bool keepTree = false;  // folders of the selection are made again there
  uint32_t jobs = 0;      // files in work at a time; 0: one a core
  bool dryRun = false;    // nothing is written
  // Called on any thread before a file is replaced in its place; false: it stays, as it could not be kept for later.
  std::function<bool(const std::string& path)> keepPrevious = {};
  std::function<void(const std::string& path)> replaced = {};  // called likewise as soon as that was done
};

// Turns a selection: opens the job's progress box, reports every file in selection order, finishes the box. Ok, or
// FunctionCancelled when the box cannot be shown.
Status RunTurn(std::span<const BatchFile> files, const TurnFunction& function, BatchJob& job);

}  // namespace fotomill
