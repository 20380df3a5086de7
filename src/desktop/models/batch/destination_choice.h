#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "batch/job.h"
#include "batch/run.h"

namespace fotomill::desktop {

// The formats of the destination step, and what the user chose there last.
struct DestinationFormat {
  std::string extension;    // lower case, without dot
  std::string description;  // "(PNG) Portable Network Graphics"
  int32_t row = kNoFormat;  // of the registry; the spare row for plug-in formats
};
// What can be written, in the order of the registry, plug-in formats last.
std::vector<DestinationFormat> DestinationFormats();
// Which of these formats, at least one, the step begins with: the last one used
// (LastFormatSelected), or DefaultFileExtension if UseDefaultDestFormat is on or none was used yet.
size_t FirstFormat(const std::vector<DestinationFormat>& formats);

// What the destination step asks for.
struct DestinationChoice {
  std::string extension;
  std::string folder;  // empty: beside each source
  bool reduce = true;  // colors of pictures that are too deep for the format
  bool autoOrient = true;
  bool keepMetadata = true;
  std::string comment = {};  // of all outputs; empty: each has that of its source
  std::string step = {};     // of a recipe: applied to every picture; empty: none
};

// The folders to offer, the last used first; `shown`, the folder of the browser, is the built-in
// choice.
std::vector<std::string> RecentDestinations(const std::string& shown);
// Keeps a choice for the next time: format, folder or none. DefaultFileExtension stays as it is.
void KeepChoice(const DestinationChoice& choice, const std::string& shown);

// What the destination step asks for at a time.
enum class DestinationPart { Format, Folder, Both };
// The parts to ask for, one after the other: both at once with DestinationWindowCombined; without
// PromptForDestination no folder.
std::vector<DestinationPart> DestinationParts();

// What is wrong with a choice, a whole sentence; empty when nothing is.
std::string DestinationProblem(const DestinationChoice& choice);

// The folder that a typed one means, as a whole path: relative ones are inside `shown`, the folder
// of the browser. Empty stays empty.
std::string WholeFolder(const std::string& typed, const std::string& shown);

// What the destination step tells before anything is written.
struct DestinationOutlook {
  std::string first;       // path of the first file's output, free or not
  uint64_t freeSpace = 0;  // bytes where it goes; 0: unknown
  size_t existing = 0;     // outputs whose name is taken, among the first kMostLookedUp
};
inline constexpr size_t kMostLookedUp = 500;
// Of a choice without a problem, for at least one file.
DestinationOutlook OutlookOf(const DestinationChoice& choice,
                             const std::vector<std::string>& files);

// A job that writes to the choice, whatever DestForceSourceDir says. The choice has no problem.
BatchJob JobFor(const DestinationChoice& choice);

// What that job does to every picture of the choice.
BatchFunction FunctionFor(const DestinationChoice& choice, const BatchJob& job);

}  // namespace fotomill::desktop
