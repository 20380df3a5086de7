#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// The texts of the overwrite prompt.
inline constexpr std::string_view kOverwriteTitle = TrLater("Overwrite File");
// The text of the prompt.
inline constexpr std::string_view kOverwriteText = TrLater(
    "Click on OK to overwrite the existing file.\nChange the file name and click on Ok for a new "
    "name.\n"
    "Click on Cancel to skip this file.");
inline constexpr std::string_view kOverwriteHelpPage = "OVERWRITE";  // of the overwrite prompt
// Check box: ask again for later files.
inline constexpr std::string_view kNotifyText =
    TrLater("Notify me the next time I'm about to overwrite a file");
inline constexpr std::string_view kNotifyNote =
    TrLater("Note: if you disable this option, it can be re-enabled later in the Setup window.");
// Check box: write a numbered variant.
inline constexpr std::string_view kKeepBothText = TrLater("Keep both files");
// Check box: apply the answer to the rest of the job.
inline constexpr std::string_view kApplyToRestText = TrLater("Apply to rest of batch");
// Check box: move replaced files to the trash.
inline constexpr std::string_view kRecycleText = TrLater("Move ovewritten files to recycle bin");
// Check box: show both pictures.
inline constexpr std::string_view kPreviewsText = TrLater("Show previews");

// The five check boxes of the overwrite prompt.
struct OverwriteChecks {
  bool notify = true;        // PromptBeforeOverwrite
  bool keepBoth = true;      // OverwriteKeepBoth
  bool applyToRest = false;  // for this batch only
  bool recycle = false;      // OverwritePromptRecycle
  bool previews = true;      // OverwritePromptPreviews
  bool operator==(const OverwriteChecks&) const = default;
};

// Data for the overwrite prompt.
struct OverwriteQuestion {
  std::string source;                      // the file being processed
  std::string path;                        // the output, which exists
  std::string name;                        // its base name, for the File name field
  OverwriteChecks checks;                  // initial state
  // the new picture, for its preview; may be null. Valid during the call
  const PictureRecord* picture = nullptr;
  // why the last answer was rejected, a sentence; empty at first
  std::string problem;
};

// The user's decision about an existing output.
struct OverwriteAnswer {
  bool ok = false;  // false: skip this file and ignore the rest
  OverwriteChecks checks;
  std::string name;       // from the File name field: without folder and extension
  bool skipRest = false;  // if not ok: skip all existing files in this batch
};

// Data for the output name prompt.
struct NameQuestion {
  std::string title;  // purpose of the name; may be empty
  std::string source;
  std::string path;       // suggested name
  std::string extension;  // of the format, without dot
  std::string problem;    // as above
};

// The user's decision about the name of an output.
struct NameAnswer {
  bool ok = false;        // false: skip this file
  std::string name = {};  // a path; its extension is replaced
  bool skipRest = false;  // if not ok: skip all files in this batch that need a name
};

// Prompts during a batch, implemented by front ends. Called on the thread that runs the batch, in
// selection order; each call blocks until there is an answer.
class Prompts {
 public:
  virtual ~Prompts() = default;
  // Asks for the name of an output.
  virtual NameAnswer AskDestinationName(const NameQuestion& question) = 0;
  // Asks what to do about an existing output.
  virtual OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) = 0;
  // Asks for a password to protect an output; nullopt skips the file.
  virtual std::optional<std::string> AskPassword(const std::string& path) = 0;
  // "Write files to the PNG format?" False cancels the batch.
  virtual bool ConfirmFormat(const std::string& question) = 0;
  // Asks whether to create a missing destination
  // folder. False cancels the batch.
  virtual bool ConfirmNewFolder(const std::string& folder) = 0;
};

}  // namespace fotomill
