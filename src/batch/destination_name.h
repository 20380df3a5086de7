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

// The extension of an output, without its dot: the format's own in lower case, then cased letter by
// letter after the source's extension as `style` says: 0 like the letter in its place, 1 upper, 2
// lower. Letters beyond the source's extension, and places where either has no letter, stay as they
// are.
std::string CasedExtension(std::string_view formatExtension, std::string_view sourceExtension,
                           int32_t style);

// Asks before anything is written: whether to write files of this format, and whether to create a
// missing destination folder (if the outputs go `intoFolder`). False if the user declines.
bool IsDestinationWanted(const BatchJob& job, bool intoFolder);

// The extension of the job's outputs, as the format spells it.
std::string_view ExtensionOfFormat(const BatchJob& job);

// The planned path of a source's output, free or not: the job's destination folder and `below` (or
// the source's folder, if there is none or the rules say so), prefix, base name, dot and extension.
std::string PlannedDestination(const std::string& source, std::string_view below,
                               std::string_view prefix, const BatchJob& job);

// The same for one of several outputs of a source.
struct OutputPlace {
  std::string_view extension;  // as the format has it
  // folder beneath the job's destination folder, or beneath the source's where it has none
  std::string_view below;
  std::string_view subfolder;  // and beneath that one
  std::string_view base;       // name without extension
};
// As above, for one of several outputs.
std::string PlannedDestination(const std::string& source, const OutputPlace& place,
                               const BatchJob& job);

// A destination without drive and folder, put into the job's destination folder; others stay.
// nullopt when that gives 261 characters or more.
std::optional<std::string> CompletedDestination(const std::string& destination,
                                                std::string_view folder);

// The decision about an output's name.
struct Destination {
  std::string path = {};
  bool replace = false;    // a file of that name is to be replaced
  bool recycle = false;    // and goes to the recycle bin
  bool asked = false;      // because the user said so for this very file
  std::string password = {};  // empty: none
  bool elsewhere = false;  // the user chose another folder, which is not created
  bool taken = false;      // the name was not free
  std::string shared = {};  // the path before it was numbered, where another file of the run has it
  VariantSearch search = VariantSearch::Found;  // anything else: skipped because no name was found
  int32_t formatIndex = kNoFormat;  // of the output; none: the job's
  std::string extension = {};       // of the output, as the format has it; empty: the job's
};

// The "path" of outputs that go to the clipboard, and the hint of a file for which no numbered
// variant was free.
inline constexpr std::string_view kClipboardName = "Clipboard";
inline constexpr std::string_view kWriteAborted =
    TrLater("Unable to create a new file - write aborted.");

// Whether an output is written under its settled name, or its file is left out.
enum class DestinationAnswer : int32_t { Write = 1, Skip = 2 };

// Decides the name of an output, whose planned path is in `destination`: asks for it if the
// settings say so, and what to do if the file exists. `title` says what the name is for, `picture`
// is the new picture for previews; both are optional. `variant` makes numbered variants.
using VariantMaker = std::function<VariantSearch(std::string& path)>;
// Settles `destination` in place; Skip leaves its file out.
DestinationAnswer MakeDestinationName(Destination& destination, const std::string& source,
                                      std::string_view title, BatchJob& job, const TakenTest& taken,
                                      const VariantMaker& variant,
                                      const PictureRecord* picture = nullptr);

// Records in an outcome why its file has no name: skipped with ErrorCreatingFile if all variants
// are taken, which counts as a write abort; otherwise failed with InvalidDestination (the search
// was given up) or ErrorCreatingFile (the system cannot tell).
void SayNoName(const Destination& destination, FileOutcome& outcome);

// Says why an output is numbered: the path was free, but another file of the run has it.
RecordedText SharedNameNote(const std::string& path);

// Adds to an outcome's note which attributes of the replaced file the new one does not have; takes
// them from the platform.
void NoteLostAttributes(FileOutcome& outcome);

// Whether the user is asked about existing files.
bool AsksAboutCollisions(const BatchJob& job);
// The decision about an existing file without asking.
DestinationAnswer SettleUnasked(Destination& destination, const OverwritePolicy& policy,
                                bool applyToRest, const VariantMaker& variant);

}  // namespace fotomill
