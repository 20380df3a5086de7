#pragma once

#include <string>

#include "cli/frame/command.h"
#include "platform/temporary_folder.h"

namespace fotomill::cli {

// Treats --out FOLDER/ as --dest FOLDER.
void TakeFolder(std::string& out, std::string& dest);

// For a command that writes a picture to standard output: the picture goes to a temporary file
// first, which is copied at the end. Results go to standard error.
class StreamedOutput {
 public:
  // Creates the temporary file with this extension; false with the system error.
  [[nodiscard]] bool Create(const std::string& extension);
  // Where to write the output; empty without Create.
  const std::string& Path() const { return path_; }
  // Copies the file to standard output. False if it cannot be read; write errors show in the
  // stream.
  [[nodiscard]] bool Deliver(const CommandContext& context) const;

 private:
  platform::TemporaryFolder folder_;
  std::string path_;
};

// The same context with results on standard error.
CommandContext WithResultsOnError(const CommandContext& context);

}  // namespace fotomill::cli
