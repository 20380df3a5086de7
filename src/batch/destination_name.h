#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>

#include "batch/job.h"
#include "batch/prompts.h"
#include "files/numbered_name.h"
#include "platform/existence.h"
#include "core/workers/stop_token.h"
#include "texts/texts.h"

namespace fotomill {

// The extension of an output, without dot: the format's extension in
// lowercase, with letters cased by `style`: 0 like the letter at that
// position in the source's extension, 1 upper, 2 lower. Positions beyond
// the source's extension, or where either has no letter, are not changed.
std::string CasedExtension(std::string_view formatExtension, std::string_view sourceExtension,
                           int32_t style);

// Asks before writing anything: whether to write files of this format, and whether to create a
// missing destination folder (with `intoFolder`). False if the user declines.
bool IsDestinationWanted(const BatchJob& job, bool intoFolder);

// The extension of the job's outputs, as spelled by the format.
std::string_view ExtensionOfFormat(const BatchJob& job);

// The planned path of a source's output, which may exist: the job's destination folder and `below`
// (or the source's folder, if there is none or the rules say so), prefix, base name and extension.
std::string PlannedDestination(const std::string& source, std::string_view below,
                               std::string_view prefix, const BatchJob& job);

// Name of one of several outputs of a source.
struct OutputPlace {
  std::string_view extension;  // as spelled by the format
  // folder relative to the job's destination folder, or to the source's if there is none
  std::string_view below;
  std::string_view subfolder;  // relative to that
  std::string_view base;       // name without extension
};
// As above, for one of several outputs.
std::string PlannedDestination(const std::string& source, const OutputPlace& place,
                               const BatchJob& job);

// Adds the job's destination folder to a destination without drive and folder. nullopt if the
// result has more than 260 characters.
std::optional<std::string> CompletedDestination(const std::string& destination,
                                                std::string_view folder);

// The decision on an output's name.
struct Destination {
  std::string path = {};
  bool replace = false;    // replace the existing file
  bool recycle = false;    // and move it to the trash
  bool asked = false;      // explicitly confirmed for this file
  std::string password = {};  // empty: no password
  bool elsewhere = false;  // the user chose another folder; it is not created
  bool taken = false;      // a file of that name existed
  std::string shared = {};  // the path before numbering, if another file of the run has it
  VariantSearch search = VariantSearch::Found;  // otherwise skipped, as no name was found
  int32_t formatIndex = kNoFormat;  // of the output; kNoFormat: the job's
  std::string extension = {};       // of the output, as spelled by the format; empty: the job's
};

// The "path" of outputs to the clipboard, and the hint for a file for which no numbered variant was
// free.
inline constexpr std::string_view kClipboardName = "Clipboard";
inline constexpr std::string_view kWriteAborted =
    TrLater("Unable to create a new file - write aborted.");

// Whether to write an output under its settled name, or skip its file.
enum class DestinationAnswer : int32_t { Write = 1, Skip = 2 };

// Chooses the name of an output, whose planned path is in `destination`: asks for it if the
// settings say so, and what to do if the file exists. `title` says what the name is for, `picture`
// is the new picture for previews; both are optional. `variant` creates numbered variants.
using VariantMaker = std::function<VariantSearch(std::string& path)>;
// Updates `destination` in place; Skip: do not write the file.
DestinationAnswer MakeDestinationName(Destination& destination, const std::string& source,
                                      std::string_view title, BatchJob& job, const TakenTest& taken,
                                      const VariantMaker& variant,
                                      const PictureRecord* picture = nullptr);

// Records in an outcome why there is no name: skipped with ErrorCreatingFile if all variants are
// taken, which counts as a write abort; otherwise failed with InvalidDestination (search given up)
// or ErrorCreatingFile (existence cannot be determined).
void SayNoName(const Destination& destination, FileOutcome& outcome);

// Explains why an output is numbered: the path was free, but another file of the run has it.
RecordedText SharedNameNote(const std::string& path);

// Adds a note about attributes of the replaced file that could not be copied to the new one, as
// reported by the platform.
void NoteLostAttributes(FileOutcome& outcome);

// Whether the user is asked about existing files.
bool AsksAboutCollisions(const BatchJob& job);
// The decision on an existing file without asking.
DestinationAnswer SettleUnasked(Destination& destination, const OverwritePolicy& policy,
                                bool applyToRest, const VariantMaker& variant);

}  // namespace fotomill
