#pragma once

#include <functional>
#include <string>

#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/encode_options.h"
#include "platform/output_file.h"

namespace fotomill {

// What a writer is asked for.
struct WriteOptions {
  // as the settings were when the job began
  EncodeOptions encode = {};
  // what to do about a file of the destination's name
  platform::Existing existing = platform::Existing::Replace;
  // EXIF, XMP and the comment of the record go into formats that can hold them; the color profile
  // always does
  bool keepMetadata = true;
  // without any loss where the format can, whatever `encode` says
  bool lossless = false;
  // the comment of the record goes into files of plug-in formats
  bool comment = false;
  std::string password = {};           // for formats that can be protected; empty: none
  // called when the new file is whole, before it gets its name; false: it never does
  std::function<bool()> makeWay = {};

  // By the call and by the settings.
  bool KeepsMetadata() const { return keepMetadata && encode.preserveMetadata; }
};

// The status that a commit's outcome means: ErrorWritingFile when a write failed, ErrorCreatingFile
// when the name was taken meanwhile and must not be replaced.
constexpr Status CommitStatus(platform::CommitResult result) {
  switch (result) {
    case platform::CommitResult::Done: return Status::Ok;
    case platform::CommitResult::Taken: return Status::ErrorCreatingFile;
    case platform::CommitResult::Failed: break;
  }
  return Status::ErrorWritingFile;
}

// Commits a writer's file as the options say; statuses as above, and ErrorCreatingFile when no way
// was made for it.
inline Status CommitOutput(ByteWriter& out, const WriteOptions& options) {
  if (options.makeWay && out.WriteRest() && !options.makeWay()) return Status::ErrorCreatingFile;
  return CommitStatus(out.Commit(options.existing));
}

}  // namespace fotomill
