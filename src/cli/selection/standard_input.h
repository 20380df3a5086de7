#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "batch/run.h"
#include "cli/frame/io.h"
#include "platform/output_file.h"
#include "platform/temporary_folder.h"

namespace fotomill::cli {

// The name that stands for standard input, and for standard output as an output.
inline constexpr const char* kStream = "-";

// Reads what standard input has, at most the size of the buffer; waits if there is nothing yet. 0
// at its end; nullopt if it cannot be read, or the program was asked to end.
std::optional<size_t> ReadInput(const Io& io, std::span<uint8_t> buffer);

// A picture that comes through standard input: a temporary file that goes with this object.
class StandardInput {
 public:
  // Reads the picture. The extension of the file tells its format: `from` or, where that is empty,
  // what the first bytes say. The result is the file, or kStream with the reason why it failed.
  BatchFile Take(const Io& io, const std::string& from);
  const std::string& Path() const { return path_; }  // empty before Take and when it failed

 private:
  bool Create(const std::string& extension);

  platform::TemporaryFolder folder_;
  platform::OutputFile file_;
  std::string path_;
};

}  // namespace fotomill::cli
