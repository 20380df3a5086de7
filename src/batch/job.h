#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "batch/progress_box.h"
#include "catalog/history/file_history.h"
#include "catalog/thumbnails/picture_changes.h"
#include "core/fixed_text.h"
#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/encode_options.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "processing/faces/face_options.h"
#include "processing/palette/reduce.h"
#include "texts/texts.h"

namespace fotomill {

class Prompts;

// What to do if an output exists. Answers to the overwrite prompt change it.
struct OverwritePolicy {
  bool prompt = true;    // ask; false: replace
  bool keepBoth = true;  // answer to prompts that cannot be shown: numbered variant
  bool recycle = false;  // move replaced files to the trash
  bool previews = true;  // show them in the prompt
  bool skip = false;     // skip the file without asking
};

// Functions with a prefix for output names: the Prefix keys.
enum class PrefixedFunction {
  Annotate,
  Catalog,
  Crop,
  Duplicate,
  Effects,
  Filter,
  Matt,
  SocialMedia,
  Transform,
  Watermark,
  Supercompressor,
};
inline constexpr size_t kPrefixedFunctionCount = 11;

// Options for naming outputs.
struct NamingOptions {
  int32_t extensionCase = 0;  // ExtensionCaseStyle
  bool askName = false;       // PromptForDestName
  bool skipNames = false;     // the user chose to skip all files that need a name
  bool beside = false;        // DestForceSourceDir: write every output beside its source
  bool askPassword = false;   // PasswordProtect
  // WarnDestinationWrite: ask about the format before writing anything
  bool confirmFormat = true;
  int32_t firstVariant = 1, lastVariant = INT32_MAX;
  // By number of the function; including blanks.
  std::array<FixedText<32>, kPrefixedFunctionCount> prefixes = {};

  std::string_view PrefixOf(PrefixedFunction function) const {
    return prefixes[static_cast<size_t>(function)].view();
  }
  // The same by the number of the function in the file history; empty for functions without a
  // prefix.
  std::string_view PrefixOf(FileFunction function) const;
};

// Values that users can change during a job and that apply to later jobs as well: the check boxes
// of the overwrite prompt, 0 or 1, and the first number of the next sequential rename.
enum class Remembered {
  PromptBeforeOverwrite,
  OverwriteKeepBoth,
  OverwriteRecycle,
  OverwritePreviews,
  NextRenameNumber
};

// The progress of a sequential rename.
struct SequentialRenameState {
  uint32_t number = 1;  // to try next
  int32_t digits = 4;
  PathText baseName;
};

// The state of a running function: its request and its results. NewBatchJob creates jobs with the
// user's settings; a default job has built-in defaults, no prefixes, and saves nothing. Belongs to
// the thread that runs the batch.
struct BatchJob {
  // Abort: set by the button of the job's progress box, or by its owner. Functions poll its token
  // between files, codecs between rows; current work is canceled or finished, no new work is
  // started. A request to exit the program stops all jobs.
  StopSource stop;
  PathText source;                  // current file
  int32_t formatIndex = kNoFormat;  // of the outputs
  std::string extension;  // of the outputs, without dot; empty: the format's default. Needed for
                          // plug-in formats, whose row may be reused for another one meanwhile
  std::string destinationFolder;    // empty: beside the source
  ProgressBox* box = nullptr;       // may be null; not owned
  Prompts* prompts = nullptr;       // null: prompting is not possible; not owned
  bool errors = false;              // a file failed
  bool noSummary = false;           // omit the closing count line
  // the overwrite prompt is suppressed and counts as answered with OK
  bool applyToRest = false;
  uint32_t catalogPage = 0;
  SequentialRenameState rename;
  bool filesChanged = false;  // a file was renamed or written; browsers must refresh

  OverwritePolicy overwrite;
  NamingOptions naming;
  ReadOptions read;      // of sources
  EncodeOptions encode;  // of outputs
  FaceOptions faces;     // for operations that detect faces
  ReduceOptions reduction;  // for outputs whose format supports fewer colors
  ProgressSettings boxSettings;
  // FileHistoryFunctions: a bit for each function to record
  uint32_t historyFunctions = ~0u;
  bool writeComments = false;  // to files of plug-in formats
  // ExifAdjustOrientation: turn pictures if their orientation tag gets lost
  bool turnsUpright = true;
  // Extensions of formats for which all pages of a source go into one file by default:
  // MultipleImageGIF, IconCompleteStack
  std::vector<std::string_view> everyPage;
  // Saves a value permanently. Called on the thread that runs the batch; empty: do not save.
  std::function<void(Remembered what, int32_t value)> remember = {};
  ProgressModel progress;
  uint32_t writeAborts = 0;  // files skipped because all numbered variants are taken
  // for the file history, on the main thread: UpdateFileHistory(job.uses)
  std::vector<FileUse> uses;
  // files written, renamed or replaced, whose database records are to be marked at the end
  std::vector<PictureChange> changes;
};

// The result for one file.
struct FileOutcome {
  std::string source = {};
  // Ok: path of the output, also in a dry run. Skipped: the existing file
  std::string destination = {};
  Status status = Status::Ok;
  // a sentence printed after the message; may be empty
  std::string hint = {};
  bool skipped = false;      // skipped by choice, or because no name was free; not a failure
  bool replaced = false;     // an existing file was replaced
  std::string output = {};   // label of the output, if the source has several
  RecordedText note = {};    // a remark, not a failure; may be empty
  RecordedText detail = {};  // details for --verbose, a sentence; may be empty
};

}  // namespace fotomill
