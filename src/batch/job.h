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

// What happens to an output whose name is taken. Answers of the overwrite prompt change it.
struct OverwritePolicy {
  bool prompt = true;    // ask; without it the file that is there is replaced
  bool keepBoth = true;  // the answer to prompts that cannot be shown: a numbered variant
  bool recycle = false;  // a file that is replaced goes to the recycle bin
  bool previews = true;  // in the prompt
  bool skip = false;     // leave out the file, without a question
};

// The functions that put something in front of the names of their outputs: the Prefix keys.
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

// How outputs get their names.
struct NamingOptions {
  int32_t extensionCase = 0;  // ExtensionCaseStyle
  bool askName = false;       // PromptForDestName
  bool skipNames = false;     // files whose name would be asked are left out: the user said so
  bool beside = false;        // DestForceSourceDir: every output is beside its source
  bool askPassword = false;   // PasswordProtect
  // WarnDestinationWrite: the format is asked about before anything is written
  bool confirmFormat = true;
  int32_t firstVariant = 1, lastVariant = INT32_MAX;
  // What they put there, by number of the function; blanks belong to it.
  std::array<FixedText<32>, kPrefixedFunctionCount> prefixes = {};

  std::string_view PrefixOf(PrefixedFunction function) const {
    return prefixes[static_cast<size_t>(function)].view();
  }
  // The same by the number under which files go into the history; empty for functions that put
  // nothing there.
  std::string_view PrefixOf(FileFunction function) const;
};

// What holds for later jobs as well once the user has changed it during one: the check boxes of the
// overwrite prompt, 0 or 1, and the number that the next sequential rename begins with.
enum class Remembered {
  PromptBeforeOverwrite,
  OverwriteKeepBoth,
  OverwriteRecycle,
  OverwritePreviews,
  NextRenameNumber
};

// How far a sequential rename has counted.
struct SequentialRenameState {
  uint32_t number = 1;  // of the next try
  int32_t digits = 4;
  PathText baseName;
};

// The state of a running function: its request and its results. NewBatchJob creates jobs with the
// user's settings; a plain job has the built-in defaults, adds no prefixes, and stores nothing.
// Belongs to the thread that runs the batch.
struct BatchJob {
  // Abort: set by the button of the job's own progress box, or by its owner. Functions ask its
  // token between files and codecs between rows; what is in work is given up or finished, nothing
  // new is begun. Whoever asks the program to end stops every job.
  StopSource stop;
  PathText source;                  // the file in work
  int32_t formatIndex = kNoFormat;  // of the outputs
  std::string extension;  // of the outputs, without dot; empty: the format's own. A plug-in
                          // format's has to be kept, as its row may serve another one meanwhile
  std::string destinationFolder;    // empty: beside the source
  ProgressBox* box = nullptr;       // or none; not owned
  Prompts* prompts = nullptr;       // none: no one can be asked; not owned
  bool errors = false;              // a file failed
  bool noSummary = false;           // no closing count line
  // the overwrite prompt is not shown and counts as answered with OK
  bool applyToRest = false;
  uint32_t catalogPage = 0;
  SequentialRenameState rename;
  bool filesChanged = false;  // a file was renamed or written: browsers must refresh

  OverwritePolicy overwrite;
  NamingOptions naming;
  ReadOptions read;      // of sources
  EncodeOptions encode;  // of outputs
  FaceOptions faces;     // of operations that look for faces
  ReduceOptions reduction;          // of outputs whose format takes fewer colors
  ProgressSettings boxSettings;
  // FileHistoryFunctions: a bit for each function whose files are recorded
  uint32_t historyFunctions = ~0u;
  bool writeComments = false;       // into files of plug-in formats
  // ExifAdjustOrientation: pictures are turned where their orientation tag gets lost
  bool turnsUpright = true;
  // Extensions of formats into whose files every page of a source goes where no page was asked for:
  // MultipleImageGIF, IconCompleteStack
  std::vector<std::string_view> everyPage;
  // Keeps a value permanently. Called on the thread that runs the batch; none: nothing is kept.
  std::function<void(Remembered what, int32_t value)> remember = {};
  ProgressModel progress;
  uint32_t writeAborts = 0;   // files left out because no numbered variant was free
  // for the file history, which belongs to the main thread: UpdateFileHistory(job.uses)
  std::vector<FileUse> uses;
  // files that were written, renamed or replaced; their database records are marked at the end
  std::vector<PictureChange> changes;
};

// What became of one file.
struct FileOutcome {
  std::string source = {};
  // Ok: where its output is, or would be in a dry run. Skipped: the file that is in the way
  std::string destination = {};
  Status status = Status::Ok;
  // a sentence that follows the message; may be empty
  std::string hint = {};
  bool skipped = false;   // left out by choice or for want of a name; not a failure
  bool replaced = false;  // the output took the place of a file
  std::string output = {};  // which of several outputs of its source, by name
  RecordedText note = {};   // a remark that is not a failure; empty if there is none
  RecordedText detail = {};  // what was done that the user need not know, as a sentence; or empty
};

}  // namespace fotomill
