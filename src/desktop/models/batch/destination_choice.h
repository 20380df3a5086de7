#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "batch/job.h"
#include "batch/run.h"

namespace fotomill::desktop {

// An output format to choose from.
struct DestinationFormat {
  std::string extension;    // lowercase, without dot
  std::string description;  // "(PNG) Portable Network Graphics"
  int32_t row = kNoFormat;  // in the registry; the spare row for plug-in formats
};
// All writable formats in registry order, plug-in formats last.
std::vector<DestinationFormat> DestinationFormats();
// Which of these formats, at least one, the step begins with: the last one used
// (LastFormatSelected), or DefaultFileExtension if UseDefaultDestFormat is on or none was used yet.
size_t FirstFormat(const std::vector<DestinationFormat>& formats);

// The user's choices in the destination dialog.
struct DestinationChoice {
  std::string extension;
  std::string folder;  // empty: beside each source
  bool reduce = true;  // reduce colors if the format supports fewer
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

// What is wrong with a choice, a sentence; empty if valid.
std::string DestinationProblem(const DestinationChoice& choice);

// Makes an entered folder absolute: relative ones are inside `shown`, the browser's folder. Empty
// stays empty.
std::string WholeFolder(const std::string& typed, const std::string& shown);

// A preview of the output.
struct DestinationOutlook {
  std::string first;       // path of the first output, existing or not
  uint64_t freeSpace = 0;  // bytes at the destination; 0: unknown
  size_t existing = 0;     // existing outputs, among the first kMostLookedUp
};
inline constexpr size_t kMostLookedUp = 500;
// For a valid choice and at least one file.
DestinationOutlook OutlookOf(const DestinationChoice& choice,
                             const std::vector<std::string>& files);

// A job for a valid choice, ignoring DestForceSourceDir.
BatchJob JobFor(const DestinationChoice& choice);

// How that job processes each picture.
BatchFunction FunctionFor(const DestinationChoice& choice, const BatchJob& job);

}  // namespace fotomill::desktop
