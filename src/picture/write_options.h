#pragma once

#include <functional>
#include <string>

#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/encode_options.h"
#include "platform/output_file.h"

namespace fotomill {

// How to write a picture.
struct WriteOptions {
  // the settings when the job started
  EncodeOptions encode = {};
  // what to do if the destination exists
  platform::Existing existing = platform::Existing::Replace;
  // store EXIF, XMP and comment if the format
  // supports them; the color profile is always stored
  bool keepMetadata = true;
  // lossless if the format supports it, overriding `encode`
  bool lossless = false;
  // store the comment in files of plug-in formats
  bool comment = false;
  std::string password = {};           // for encrypted formats; empty: none
  // called when the new file is complete, before it is renamed; false cancels it
  std::function<bool()> makeWay = {};

  // Depends on the call and on the settings.
  bool KeepsMetadata() const { return keepMetadata && encode.preserveMetadata; }
};

// The status for a commit result: ErrorWritingFile if a write failed, ErrorCreatingFile if the name
// was taken meanwhile and must not be replaced.
constexpr Status CommitStatus(platform::CommitResult result) {
  switch (result) {
    case platform::CommitResult::Done: return Status::Ok;
    case platform::CommitResult::Taken: return Status::ErrorCreatingFile;
    case platform::CommitResult::Failed: break;
  }
  return Status::ErrorWritingFile;
}

// Commits a file as the options say; statuses as above, and ErrorCreatingFile if
// `makeWay` returned false.
inline Status CommitOutput(ByteWriter& out, const WriteOptions& options) {
  if (options.makeWay && out.WriteRest() && !options.makeWay()) return Status::ErrorCreatingFile;
  return CommitStatus(out.Commit(options.existing));
}

}  // namespace fotomill
