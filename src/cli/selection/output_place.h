#pragma once

#include <string>

#include "cli/frame/command.h"
#include "platform/temporary_folder.h"

namespace fotomill::cli {

// Makes --out FOLDER/ the same as --dest FOLDER.
void TakeFolder(std::string& out, std::string& dest);

// A command whose output is standard output: the picture goes to a temporary file first and is
// copied there at the end. Results go to standard error.
class StreamedOutput {
 public:
  // Makes place for a file with that extension; false with the system's reason.
  [[nodiscard]] bool Create(const std::string& extension);
  // Where the output is to be written; empty without Create.
  const std::string& Path() const { return path_; }
  // Copies the file to standard output. False if it cannot be read; a failed write shows in the
  // stream.
  [[nodiscard]] bool Deliver(const CommandContext& context) const;

 private:
  platform::TemporaryFolder folder_;
  std::string path_;
};

// The same command with its results on standard error.
CommandContext WithResultsOnError(const CommandContext& context);

}  // namespace fotomill::cli
