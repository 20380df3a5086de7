#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// The texts of the overwrite prompt.
inline constexpr std::string_view kOverwriteTitle = TrLater("Overwrite File");
// The question of the prompt.
inline constexpr std::string_view kOverwriteText = TrLater(
    "Click on OK to overwrite the existing file.\nChange the file name and click on Ok for a new "
    "name.\n"
    "Click on Cancel to skip this file.");
inline constexpr std::string_view kOverwriteHelpPage = "OVERWRITE";  // of the overwrite prompt
// Check box: later files are asked about as well.
inline constexpr std::string_view kNotifyText =
    TrLater("Notify me the next time I'm about to overwrite a file");
inline constexpr std::string_view kNotifyNote =
    TrLater("Note: if you disable this option, it can be re-enabled later in the Setup window.");
// Check box: write a numbered variant.
inline constexpr std::string_view kKeepBothText = TrLater("Keep both files");
// Check box: the answer holds for the rest of the job.
inline constexpr std::string_view kApplyToRestText = TrLater("Apply to rest of batch");
// Check box: a replaced file goes to the recycle bin.
inline constexpr std::string_view kRecycleText = TrLater("Move ovewritten files to recycle bin");
// Check box: both pictures are shown.
inline constexpr std::string_view kPreviewsText = TrLater("Show previews");

// The five check boxes of the overwrite prompt.
struct OverwriteChecks {
  bool notify = true;        // PromptBeforeOverwrite
  bool keepBoth = true;      // OverwriteKeepBoth
  bool applyToRest = false;  // of this batch; ends with it
  bool recycle = false;      // OverwritePromptRecycle
  bool previews = true;      // OverwritePromptPreviews
  bool operator==(const OverwriteChecks&) const = default;
};

// What the overwrite prompt shows.
struct OverwriteQuestion {
  std::string source;                      // the file that is being worked on
  std::string path;                        // the output, which exists
  std::string name;                        // its base name, for the File name field
  OverwriteChecks checks;                  // as they stand
  // the new picture, for its preview; null if there is none. Valid during the call
  const PictureRecord* picture = nullptr;
  // why the last answer could not be taken, a sentence; empty at first
  std::string problem;
};

// What the user decided about one output whose name is taken.
struct OverwriteAnswer {
  bool ok = false;  // false: this file is skipped and nothing else is looked at
  OverwriteChecks checks;
  std::string name;       // of the File name field: without folder and extension
  bool skipRest = false;  // not ok, and so for every collision of this batch
};

// What the prompt for the name of an output shows.
struct NameQuestion {
  std::string title;  // what the name is for; may be empty
  std::string source;
  std::string path;       // the name that is offered
  std::string extension;  // of the format, without dot
  std::string problem;    // as above
};

// What the user decided about the name of an output.
struct NameAnswer {
  bool ok = false;        // false: this file is skipped
  std::string name = {};  // a path; its extension is replaced
  bool skipRest = false;  // not ok, and so for every name of this batch
};

// What a batch asks its user. Faces implement it; every call comes from the thread that called the
// batch, blocks until there is an answer, and comes in the order of the selection.
class Prompts {
 public:
  virtual ~Prompts() = default;
  // The name of an output.
  virtual NameAnswer AskDestinationName(const NameQuestion& question) = 0;
  // What is to become of an output whose name is taken.
  virtual OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) = 0;
  // The password that protects an output; nullopt skips the file.
  virtual std::optional<std::string> AskPassword(const std::string& path) = 0;
  // "Write files to the PNG format?" False ends the batch before it begins.
  virtual bool ConfirmFormat(const std::string& question) = 0;
  // Whether a destination folder that is not there may be made. False ends the batch before it
  // begins.
  virtual bool ConfirmNewFolder(const std::string& folder) = 0;
};

}  // namespace fotomill
