#pragma once

#include <optional>
#include <span>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/write_options.h"
#include "platform/files.h"
#include "platform/held_file.h"
#include "texts/texts.h"

namespace fotomill {

// The result for one file.
struct RewrittenFile {
  Status status = Status::Ok;
  std::string hint = {};   // to a failure, as a sentence
  RecordedText note = {};  // what was done if not as usual
  bool changed = false;    // false: nothing was written, the file is so already
};

// How a file is rewritten: to another one, or in place.
struct RewriteRequest {
  bool keepTime = false;  // the new file has the time of the old one
  bool dryRun = false;    // nothing is written; the result is that of a run
  StopToken stop = {};    // ends the work with FunctionCancelled (4)
};

// A file that is made from another one or takes its place. Nothing is lost: the old file stays
// until the new one is complete, and where another program changes it meanwhile.
class FileRewrite {
 public:
  // All of them must outlive it; `options` say what to do if the destination exists.
  FileRewrite(const std::string& source, const std::string& destination,
              const RewriteRequest& request, const WriteOptions& options)
      : source_(source), destination_(destination), request_(request), options_(options) {}

  // To be called before the source is read: takes it as it is now. ErrorCreatingFile (10) where it
  // cannot be held.
  Status Begin();
  // Writes the new file from its parts; `same` says that they are the old file. An unchanged file
  // is copied, unless source and destination are the same. Sets `changed` and the hint of the
  // result.
  Status Write(std::span<const std::span<const uint8_t>> parts, bool same);
  // Fails with a hint.
  Status Fail(Status status, std::string hint);

  RewrittenFile result;

 private:
  Status KeepTime();
  std::string CannotCreate() const;

  const std::string &source_, &destination_;
  const RewriteRequest& request_;
  const WriteOptions& options_;
  platform::HeldFile held_;    // the file to be replaced
  platform::FileStamp stamp_;  // of the source when it was not read yet
  std::optional<platform::ExactTime> time_;
};

}  // namespace fotomill
