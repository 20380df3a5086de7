#pragma once

#include <functional>
#include <optional>
#include <span>
#include <string>

#include "containers/file_pieces.h"
#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/picture_record.h"
#include "picture/write_options.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/held_file.h"
#include "texts/texts.h"

namespace fotomill {

// Why a picture cannot be written back to its file without loss, apart from its pixels, as a
// sentence; empty if it can.
std::string ObstacleToRewriting(const PictureRecord& picture);

// The result for one file.
struct RewrittenFile {
  Status status = Status::Ok;
  std::string hint = {};   // reason for a failure, a sentence
  RecordedText note = {};  // remark about what was done, if unusual
  bool changed = false;    // false: nothing was written, no change needed
};

// Options for rewriting a file, to another one or in place.
struct RewriteRequest {
  bool keepTime = false;  // keep the modification time
  bool dryRun = false;    // write nothing; same result as a run
  StopToken stop = {};    // cancels with FunctionCancelled (4)
  // Called before and after files other than the destination are written, which may not exist
  // before; if the first returns false, they are not.
  std::function<bool(const std::string& path)> keepPrevious = {};
  std::function<void(const std::string& path)> replaced = {};
};

// Makes a new file from the bytes of an old one; `changed` is false if they are identical. `reason`
// has details of a failure, as a sentence.
using FileMaker = std::function<Status(std::span<const uint8_t> file, FilePieces& made,
                                       bool& changed, std::string& reason)>;

// Writes a file made from another one, or replaces that. The old file is kept until the new one is
// complete, or if another program modifies it meanwhile.
class FileRewrite {
 public:
  // Arguments must outlive this object; `options` say what to do if the destination exists.
  FileRewrite(const std::string& source, const std::string& destination,
              const RewriteRequest& request, const WriteOptions& options)
      : source_(source), destination_(destination), request_(request), options_(options) {}

  // Call before reading the source; records its current state. ErrorCreatingFile (10) if it cannot
  // be held.
  Status Begin();
  // Opens the source, makes the new file and writes it; call Begin first. Both stay open as long as
  // the caller's arguments.
  Status Make(const FileMaker& maker, FilePieces& made, platform::FileView& file);
  // Writes the new file from its parts; `same` says that they are the old file. An unchanged file
  // is copied, unless source and destination are the same. Sets `changed` and the hint of the
  // result.
  Status Write(std::span<const std::span<const uint8_t>> parts, bool same);
  // Sets status and hint of a failure.
  Status Fail(Status status, std::string hint);

  RewrittenFile result;

 private:
  Status KeepTime();
  std::string CannotCreate() const;

  const std::string &source_, &destination_;
  const RewriteRequest& request_;
  const WriteOptions& options_;
  platform::HeldFile held_;    // the file to replace
  platform::FileStamp stamp_;  // of the source before reading it
  std::optional<platform::ExactTime> time_;
};

}  // namespace fotomill
