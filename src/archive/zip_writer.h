#pragma once

#include <memory>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "platform/output_file.h"

namespace fotomill {

// Writes a ZIP archive with libarchive: files are deflated, or stored if their format is
// compressed; with a password, all contents (not names) are encrypted with AES-256 (WinZip's AE-2).
// The archive appears under its name when it is complete.
class ZipWriter {
 public:
  ZipWriter();
  ~ZipWriter();
  ZipWriter(const ZipWriter&) = delete;
  ZipWriter& operator=(const ZipWriter&) = delete;

  // Starts the archive. ErrorCreatingFile; FeatureDisabled without the library or its encryption;
  // InvalidPassword for more than 1,024 bytes or a NUL.
  Status Create(const std::string& path, const std::string& password);
  // Adds a file with its modification time. FileOpenError; FileReadError if it was modified
  // meanwhile, ErrorWritingFile, FunctionCancelled if `stop` was requested. After errors other than
  // FileOpenError the archive cannot be finished.
  Status Add(const std::string& path, const std::string& name, const StopToken& stop);
  // Commits the archive under its name. Anything but Done leaves no file.
  platform::CommitResult Finish(platform::Existing existing);

 private:
  struct State;
  std::unique_ptr<State> state_;
};

// Whether to store a file uncompressed, as its format is already compressed.
bool IsStoredUnpacked(const std::string& name);

}  // namespace fotomill
