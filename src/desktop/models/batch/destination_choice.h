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
  bool further = false;     // not in the destination list, which comes first
};
// All writable formats: the destination list in registry order, then animated and other formats,
// then those of plug-ins.
std::vector<DestinationFormat> DestinationFormats();
// The initial format of the step, given at least one: the last one used (LastFormatSelected), or
// DefaultFileExtension if UseDefaultDestFormat is on or none was used yet.
size_t FirstFormat(const std::vector<DestinationFormat>& formats);

// The user's choices in the destination dialog.
struct DestinationChoice {
  std::string extension;
  std::string folder;  // empty: beside each source
  bool reduce = true;  // reduce colors if the format supports fewer
  bool autoOrient = true;
  bool keepMetadata = true;
  std::string comment = {};  // of all outputs; empty: keep the source's comment
  std::string step = {};     // a recipe applied to every picture; empty: none
  std::string recipe = {};   // else a recipe of the library; empty: none
  std::string resize = {};   // a step applied after it; empty: none
  std::string name = {};     // pattern with macros, without extension; empty: as the source
  // for formats with a quality, 1 to 100; 0: from the settings
  int32_t quality = 0;
  uint64_t mostBytes = 0;  // maximum file size, instead of a quality; 0: none
};

// The recipe step for a size as people type it: "1600x1200", "1600", "50%"; empty for an empty
// text. False if it is none.
[[nodiscard]] bool ResizeStep(const std::string& typed, std::string& step);

// The choice of the last time, except format and folder.
DestinationChoice LastChoice();

// Recently used folders, latest first; `shown`,
// the browser's folder, is the built-in choice.
std::vector<std::string> RecentDestinations(const std::string& shown);
// Saves a choice for the next time: format, folder, recipe and name. Does not change
// DefaultFileExtension.
void KeepChoice(const DestinationChoice& choice, const std::string& shown);

// The contents of one window of the destination step.
enum class DestinationPart { Format, Folder, Both };
// The parts to show, in order: both together with DestinationWindowCombined; no folder without
// PromptForDestination.
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

// Whether each output of a recipe has a format; the choice's own is then not used.
bool RecipeNamesFormats(const std::string& recipe);

// A job for a valid choice, ignoring DestForceSourceDir.
BatchJob JobFor(const DestinationChoice& choice);

// How that job processes each picture; the choice must be valid.
BatchFunction FunctionFor(const DestinationChoice& choice, const BatchJob& job);

}  // namespace fotomill::desktop
