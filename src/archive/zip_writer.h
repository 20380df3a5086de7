#pragma once

#include <memory>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "platform/output_file.h"

namespace fotomill {

// Writes a ZIP archive by libarchive: deflated, files of compressed formats stored; with a password
// all contents are encrypted with AES-256 (WinZip's AE-2), names are not. The archive appears under
// its name when it is complete.
class ZipWriter {
 public:
  ZipWriter();
  ~ZipWriter();
  ZipWriter(const ZipWriter&) = delete;
  ZipWriter& operator=(const ZipWriter&) = delete;

  // Begins the archive. ErrorCreatingFile, FeatureDisabled without the library or without its
  // encryption, InvalidPassword for one over 1,024 bytes or with a NUL.
  Status Create(const std::string& path, const std::string& password);
  // Adds a file under that name with its modification time. FileOpenError, FileReadError if it
  // changed meanwhile, ErrorWritingFile, FunctionCancelled if `stop` was requested. After any but
  // Ok and FileOpenError the archive cannot be finished.
  Status Add(const std::string& path, const std::string& name, const StopToken& stop);
  // Gives the archive its name. Anything but Done leaves no archive.
  platform::CommitResult Finish(platform::Existing existing);

 private:
  struct State;
  std::unique_ptr<State> state_;
};

// Whether a file of that name is stored as it is, since its format is compressed already.
bool IsStoredUnpacked(const std::string& name);

}  // namespace fotomill
